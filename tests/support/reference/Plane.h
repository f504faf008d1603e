// Plane.h: points and transforms in double precision, for the reference's way from a pixel back to a shape.
#pragma once

#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix3.h"

#include <array>
#include <optional>

namespace Moka::Testing {

struct PointD {
    PointD() = default;
    PointD(double px, double py) : x(px), y(py) {}
    PointD(PointF const& p) : x(double{p.x}), y(double{p.y}) {}

    double x = 0;
    double y = 0;
};

struct RectD {
    explicit RectD(RectF const& r)
        : left(double{r.left}), top(double{r.top}), right(double{r.right}), bottom(double{r.bottom}) {}

    double GetWidth() const { return right - left; }
    double GetHeight() const { return bottom - top; }
    bool Holds(PointD const& p) const { return p.x >= left && p.x < right && p.y >= top && p.y < bottom; }

    double left, top, right, bottom;
};

class Transform {
public:
    explicit Transform(Matrix3f const& m);

    // Nothing behind the eye, where a projection shows no point, and nothing for what is not a number.
    std::optional<PointD> Map(PointD const& p) const;
    // Where p comes from. Nothing when the plane is mapped onto less than a plane.
    std::optional<PointD> Unmap(PointD const& p) const;

    // The box around a mapped rectangle; nothing when part of it lies behind the eye.
    std::optional<RectF> MapBox(RectF const& r) const;

private:
    std::array<double, 9> mElements; // column-major, as the matrix
    std::array<double, 9> mInverse;
    bool mInvertible;
};

} // namespace Moka::Testing
