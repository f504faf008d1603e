// MKScreenBitmap: a screen bitmap for any thread: each operation is posted to the render thread.
// MKScreenBitmapBase describes screen bitmaps.
// Owner:  each posted operation holds one reference. If the queue refuses the operation, the reference is not
//         dropped. // Compat: refused-post
// Thread: any. The blocking reads wait for the render thread and must not be called on it.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/MKScreenBitmapBase.h"

#include <utility>

namespace Moka {

namespace detail {
class BlockingRead;
}

class MOKA_API MKScreenBitmap : public MKScreenBitmapBase {
public:
    MKScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height, FramebufferType type);
    ~MKScreenBitmap() override;

    void ActivateFrameBuffer() override;
    // Does nothing, unlike ActivateFrameBuffer. // Compat: screen-deactivate
    void DeactivateFrameBuffer(DiscardFramebufferType) override {}

    // Reads the pixel and returns 0. GetPixelAsync delivers it. // Compat: screen-pixel
    unsigned int GetPixel(Point const& p) override;
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override;
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;

private:
    // Tasks call these. Each drops the task's reference at its end, also if a callback throws.
    void createRenderTargetRT(int width, int height, FramebufferType type, bool release);
    void getPixelRT(unsigned int& result, Point const& p);
    void getPixelAsyncRT(Point const& p, void* userData, PixelCallback callback);
    void getBitmapDataRT(Rect const& r, void* destination, RefPtr<detail::BlockingRead> const& read);
    void getBitmapDataAsyncRT(Rect const& r, void* destination, void* userData, DataCallback callback);

    // Takes the task's reference and posts. Returns false if the task will never run.
    template <class F, class... Values>
    bool PostSelf(F function, Values&&... values);
};

} // namespace Moka
