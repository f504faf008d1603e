#include "moka/base/Rect.h"

#include "moka/base/Saturate.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace Moka {

Rect::Rect(RectF const& r)
    : left(Saturate(std::floor(r.left))),
      top(Saturate(std::floor(r.top))),
      right(Saturate(std::ceil(r.right))),
      bottom(Saturate(std::ceil(r.bottom))) {}

Rect& Rect::operator=(RectF const& r) { return *this = Rect(r); }

int Rect::GetWidth() const { return Saturate(std::int64_t{right} - left); }

int Rect::GetHeight() const { return Saturate(std::int64_t{bottom} - top); }

bool Rect::IsEmpty() const { return right <= left || bottom <= top; }

bool Rect::Contains(Point const& p) const { return left <= p.x && p.x < right && top <= p.y && p.y < bottom; }

bool Rect::IsIntersect(Rect const& other) const { return !Intersect(other).IsEmpty(); }

Rect Rect::Intersect(Rect const& other) const {
    Rect const shared(std::max(left, other.left), std::max(top, other.top), std::min(right, other.right),
                      std::min(bottom, other.bottom));
    return shared.IsEmpty() ? Rect() : shared;
}

void RectF::ExtendRect() { Set(std::floor(left), std::floor(top), std::ceil(right), std::ceil(bottom)); }

} // namespace Moka
