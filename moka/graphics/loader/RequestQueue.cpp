#include "moka/graphics/loader/RequestQueue.h"

#include <cstdint>
#include <new>

namespace Moka::detail {

std::size_t RequestQueue::Hash::operator()(LoadKey const& key) const {
    // Ids are often consecutive and addresses are multiples of a power of two. Multiplying avoids collisions.
    constexpr std::size_t kSpread = 0x9E3779B9;
    return reinterpret_cast<std::uintptr_t>(key.listener) ^ static_cast<std::size_t>(key.id) * kSpread;
}

bool RequestQueue::Append(RequestList& request) noexcept {
    if (request.front().type == REQUEST_LOAD) {
        try {
            mLoads.emplace(KeyOf(request.front()), request.begin());
        } catch (std::bad_alloc const&) {
            return false;
        }
    }
    mRequests.splice(mRequests.end(), request);
    return true;
}

RequestList RequestQueue::Take(Position at) {
    if (at->type == REQUEST_LOAD) mLoads.erase(KeyOf(*at));
    RequestList taken;
    taken.splice(taken.end(), mRequests, at);
    return taken;
}

RequestList RequestQueue::TakeHead() { return mRequests.empty() ? RequestList() : Take(mRequests.begin()); }

RequestList RequestQueue::TakeLoad(BitmapLoaderInterface* listener, int id) {
    auto const found = mLoads.find({listener, id});
    return found == mLoads.end() ? RequestList() : Take(found->second);
}

void RequestQueue::RemoveAllLoads(BitmapLoaderInterface const* listener) {
    for (Position at = mRequests.end(); at != mRequests.begin();) {
        --at;
        if (at->type != REQUEST_LOAD || at->listener != listener) continue;
        mLoads.erase(KeyOf(*at));
        at = mRequests.erase(at);
    }
}

void RequestQueue::ClearSaveListener(BitmapLoaderInterface const* listener) {
    detail::ClearSaveListener(mRequests, listener);
}

} // namespace Moka::detail
