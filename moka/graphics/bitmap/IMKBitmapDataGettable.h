/// IMKBitmapDataGettable: reads pixels back from the GPU.
/// Units:  pixels of the whole bitmap, origin top left. A pixel is RGBA bytes in memory, premultiplied:
///         opaque red reads 0xFF0000FF. Data is packed for the whole requested rectangle: its width times
///         four bytes a row; bytes of pixels outside the bitmap are not written.
/// Thread: caller-side bitmaps from any thread except the render thread, because the blocking functions wait
///         for it. Render-thread bitmaps on the render thread, where nothing blocks.
/// Fails:  a pixel outside the bitmap reads as 0, and data outside is not written. The asynchronous functions
///         of strips and screen bitmaps then still call back. Those of a texture bitmap do not if no strip is
///         concerned: for a pixel outside it, and for an empty bitmap. A read that the queue refuses never
///         calls back.
/// Tall:   for a texture bitmap of several strips, GetPixel and GetPixelAsync return 0 below the first strip.
///         GetBitmapData reads every row.
/// Screen: data is bottom-up, as the rows of the frame buffer. GetPixel is one row off; see
/// MKScreenBitmapBase.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"

namespace Moka {

class IMKBitmapDataGettable {
public:
    /// Receive the results of asynchronous reads, on the render thread.
    using PixelCallback = void (*)(unsigned int pixel, void* userData);
    using DataCallback = void (*)(Rect const& r, void* destination, void* userData);

    virtual ~IMKBitmapDataGettable() = default;

    /// Returns the four bytes of the pixel at p as one number. Waits until all earlier draws are done. On a
    /// caller-side screen bitmap it always returns 0.
    virtual unsigned int GetPixel(Point const& p) = 0;

    /// Returns at once. Passes the pixel to the callback, which runs on the render thread. Exceptions of the
    /// callback reach the queue.
    virtual void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) = 0;

    /// Copies the pixels of r to destination. Waits until all earlier draws are done.
    virtual void GetBitmapData(Rect const& r, void* destination) = 0;

    /// Returns at once. After the copy the callback runs once, on the render thread. destination must stay
    /// valid until then. The callback may drop the last reference on the bitmap.
    virtual void GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                    DataCallback callback) = 0;
};

} // namespace Moka
