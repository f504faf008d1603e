// SourcePiece.h: one strip's part of a bitmap that is drawn.
#pragma once

#include "moka/base/Rect.h"

namespace Moka::detail {

struct SourcePiece {
    RectF src;
    RectF dst; // the part of the destination that shows src
};

// The part of src that lies on the strip; false when none does.
bool CutToStrip(Rect const& strip, RectF const& src, RectF const& dst, SourcePiece& piece);

} // namespace Moka::detail
