// SourcePiece.h: the part of a drawn bitmap that lies on one strip.
#pragma once

#include "moka/base/Rect.h"

namespace Moka::detail {

struct SourcePiece {
    RectF src;
    RectF dst; // the part of the destination that shows src
};

// Sets piece to the part of src that lies on the strip. Returns false if there is none.
bool CutToStrip(Rect const& strip, RectF const& src, RectF const& dst, SourcePiece& piece);

} // namespace Moka::detail
