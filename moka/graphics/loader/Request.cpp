#include "moka/graphics/loader/Request.h"

#include <algorithm>
#include <new>

namespace Moka::detail {

RequestList MakeRequest(RequestType type, BitmapLoaderInterface* listener, int id,
                        String const& path) noexcept {
    RequestList requests;
    try {
        Request& request = requests.emplace_back();
        request.type = type;
        request.listener = listener;
        request.id = id;
        request.path = path;
    } catch (std::bad_alloc const&) {
        requests.clear();
    }
    return requests;
}

RequestList TakeRequest(RequestList& from, void const* request) {
    RequestList taken;
    auto const at =
        std::find_if(from.begin(), from.end(), [&](Request const& entry) { return &entry == request; });
    if (at != from.end()) taken.splice(taken.end(), from, at);
    return taken;
}

void ClearSaveListener(RequestList& requests, BitmapLoaderInterface const* listener) {
    for (Request& request : requests)
        if (request.type == REQUEST_SAVE && request.listener == listener) request.listener = nullptr;
}

} // namespace Moka::detail
