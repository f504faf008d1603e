// Exif.h: what a camera notes beside its pixels, as far as anybody here asks for it.
#pragma once

#include "moka/base/codec/ImageSource.h"

namespace Moka::detail {

// 1 to 8 as EXIF defines it; 1, which is upright, where the block says nothing or is damaged. The block may
// begin with "Exif" and two zero bytes, or without.
int ReadOrientation(ByteSpan exif);

} // namespace Moka::detail
