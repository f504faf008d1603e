// RequestQueue: the requests that wait for the loader's thread, first come first served, the head being the
// one that is processed.
// Thread: not synchronised.
// Cost:   everything but the walks over all requests (RemoveAllLoads, ClearSaveListener) takes constant time,
//         so that queueing and cancelling stay cheap however long the queue is.
// Fails:  only Append of a load can: memory for its place in the index.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/graphics/loader/Request.h"

#include <cstddef>
#include <unordered_map>

namespace Moka::detail {

class RequestQueue : NonAssignable {
public:
    int GetCount() const { return static_cast<int>(mRequests.size()); }
    Request* GetHead() { return mRequests.empty() ? nullptr : &mRequests.front(); }

    // Takes the request over. A load's listener and id are not queued yet. False: it is still the caller's.
    bool Append(RequestList& request) noexcept;

    RequestList TakeHead();

    bool HasLoad(BitmapLoaderInterface* listener, int id) const { return mLoads.count({listener, id}) != 0; }
    // Empty when it is not queued.
    RequestList TakeLoad(BitmapLoaderInterface* listener, int id);

    void RemoveAllLoads(BitmapLoaderInterface const* listener);
    void ClearSaveListener(BitmapLoaderInterface const* listener);

private:
    // What tells loads apart: at most one of each is queued.
    struct LoadKey {
        BitmapLoaderInterface* listener;
        int id;
        bool operator==(LoadKey const& other) const { return listener == other.listener && id == other.id; }
    };
    struct Hash {
        std::size_t operator()(LoadKey const& key) const;
    };
    using Position = RequestList::iterator;

    static LoadKey KeyOf(Request const& request) { return {request.listener, request.id}; }
    RequestList Take(Position at);

    RequestList mRequests;
    std::unordered_map<LoadKey, Position, Hash> mLoads;
};

} // namespace Moka::detail
