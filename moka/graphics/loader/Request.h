// Request: one load or save.
#pragma once

#include "moka/base/String.h"

#include <list>
#include <memory>

namespace Moka {

class BitmapLoaderInterface;
class IGLMsgQueue;

namespace detail {

enum RequestType { REQUEST_LOAD = 0, REQUEST_SAVE = 1, REQUEST_NONE = 2 };
enum BitmapType { BITMAP_TYPE_CPU = 0, BITMAP_TYPE_GRAPHICS = 1 };

// Moving a request moves the path and the pixels. The members that identify it stay valid in the moved-from
// object.
struct Request {
    RequestType type = REQUEST_NONE;
    int serial = -1;                           // increases in the order of queueing
    BitmapLoaderInterface* listener = nullptr; // null: nobody is called
    int id = 0;                                // chosen by the caller
    String path;

    // Loads. If one side is 0, the file is decoded in its own size.
    BitmapType bitmapType = BITMAP_TYPE_CPU;
    IGLMsgQueue* msgQueue = nullptr;
    int loadWidth = 0;
    int loadHeight = 0;

    // Saves. RGBA8, rows packed.
    std::unique_ptr<unsigned char[]> buffer;
    void* userData = nullptr;
    int width = 0;
    int height = 0;
    int quality = 100;
};

// A list, because a request moves from one list to another, and from the middle of one, without an allocation
// that could fail, and without moving its neighbours. A single request is a list with one element.
using RequestList = std::list<Request>;

// Returns a list with one request, or an empty one if memory runs out.
RequestList MakeRequest(RequestType type, BitmapLoaderInterface* listener, int id,
                        String const& path) noexcept;

// Removes the request with this address from the list and returns it; empty if it is not in the list.
RequestList TakeRequest(RequestList& from, void const* request);

// Clears the listener of its saves, so that they call nobody.
void ClearSaveListener(RequestList& requests, BitmapLoaderInterface const* listener);

} // namespace detail
} // namespace Moka
