#include "moka/base/Rect.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>

namespace Moka {
namespace {

constexpr int kMinInt = std::numeric_limits<int>::min();
constexpr int kMaxInt = std::numeric_limits<int>::max();

int SaturatedDifference(int a, int b) {
    std::int64_t const difference = std::int64_t{a} - b;
    return static_cast<int>(std::clamp<std::int64_t>(difference, kMinInt, kMaxInt));
}

int SaturatedInt(float whole) {
    if (std::isnan(whole)) return 0;
    // The greatest int has no float of its own; the next float up is the first that does not fit.
    if (whole >= 2147483648.0f) return kMaxInt;
    if (whole <= -2147483648.0f) return kMinInt;
    return static_cast<int>(whole);
}

} // namespace

Rect::Rect(RectF const& r)
    : left(SaturatedInt(std::floor(r.left))),
      top(SaturatedInt(std::floor(r.top))),
      right(SaturatedInt(std::ceil(r.right))),
      bottom(SaturatedInt(std::ceil(r.bottom))) {}

Rect& Rect::operator=(RectF const& r) { return *this = Rect(r); }

int Rect::GetWidth() const { return SaturatedDifference(right, left); }

int Rect::GetHeight() const { return SaturatedDifference(bottom, top); }

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
