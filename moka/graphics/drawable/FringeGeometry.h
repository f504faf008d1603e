// FringeGeometry: triangulates rectangles. Each vertex has a coverage, 1 inside and 0 outside. At the edges
// the coverage falls over a fringe one unit wide, half of it on either side of the edge.
// The Write functions write to the caller's array and return the position after the last vertex.
// Units: those before the projection. Nothing is clamped or sorted: inverted rectangles give inverted
//        triangles.
#pragma once

#include "moka/base/Rect.h"

#include <algorithm>
#include <cmath>

namespace Moka::detail {

// The vertices as the vertex stages declare them. Members are not initialised, because arrays of them are
// filled next.
struct CoverageVertex {
    float x;
    float y;
    float coverage;
};

struct TexturedVertex {
    float x;
    float y;
    float coverage;
    float u;
    float v;
};

constexpr int kQuadVertices = 6;
constexpr int kRingVertices = 4 * kQuadVertices;
// The vertices of an anti-aliased rectangle.
constexpr int kMostFillVertices = kRingVertices + kQuadVertices;
constexpr int kMostStrokeVertices = 3 * kRingVertices;

// A rectangle's four edges at one coverage.
struct Outline {
    RectF edges;
    float coverage;
};

// The corners of a rectangle in the order of a triangle strip.
template <class Vertex>
struct Corners {
    Vertex leftTop;
    Vertex leftBottom;
    Vertex rightTop;
    Vertex rightBottom;
};

inline RectF Grown(RectF const& r, float by) {
    return {r.left - by, r.top - by, r.right + by, r.bottom + by};
}

// Sorts the sides and grows the rectangle by reach.
inline RectF Hull(RectF const& r, float reach) {
    return Grown({std::min(r.left, r.right), std::min(r.top, r.bottom), std::max(r.left, r.right),
                  std::max(r.top, r.bottom)},
                 std::fabs(reach));
}

inline Corners<CoverageVertex> CoverageCorners(Outline const& o) {
    RectF const& r = o.edges;
    return {{r.left, r.top, o.coverage},
            {r.left, r.bottom, o.coverage},
            {r.right, r.top, o.coverage},
            {r.right, r.bottom, o.coverage}};
}

// The texture coordinates are those of the sides, whatever the size of the outline.
inline Corners<TexturedVertex> TexturedCorners(Outline const& o, RectF const& uv) {
    RectF const& r = o.edges;
    return {{r.left, r.top, o.coverage, uv.left, uv.top},
            {r.left, r.bottom, o.coverage, uv.left, uv.bottom},
            {r.right, r.top, o.coverage, uv.right, uv.top},
            {r.right, r.bottom, o.coverage, uv.right, uv.bottom}};
}

// Writes two triangles. a and d are opposite corners.
template <class Vertex>
Vertex* WriteQuad(Vertex* at, Vertex const& a, Vertex const& b, Vertex const& c, Vertex const& d) {
    *at++ = a;
    *at++ = b;
    *at++ = c;
    *at++ = c;
    *at++ = b;
    *at++ = d;
    return at;
}

template <class Vertex>
Vertex* WriteQuad(Vertex* at, Corners<Vertex> const& c) {
    return WriteQuad(at, c.leftTop, c.leftBottom, c.rightTop, c.rightBottom);
}

// Writes four bands with mitred corners: top, bottom, left, right.
template <class Vertex>
Vertex* WriteRing(Vertex* at, Corners<Vertex> const& outer, Corners<Vertex> const& inner) {
    at = WriteQuad(at, outer.leftTop, inner.leftTop, outer.rightTop, inner.rightTop);
    at = WriteQuad(at, inner.leftBottom, outer.leftBottom, inner.rightBottom, outer.rightBottom);
    at = WriteQuad(at, outer.leftTop, outer.leftBottom, inner.leftTop, inner.leftBottom);
    return WriteQuad(at, inner.rightTop, inner.rightBottom, outer.rightTop, outer.rightBottom);
}

// Writes a filled rectangle. cornersOf returns the corners of an outline.
template <class Vertex, class CornersOf>
Vertex* WriteFill(Vertex* at, RectF const& rect, bool antiAliased, CornersOf const& cornersOf) {
    if (!antiAliased) return WriteQuad(at, cornersOf(Outline{rect, 1}));
    Corners<Vertex> const inner = cornersOf(Outline{Grown(rect, -0.5f), 1});
    at = WriteRing(at, cornersOf(Outline{Grown(rect, 0.5f), 0}), inner);
    return WriteQuad(at, inner);
}

// Writes the bands of an anti-aliased stroke, from the outer fringe to the inner one. writeBand writes the
// band between two outlines.
template <class Vertex, class WriteBand>
Vertex* WriteStrokeBands(Vertex* at, RectF const& rect, float halfWidth, WriteBand const& writeBand) {
    RectF const outer = Grown(rect, halfWidth);
    RectF const inner = Grown(rect, -halfWidth);
    Outline const solidOuter{Grown(outer, -0.5f), 1};
    Outline const solidInner{Grown(inner, 0.5f), 1};
    at = writeBand(at, Outline{Grown(outer, 0.5f), 0}, solidOuter);
    at = writeBand(at, solidOuter, solidInner);
    return writeBand(at, solidInner, Outline{Grown(inner, -0.5f), 0});
}

inline CoverageVertex* WriteStroke(CoverageVertex* at, RectF const& rect, float halfWidth, bool antiAliased) {
    auto const writeRing = [](CoverageVertex* to, Outline const& outer, Outline const& inner) {
        return WriteRing(to, CoverageCorners(outer), CoverageCorners(inner));
    };
    if (antiAliased) return WriteStrokeBands(at, rect, halfWidth, writeRing);
    return writeRing(at, Outline{Grown(rect, halfWidth), 1}, Outline{Grown(rect, -halfWidth), 1});
}

} // namespace Moka::detail
