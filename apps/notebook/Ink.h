// Ink: the geometry of strokes: bounds, hits, cuts, lassos. Pure functions over points.
// Units: page pixels; a point's width is a diameter.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"

#include <vector>

namespace Moka::Notebook {

struct InkPoint {
    float x = 0;
    float y = 0;
    float width = 0;

    friend bool operator==(InkPoint const& a, InkPoint const& b) {
        return a.x == b.x && a.y == b.y && a.width == b.width;
    }
};
using InkPoints = std::vector<InkPoint>;

// A hundredth of a pixel, which is what a page's file holds: a saved stroke is read back bit by bit.
float RoundForFile(float value);

// Empty for no points.
RectF GetBounds(InkPoints const& points);
RectF Unite(RectF const& a, RectF const& b); // of which either may be empty
bool Overlaps(RectF const& a, RectF const& b);

// The path of an eraser: a disc that moved from one point to another.
struct Swipe {
    PointF from;
    PointF to;
    float radius;

    RectF GetBounds() const;
    bool Touches(InkPoints const& points) const;
    // The pieces of the stroke that lie outside, in order; the stroke itself if the swipe misses its middle line.
    std::vector<InkPoints> Cut(InkPoints const& points) const;
};

// Even-odd, closed from the last point to the first.
bool IsInside(std::vector<PointF> const& polygon, float x, float y);
// True if at least half of the points are inside.
bool IsMostlyInside(std::vector<PointF> const& polygon, InkPoints const& points);

// Scales about the page's origin, then moves.
struct Placement {
    float scale = 1;
    float dx = 0;
    float dy = 0;

    RectF Apply(RectF const& r) const {
        return {r.left * scale + dx, r.top * scale + dy, r.right * scale + dx, r.bottom * scale + dy};
    }
    InkPoints Apply(InkPoints points) const;
    bool IsIdentity() const { return scale == 1 && dx == 0 && dy == 0; }
};

} // namespace Moka::Notebook
