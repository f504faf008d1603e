// RequestQueue: the requests that wait for the loader's thread, in first-in, first-out order. The loader
// processes the head while it is in the queue.
// Thread: not synchronised.
// Cost:   constant time, except RemoveAllLoads and ClearSaveListener, which visit all requests.
// Fails:  only Append can fail, if memory for the index of loads runs out.
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

    // Moves the request into the queue. A load with the same listener and id must not be queued. Returns
    // false if memory runs out; the request is then unchanged.
    bool Append(RequestList& request) noexcept;

    RequestList TakeHead();

    bool HasLoad(BitmapLoaderInterface* listener, int id) const { return mLoads.count({listener, id}) != 0; }
    // Removes and returns a load; empty if it is not queued.
    RequestList TakeLoad(BitmapLoaderInterface* listener, int id);

    void RemoveAllLoads(BitmapLoaderInterface const* listener);
    void ClearSaveListener(BitmapLoaderInterface const* listener);

private:
    // The identity of a load. At most one load of each is queued.
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
