// Coverage.h: how much of a point's surroundings a shape covers, from the shape's geometry: distances to
// edges and ramps one unit wide across them, in the units the shape is given in.
#pragma once

#include "moka/graphics/canvas/MKPaint.h"
#include "tests/support/reference/Plane.h"

#include <functional>
#include <vector>

namespace Moka::Testing {

struct Fragment {
    double coverage = 0;
    // Parts of the shape lie over each other here in a way that its definition leaves open.
    bool vague = false;
};
// Nothing where the shape makes no fragment; that differs from coverage 0 when a mode replaces.
using Coverage = std::optional<Fragment>;

struct Shape {
    RectF bounds; // outside there are no fragments
    std::function<Coverage(PointD const&)> at;
};

// The distance to the nearest edge, positive inside. Corners are mitred: it is the minimum, so that equal
// distances form nested rectangles.
double InsetIn(RectF const& r, PointD const& p);
RectF Grown(RectF const& r, double by);
RectF Sorted(RectF const& r);
RectF Box(double left, double top, double right, double bottom); // sorted

Shape FilledRect(RectF const& r, bool antiAliased);
Shape StrokedRect(RectF const& r, double width, bool antiAliased);

// Always anti-aliased.
Shape FilledCircle(PointD const& center, double radius);
Shape StrokedCircle(PointD const& center, double radius, double width);

// Soft along the sides, cut at the ends.
Shape SimpleLine(PointD const& from, PointD const& to, double width, bool antiAliased);
// With caps and dashes.
Shape Line(PointD const& from, PointD const& to, MKPaint const& paint);

// With elliptic corners, in the pieces they are defined in: straight parts and corners, which meet without a gap
// and, under a stroke thicker than the radii, lie over each other.
std::vector<Shape> FilledRoundRect(RectF const& r, double rx, double ry);
std::vector<Shape> StrokedRoundRect(RectF const& r, double rx, double ry, double width);

} // namespace Moka::Testing
