// GlPixels.h: moving blocks of pixels between images in memory and GL, straight, without a copy in between.
// Thread: render thread.
#pragma once

#include "moka/renderer/gles/GlState.h"

#include <cstddef>
#include <cstdint>

namespace Moka::detail {

// A block of pixels that somebody asked for, as far as it lies inside an image of GL's.
struct GlBlock {
    GLint x = 0;
    GLint y = 0;
    GLsizei width = 0; // 0 when nothing of it is inside
    GLsizei height = 0;
    std::ptrdiff_t skippedRows = 0; // of the asked-for block, above what is inside
    std::ptrdiff_t skippedPixels = 0;

    std::size_t GetBytes() const;

    // 64 bits, because the width of a caller's rectangle may exceed an int.
    static GlBlock Clip(std::int64_t x, std::int64_t y, std::int64_t width, std::int64_t height,
                        GLsizei imageWidth, GLsizei imageHeight);
};

// To the texture bound by GlEditTexture. pixels addresses the asked-for block's first pixel; stride is the
// distance of its rows in bytes, any number.
void UploadPixels(GlState& state, GlBlock const& block, void const* pixels, std::int64_t stride);

// From the frame buffer bound for reading. pixels addresses the asked-for block's first pixel; rowLength is
// the distance of its rows in pixels.
void ReadBackPixels(GlState& state, GlBlock const& block, void* pixels, GLint rowLength);

} // namespace Moka::detail
