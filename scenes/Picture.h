// Picture: an RGBA8, premultiplied image in memory, rows tightly packed, and pictures made by rule for scenes
// to draw. These are the same on every machine: whole numbers only.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace Moka::Scenes {

struct Picture {
    Picture() = default;
    Picture(int w, int h) : width(w), height(h), pixels(CountBytes()) {} // transparent

    std::size_t CountBytes() const {
        return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4;
    }
    std::size_t GetStride() const { return static_cast<std::size_t>(width) * 4; }
    unsigned char* At(int x, int y) {
        return pixels.data() + static_cast<std::size_t>(y) * GetStride() + static_cast<std::size_t>(x) * 4;
    }

    int width = 0;
    int height = 0;
    std::vector<unsigned char> pixels;
};

// gradient  red grows to the right, green downwards; opaque
// checker   squares of 8 pixels, light and dark; opaque
// photo     a landscape with a sun; opaque
// letters   "F" and "R" in two colours on nothing, so that any turn or mirror image shows
// veil      stripes of four colours whose alpha grows from nothing on the left to opaque on the right
// disc      a disc with a soft edge, white; for masks
std::vector<std::string> const& GetPictureNames();

// index is that of GetPictureNames().
Picture MakePicture(std::size_t index, int width, int height);

} // namespace Moka::Scenes
