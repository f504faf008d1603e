// IMKBitmapDataGettable: reads pixels back from the GPU.
// Units:  pixels of the whole bitmap, origin top left. A pixel is RGBA bytes in memory, premultiplied: opaque
//         red reads 0xFF0000FF. Data is packed for the whole of the rectangle asked for: its width times four
//         bytes a row; what lies outside the bitmap is left untouched.
// Thread: caller-side bitmaps from any thread but the render thread, which the blocking forms would wait for;
//         render-thread bitmaps on the render thread, where nothing blocks.
// Fails:  reads of nothing give 0, or leave the destination as it was; an asynchronous form of a strip still
//         calls back. A read that the queue refuses never calls back.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"

namespace Moka {

class IMKBitmapDataGettable {
public:
    using PixelCallback = void (*)(unsigned int pixel, void* userData);
    using DataCallback = void (*)(Rect const& r, void* destination, void* userData);

    virtual ~IMKBitmapDataGettable() = default;

    virtual unsigned int GetPixel(Point const& p) = 0;

    // Returns at once; the callback runs on the render thread.
    virtual void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) = 0;

    virtual void GetBitmapData(Rect const& r, void* destination) = 0;

    // Returns at once; the callback runs on the render thread, once, after the copy. destination stays valid
    // until then.
    virtual void GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                    DataCallback callback) = 0;
};

} // namespace Moka
