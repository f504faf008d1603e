/// Point and PointF: a position in pixels, integer and single precision.
#pragma once

namespace Moka {

/// A point with whole coordinates, in pixels.
struct Point {
    /// x to the right, y down.
    int x = 0;
    int y = 0;

    constexpr Point() = default;
    /// From its values.
    constexpr Point(int xValue, int yValue) : x(xValue), y(yValue) {}

    /// Compares the numbers.
    friend constexpr bool operator==(Point const& a, Point const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(Point const& a, Point const& b) { return !(a == b); }
};

/// A point, in pixels or local units.
struct PointF {
    /// x to the right, y down.
    float x = 0;
    float y = 0;

    constexpr PointF() = default;
    /// From its values.
    constexpr PointF(float xValue, float yValue) : x(xValue), y(yValue) {}

    /// Compares the numbers.
    friend constexpr bool operator==(PointF const& a, PointF const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(PointF const& a, PointF const& b) { return !(a == b); }
};

} // namespace Moka
