// PixelBlock: the part of a requested block of pixels that lies inside an image.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace Moka::detail {

// All pixels are RGBA8.
inline constexpr int kBytesPerPixel = 4;

struct PixelBlock {
    int x = 0;
    int y = 0;
    int width = 0; // 0 when nothing lies inside
    int height = 0;
    std::ptrdiff_t skippedRows = 0;   // requested rows above the part inside
    std::ptrdiff_t skippedPixels = 0; // requested columns left of it

    bool IsEmpty() const { return width == 0; }

    std::size_t GetBytes() const {
        return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * kBytesPerPixel;
    }

    // 64-bit parameters, because the width or height of a caller's rectangle may exceed an int.
    static PixelBlock Clip(std::int64_t x, std::int64_t y, std::int64_t width, std::int64_t height,
                           int imageWidth, int imageHeight) {
        std::int64_t const left = std::max<std::int64_t>(x, 0);
        std::int64_t const top = std::max<std::int64_t>(y, 0);
        std::int64_t const right = std::min<std::int64_t>(x + width, imageWidth);
        std::int64_t const bottom = std::min<std::int64_t>(y + height, imageHeight);
        if (right <= left || bottom <= top) return {};
        PixelBlock block;
        block.x = static_cast<int>(left);
        block.y = static_cast<int>(top);
        block.width = static_cast<int>(right - left);
        block.height = static_cast<int>(bottom - top);
        block.skippedRows = static_cast<std::ptrdiff_t>(top - y);
        block.skippedPixels = static_cast<std::ptrdiff_t>(left - x);
        return block;
    }
};

} // namespace Moka::detail
