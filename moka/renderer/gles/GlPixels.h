// GlPixels.h: uploads and reads back blocks of pixels directly, without an intermediate copy.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/PixelBlock.h"
#include "moka/renderer/gles/GlState.h"

namespace Moka::detail {

// Allocates level 0 of the texture bound by GlEditTexture. The storage is not immutable, so that the few
// textures that need mipmap levels can get them later.
void ReservePixels(GlState& state, GLsizei width, GLsizei height);

// Uploads to the texture bound by GlEditTexture. pixels points to the first pixel of the requested block.
// stride is the distance of its rows in bytes and may be any number.
void UploadPixels(GlState& state, PixelBlock const& block, void const* pixels, std::int64_t stride);

// Reads from the frame buffer bound for reading. pixels points to the first pixel of the requested block.
// rowLength is the distance of its rows in pixels.
void ReadBackPixels(GlState& state, PixelBlock const& block, void* pixels, GLint rowLength);

} // namespace Moka::detail
