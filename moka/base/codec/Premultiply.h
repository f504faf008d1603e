// Premultiply.h: converts between straight alpha, which files use, and premultiplied alpha, which memory
// uses.
// Units: RGBA8, one byte a channel. Premultiplying rounds to nearest; un-premultiplying chooses a colour that
//        premultiplies back to the same byte, so a pixel survives memory -> file -> memory bit for bit.
#pragma once

#include <cstddef>

namespace Moka::detail {

void PremultiplyPixels(unsigned char* pixels, std::size_t count);

// Colours above alpha, which are invalid, are limited to alpha. Alpha 0 gives 0, 0, 0, 0. from and to may be
// the same.
void UnpremultiplyPixels(unsigned char const* from, unsigned char* to, std::size_t count);

// Blends the pixels over white. rgb gets three bytes a pixel.
void FlattenOnWhite(unsigned char const* rgba, unsigned char* rgb, std::size_t count);

bool IsOpaque(unsigned char const* pixels, std::size_t count);

} // namespace Moka::detail
