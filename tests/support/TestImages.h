// TestImages.h: images that depend on nothing but their arguments, for comparing pixel by pixel.
// RGBA8, premultiplied, rows packed, first row first.
#pragma once

#include <array>
#include <cstddef>
#include <vector>

namespace Moka::Testing {

using Color = std::array<unsigned char, 4>; // r, g, b, a; premultiplied

struct TestImage {
    TestImage(int w, int h);

    int width;
    int height;
    std::vector<unsigned char> pixels;

    int GetStride() const { return width * 4; } // bytes
    unsigned char* At(int x, int y) { return pixels.data() + GetOffset(x, y); }
    unsigned char const* At(int x, int y) const { return pixels.data() + GetOffset(x, y); }
    Color GetColor(int x, int y) const;
    void SetColor(int x, int y, Color const& color);

    // The block that starts at (x, y), which must lie inside.
    TestImage Crop(int x, int y, int w, int h) const;

private:
    std::size_t GetOffset(int x, int y) const;
};

// Opaque; no two pixels of the first 4096 x 4096 are the same, so that a pixel in the wrong place shows.
TestImage MakeGradient(int width, int height);
Color GetGradientColor(int x, int y);

// Every alpha from 0 to 255, with colours that are valid premultiplied values of it.
TestImage MakeAlphaPattern(int width, int height);

// Squares of cell pixels, first where the one at the origin is.
TestImage MakeChecker(int width, int height, int cell, Color const& first, Color const& second);

// A page of handwriting as the platform saves it: transparent, with dark, soft-edged strokes on lines. For
// codecs and measurements, where a synthetic pattern would flatter or hurt.
TestImage MakeInkPage(int width, int height);

} // namespace Moka::Testing
