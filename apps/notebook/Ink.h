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

// Rounds to 0.01 pixel, the precision of a page's file. So a stroke that is read back equals the saved one.
float RoundForFile(float value);

// Returns an empty rectangle if there are no points.
RectF GetBounds(InkPoints const& points);
// Either rectangle may be empty.
RectF Unite(RectF const& a, RectF const& b);
bool Overlaps(RectF const& a, RectF const& b);

// The area of an eraser: a disc that moves from one point to another.
struct Swipe {
    PointF from;
    PointF to;
    float radius;

    RectF GetBounds() const;
    bool Touches(InkPoints const& points) const;
    // Returns the pieces of the stroke outside the swipe, in order. If the swipe misses the centre line, the only piece
    // is the stroke itself.
    std::vector<InkPoints> Cut(InkPoints const& points) const;
};

// Tests a point against a closed polygon by the even-odd rule.
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
