// MKScreenBitmapRT: a screen bitmap for code that runs on the render thread: operations execute at once and
// are not posted. MKScreenBitmapBase describes screen bitmaps.
// Thread: render thread only, including destruction. Callbacks run before the call returns.
#pragma once

#include "moka/graphics/bitmap/MKScreenBitmapBase.h"

namespace Moka {

class MOKA_API MKScreenBitmapRT : public MKScreenBitmapBase {
public:
    MKScreenBitmapRT(IGLMsgQueue* queue, int x, int y, int width, int height, FramebufferType type);
    ~MKScreenBitmapRT() override;

    void ActivateFrameBuffer() override { ActivateFrameBufferRT(false); }
    void DeactivateFrameBuffer(DiscardFramebufferType discard) override {
        DeactivateFrameBufferRT(false, discard);
    }

    unsigned int GetPixel(Point const& p) override { return ReadPixel(p); }
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override { ReadBlock(r, destination); }
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;
};

} // namespace Moka
