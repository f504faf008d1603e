// Premultiply.h: between straight alpha, as files hold it, and premultiplied alpha, as memory holds it.
// Units: RGBA8, one byte a channel. Premultiplying rounds to nearest; un-premultiplying chooses a colour that
//        premultiplies back to the same byte, so a pixel survives memory -> file -> memory bit for bit.
#pragma once

#include <cstddef>

namespace Moka::detail {

void PremultiplyPixels(unsigned char* pixels, std::size_t count);

// A colour above its alpha, which no premultiplied pixel has, counts as equal to it. Alpha 0 gives 0, 0, 0,
// 0. from and to may be the same.
void UnpremultiplyPixels(unsigned char const* from, unsigned char* to, std::size_t count);

// Three bytes a pixel, the pixels laid over white.
void FlattenOnWhite(unsigned char const* rgba, unsigned char* rgb, std::size_t count);

bool IsOpaque(unsigned char const* pixels, std::size_t count);

} // namespace Moka::detail
