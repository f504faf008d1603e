// ReferenceBitmap: a bitmap in CPU memory, to be drawn on or drawn by the reference canvas.
// It has no GPU side, and what a drawing does not ask of it does nothing.
#pragma once

#include "moka/graphics/bitmap/MKBitmap.h"
#include "tests/support/reference/Sampling.h"

#include <new>

namespace Moka::Testing {

class ReferenceBitmap : public MKBitmap {
public:
    explicit ReferenceBitmap(Picture const& pixels)
        : MKBitmap(nullptr, 0, 0, pixels.width, pixels.height), image(pixels) {}

    Picture image;
    Sampler sampler; // as the last drawing of it left it

    IMKBitmap* Clone() override { return new (std::nothrow) ReferenceBitmap(image); }

private:
    unsigned int GetPixel(Point const&) override { return 0; }
    void GetPixelAsync(Point const&, void*, PixelCallback) override {}
    void GetBitmapData(Rect const&, void*) override {}
    void GetBitmapDataAsync(Rect const&, void*, void*, DataCallback) override {}
};

} // namespace Moka::Testing
