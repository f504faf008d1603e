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

bool OverlapsOnAxis(float lowA, float highA, float lowB, float highB) {
    if (std::isunordered(lowA, highA) || std::isunordered(lowB, highB)) return false;
    float const low = std::max(lowA, lowB);
    float const high = std::min(highA, highB);
    return low < high || (low == high && (lowA == highA || lowB == highB));
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

RectF::RectF(Rect const& r)
    : left(static_cast<float>(r.left)),
      top(static_cast<float>(r.top)),
      right(static_cast<float>(r.right)),
      bottom(static_cast<float>(r.bottom)) {}

void RectF::Set(float l, float t, float r, float b) { *this = RectF(l, t, r, b); }

// Negated so that NaN counts as empty.
bool RectF::IsEmpty() const { return !(left < right && top < bottom); }

void RectF::MakeRect(float x, float y) {
    if (x < left) left = x;
    if (x > right) right = x;
    if (y < top) top = y;
    if (y > bottom) bottom = y;
}

void RectF::ExtendRect() { Set(std::floor(left), std::floor(top), std::ceil(right), std::ceil(bottom)); }

void RectF::IncreaseRect(float dx, float dy) { Set(left - dx, top - dy, right + dx, bottom + dy); }

bool RectF::IsIntersect(RectF const& other) const {
    return OverlapsOnAxis(left, right, other.left, other.right) &&
           OverlapsOnAxis(top, bottom, other.top, other.bottom);
}

} // namespace Moka
