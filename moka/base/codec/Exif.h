// Exif.h: reads the orientation from EXIF data.
#pragma once

#include "moka/base/codec/ImageSource.h"

namespace Moka::detail {

// Returns the EXIF orientation, 1 to 8, or 1 (upright) if the block has none or is damaged. The block may
// begin with "Exif" and two zero bytes.
int ReadOrientation(ByteSpan exif);

} // namespace Moka::detail
