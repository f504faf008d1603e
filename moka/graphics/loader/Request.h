// Request: one job of the loader.
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

// Moving one leaves behind what says which request it was; the path and the pixels go along.
struct Request {
    RequestType type = REQUEST_NONE;           // until it is filled in
    int serial = -1;                           // in the order of queueing
    BitmapLoaderInterface* listener = nullptr; // null: nobody is called back
    int id = 0;                                // the caller's
    String path;

    // Loads. One side that is 0 means the file's own size.
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

// A list, because a request goes from one to another, and out of the middle of one, without an allocation
// that could fail or a move of its neighbours. A request on its own is a list of one.
using RequestList = std::list<Request>;

// Of one request; empty when memory runs out.
RequestList MakeRequest(RequestType type, BitmapLoaderInterface* listener, int id,
                        String const& path) noexcept;

// The request whose address is given, as a list of one; empty when it is not there.
RequestList TakeRequest(RequestList& from, void const* request);

// Saves of this listener still run, but call nobody back.
void ClearSaveListener(RequestList& requests, BitmapLoaderInterface const* listener);

} // namespace detail
} // namespace Moka
