/// Rect and RectF: axis-aligned rectangles in pixels, y down. Right and bottom are exclusive for integers.
/// The members keep the order left, top, right, bottom; nothing sorts them, so a width can be negative.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Point.h"

#include <algorithm>
#include <cmath>

namespace Moka {

class RectF;

/// A rectangle with whole edges; right and bottom are exclusive.
class MOKA_API Rect {
public:
    /// The edges; not sorted.
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;

    constexpr Rect() = default;
    /// From its edges.
    constexpr Rect(int l, int t, int r, int b) : left(l), top(t), right(r), bottom(b) {}

    /// Converts to the smallest enclosing integer rectangle: left and top are rounded down, right and bottom
    /// up, each saturated to the range of int. A NaN edge becomes 0.
    explicit Rect(RectF const& r);
    Rect& operator=(RectF const& r);

    int GetWidth() const;  ///< right - left, saturated
    int GetHeight() const; ///< bottom - top, saturated
    bool IsEmpty() const;  ///< width or height is not positive

    bool Contains(Point const& p) const; ///< left <= x < right and top <= y < bottom

    /// True if the rectangles share at least one pixel.
    bool IsIntersect(Rect const& other) const;
    /// The shared pixels; a default (all zero) rectangle if there are none.
    Rect Intersect(Rect const& other) const;

    /// Compares the edges.
    friend constexpr bool operator==(Rect const& a, Rect const& b) {
        return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
    }
    friend constexpr bool operator!=(Rect const& a, Rect const& b) { return !(a == b); }
};

/// A rectangle, in pixels or local units.
class MOKA_API RectF {
public:
    /// The edges; not sorted.
    float left = 0;
    float top = 0;
    float right = 0;
    float bottom = 0;

    constexpr RectF() = default;
    /// From its edges.
    constexpr RectF(float l, float t, float r, float b) : left(l), top(t), right(r), bottom(b) {}
    /// The same rectangle.
    explicit RectF(Rect const& r)
        : left(static_cast<float>(r.left)),
          top(static_cast<float>(r.top)),
          right(static_cast<float>(r.right)),
          bottom(static_cast<float>(r.bottom)) {}

    /// Replaces all edges.
    void Set(float l, float t, float r, float b) { *this = RectF(l, t, r, b); }

    /// Differences of the edges; may be negative.
    float GetWidth() const { return right - left; }
    float GetHeight() const { return bottom - top; }
    /// True if width or height is not positive, or NaN.
    bool IsEmpty() const { return !(left < right && top < bottom); }

    /// Grows the rectangle so that it contains (x, y). To enclose points, start with an empty rectangle at
    /// the first one. A NaN coordinate changes nothing.
    void MakeRect(float x, float y) {
        if (x < left) left = x;
        if (x > right) right = x;
        if (y < top) top = y;
        if (y > bottom) bottom = y;
    }

    /// Rounds outwards to whole numbers: left and top down, right and bottom up.
    void ExtendRect();

    /// Moves every edge outwards by these distances, or inwards if they are negative.
    void IncreaseRect(float dx, float dy) { Set(left - dx, top - dy, right + dx, bottom + dy); }

    /// True if the rectangles overlap on both axes. Let lo be the greater of the low edges on an axis, and hi
    /// the lesser of the high edges. They overlap if lo < hi, or if lo == hi and one of them has size 0 on
    /// that axis. So horizontal and vertical lines count, but a rectangle that ends exactly at the other's
    /// edge does not. NaN never overlaps.
    bool IsIntersect(RectF const& other) const {
        return OverlapsOnAxis(left, right, other.left, other.right) &&
               OverlapsOnAxis(top, bottom, other.top, other.bottom);
    }

    /// Compares the edges.
    friend constexpr bool operator==(RectF const& a, RectF const& b) {
        return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
    }
    friend constexpr bool operator!=(RectF const& a, RectF const& b) { return !(a == b); }

private:
    static bool OverlapsOnAxis(float lowA, float highA, float lowB, float highB) {
        // The usual case. Comparisons with NaN are false.
        if (lowA < highA && lowA < highB && lowB < highA && lowB < highB) return true;
        if (std::isunordered(lowA, highA) || std::isunordered(lowB, highB)) return false;
        float const low = std::max(lowA, lowB);
        float const high = std::min(highA, highB);
        return low < high || (low == high && (lowA == highA || lowB == highB));
    }
};

} // namespace Moka
