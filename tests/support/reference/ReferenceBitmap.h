// ReferenceBitmap: a bitmap in CPU memory, to be drawn on or drawn by the reference canvas.
// It has no GPU side: what the render thread would do with it does nothing.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/MKBitmap.h"
#include "tests/support/reference/Sampling.h"

namespace Moka::Testing {

class ReferenceBitmap final : public MKBitmap, public IMKBitmapReadable {
public:
    explicit ReferenceBitmap(TestImage const& pixels)
        : MKBitmap(nullptr, 0, 0, pixels.width, pixels.height), image(pixels) {}

    TestImage image;
    Sampler sampler;

    unsigned int GetPixel(Point const& p) override;
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override;
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;
    IMKBitmap* Clone() override;
    IMKBitmapReadable* GetBitmapReadable() override { return this; }

    void ActivateTextureRT(int, bool) override {}
    void SetTextureFilter(TextureParamFilteringValue value) override;
    void SetTextureFilter(TextureParamFiltering, TextureParamFilteringValue value) override;
    void SetTextureWrap(TextureParamWrappingValue value) override;
    void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) override;
    void SetTextureFilterRT(TextureParamFilteringValue value, bool) override { SetTextureFilter(value); }
    void SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value, bool) override {
        SetTextureFilter(kind, value);
    }
    void SetTextureWrapRT(TextureParamWrappingValue value, bool) override { SetTextureWrap(value); }
    void SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value, bool) override {
        SetTextureWrap(kind, value);
    }
};

} // namespace Moka::Testing
