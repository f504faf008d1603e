/// IMKBitmapDataGettable: reads pixels back from the GPU.
/// Units:  pixels of the whole bitmap, origin top left. A pixel is RGBA bytes in memory, premultiplied:
///         opaque red reads 0xFF0000FF. Data is packed for the whole requested rectangle: its width times
///         four bytes a row; bytes of pixels outside the bitmap are not written.
/// Thread: caller-side bitmaps from any thread but the render thread, which the blocking forms would wait
///         for; render-thread bitmaps on the render thread, where nothing blocks.
/// Fails:  reads of nothing give 0, or leave the destination as it was. The asynchronous forms of strips and
///         screen bitmaps then still call back; those of a texture bitmap do not where it has no strip: a
///         pixel outside it, and data of an empty one. A read that the queue refuses never calls back.
/// Tall:   of a texture bitmap in several strips, GetPixel and GetPixelAsync read 0 below the first one;
///         GetBitmapData reads every row.
/// Screen: data is bottom-up, as the frame buffer has its rows, and pixels come from one row off; see
///         MKScreenBitmapBase.
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

    /// The pixel at p, four bytes as one number. Waits for all draws before it.
    virtual unsigned int GetPixel(Point const& p) = 0;

    /// Returns at once; the callback runs on the render thread. Its exceptions reach the queue.
    virtual void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) = 0;

    /// Copies the pixels of r to destination. Waits for all draws before it.
    virtual void GetBitmapData(Rect const& r, void* destination) = 0;

    /// Returns at once; the callback runs on the render thread, once, after the copy. destination stays valid
    /// until then. The callback may drop the last reference on the bitmap.
    virtual void GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                    DataCallback callback) = 0;
};

} // namespace Moka
