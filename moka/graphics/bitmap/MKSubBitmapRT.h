// MKSubBitmapRT: a strip for code that runs on the render thread: operations execute at once, without tasks
// and without references. Callbacks run before the call returns.
// Thread:  render thread only, including destruction.
#pragma once

#include "moka/graphics/bitmap/MKSubBitmapBase.h"

namespace Moka {

class MOKA_API MKSubBitmapRT : public MKSubBitmapBase {
public:
    // Creates the texture from the strip's rows of pixels, an image `width` pixels wide. If pixels is null,
    // the texture is transparent.
    MKSubBitmapRT(IGLMsgQueue* queue, int index, Rect const& rect, int width, int height, void const* pixels,
                  bool textureFlag);

    // Creates a texture that shares model's storage, or none if model is null.
    MKSubBitmapRT(IGLMsgQueue* queue, int index, Rect const& rect, ITextureObject* model);

    ~MKSubBitmapRT() override;

    void CreateFrameBuffer() override { CreateFrameBufferRT(false); }
    void ReleaseFrameBuffer() override { ReleaseFrameBufferRT(false); }
    void ActivateFrameBuffer() override { ActivateFrameBufferRT(false); }
    void DeactivateFrameBuffer(DiscardFramebufferType discard) override {
        DeactivateFrameBufferRT(false, discard);
    }
    void AttachDepthBuffer() override { AttachStencilBufferRT(false); }
    void DetachDepthBuffer() override { DetachStencilBufferRT(false); }
    void SetTextureFilter(TextureParamFilteringValue value) override { SetTextureFilterRT(value, false); }
    void SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) override {
        SetTextureFilterRT(kind, value, false);
    }
    void SetTextureWrap(TextureParamWrappingValue value) override { SetTextureWrapRT(value, false); }
    void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) override {
        SetTextureWrapRT(kind, value, false);
    }
    void UpdateBitmap(void const* pixels, int stride) override { Upload(pixels, stride); }
    void UpdateBitmap(Rect const& r, void const* pixels, int stride) override { Upload(r, pixels, stride); }
    unsigned int GetPixel(Point const& p) override { return ReadPixel(p); }
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override { ReadBlock(r, destination); }
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;
    // Sets the texture's label. Unlike in MKSubBitmap the tag is not cut.
    void SetTag(char const* tag) override;
    IMKSubBitmap* Clone() override;
};

} // namespace Moka
