// GlPixels.h: moving blocks of pixels between images in memory and GL, straight, without a copy in between.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/PixelBlock.h"
#include "moka/renderer/gles/GlState.h"

namespace Moka::detail {

// Storage for the level 0 of the texture bound by GlEditTexture. Not immutable, so that levels may be added:
// few textures have any.
void ReservePixels(GlState& state, GLsizei width, GLsizei height);

// To the texture bound by GlEditTexture. pixels addresses the requested block's first pixel; stride is the
// distance of its rows in bytes, any number.
void UploadPixels(GlState& state, PixelBlock const& block, void const* pixels, std::int64_t stride);

// From the frame buffer bound for reading. pixels addresses the requested block's first pixel; rowLength is
// the distance of its rows in pixels.
void ReadBackPixels(GlState& state, PixelBlock const& block, void* pixels, GLint rowLength);

} // namespace Moka::detail
