// Picture: an image in memory, RGBA8, premultiplied, rows packed, top row first; and generated pictures for
// scenes. They use integers only, so they are the same on every machine.
#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <string>
#include <vector>

namespace Moka::Scenes {

using Color = std::array<unsigned char, 4>; // r, g, b, a; premultiplied

struct Picture {
    Picture() = default;
    Picture(int w, int h) : width(w), height(h), pixels(CountBytes()) {} // transparent

    std::size_t CountBytes() const {
        return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4;
    }
    int GetStride() const { return width * 4; } // bytes
    unsigned char* At(int x, int y) { return pixels.data() + GetOffset(x, y); }
    unsigned char const* At(int x, int y) const { return pixels.data() + GetOffset(x, y); }
    Color GetColor(int x, int y) const {
        Color color;
        std::copy_n(At(x, y), 4, color.begin());
        return color;
    }
    void SetColor(int x, int y, Color const& color) { std::copy_n(color.begin(), 4, At(x, y)); }

    // Returns the block that starts at (x, y). It must lie inside the image.
    Picture Crop(int x, int y, int w, int h) const {
        Picture part(w, h);
        for (int row = 0; row < h && w > 0; ++row) std::copy_n(At(x, y + row), w * 4, part.At(0, row));
        return part;
    }
    // Returns a copy in which part replaces the pixels from (x, y) on. It must lie inside the image.
    Picture With(int x, int y, Picture const& part) const {
        Picture result = *this;
        for (int row = 0; row < part.height && part.width > 0; ++row)
            std::copy_n(part.At(0, row), part.GetStride(), result.At(x, y + row));
        return result;
    }

    friend bool operator==(Picture const& a, Picture const& b) {
        return a.width == b.width && a.height == b.height && a.pixels == b.pixels;
    }

    int width = 0;
    int height = 0;
    std::vector<unsigned char> pixels;

private:
    std::size_t GetOffset(int x, int y) const {
        return (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) + static_cast<std::size_t>(x)) *
               4;
    }
};

// gradient  red grows to the right, green downwards; opaque
// checker   squares of 8 pixels, light and dark; opaque
// photo     a landscape with a sun; opaque
// letters   "F" and "R" in two colours on transparency, so that every rotation and reflection is visible
// veil      stripes of four colours whose alpha grows from transparent on the left to opaque on the right
// disc      a disc with a soft edge, white; for masks
// grain     the landscape with coarse grain, down to single pixels; opaque
std::vector<std::string> const& GetPictureNames();

// Generates a picture. index is its position in GetPictureNames().
Picture MakePicture(std::size_t index, int width, int height);

} // namespace Moka::Scenes
