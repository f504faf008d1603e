// Point and PointF: a position in pixels, integer and single precision.
#pragma once

namespace Moka {

struct Point {
    int x = 0;
    int y = 0;

    constexpr Point() = default;
    constexpr Point(int xValue, int yValue) : x(xValue), y(yValue) {}

    friend constexpr bool operator==(Point const& a, Point const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(Point const& a, Point const& b) { return !(a == b); }
};

struct PointF {
    float x = 0;
    float y = 0;

    constexpr PointF() = default;
    constexpr PointF(float xValue, float yValue) : x(xValue), y(yValue) {}

    friend constexpr bool operator==(PointF const& a, PointF const& b) { return a.x == b.x && a.y == b.y; }
    friend constexpr bool operator!=(PointF const& a, PointF const& b) { return !(a == b); }
};

} // namespace Moka
