#include "moka/graphics/canvas/SourcePiece.h"

#include <algorithm>

namespace Moka::detail {

bool CutToStrip(Rect const& strip, RectF const& src, RectF const& dst, SourcePiece& piece) {
    RectF const bounds(strip);
    RectF const part(std::max(bounds.left, src.left), std::max(bounds.top, src.top),
                     std::min(bounds.right, src.right), std::min(bounds.bottom, src.bottom));
    if (part.IsEmpty()) return false;
    float const w = dst.GetWidth();
    float const h = dst.GetHeight();
    piece.src = part;
    piece.dst = RectF(dst.left + w * (part.left - src.left) / src.GetWidth(),
                      dst.top + h * (part.top - src.top) / src.GetHeight(),
                      dst.left + w * (part.right - src.left) / src.GetWidth(),
                      dst.top + h * (part.bottom - src.top) / src.GetHeight());
    return true;
}

} // namespace Moka::detail
