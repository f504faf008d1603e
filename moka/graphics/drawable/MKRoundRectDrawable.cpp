#include "moka/graphics/drawable/MKRoundRectDrawable.h"

#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/ProjectedBounds.h"

#include <algorithm>

namespace Moka {

using namespace detail;

// `straight` bounds the straight parts of the edges: its left and right those of the horizontal edges, its
// top and bottom those of the vertical ones. Its corners are the centres of the round corners.
struct MKRoundRectDrawable::Shape {
    Shape(RectF const& r, float wantedRx, float wantedRy)
        : rect(r),
          rx(std::min(r.GetWidth() * 0.5f, wantedRx)),
          ry(std::min(r.GetHeight() * 0.5f, wantedRy)),
          straight(r.left + rx, r.top + ry, r.right - rx, r.bottom - ry) {}

    // With negative radii the centres of the corners lie outside the rectangle.
    RectF GetHull(float reach) const {
        RectF const hull = Hull(rect, reach);
        RectF const centers = Hull(straight, reach);
        return {std::min(hull.left, centers.left), std::min(hull.top, centers.top),
                std::max(hull.right, centers.right), std::max(hull.bottom, centers.bottom)};
    }

    RectF rect;
    float rx;
    float ry;
    RectF straight;
};

namespace {

// One quad for each of the four straight parts, as many vertices as a ring has.
constexpr int kBandsVertices = kRingVertices;
constexpr int kFillVertices = kBandsVertices + 3 * kQuadVertices;
constexpr int kStrokeVertices = 3 * kBandsVertices;
constexpr int kCornersVertices = 4 * kQuadVertices;

struct CornerVertex {
    float x;
    float y;
    float centerX;
    float centerY;
};

CoverageVertex* WriteSolid(CoverageVertex* at, RectF const& rect) {
    return WriteQuad(at, CoverageCorners(Outline{rect, 1}));
}

// Writes the bands between two outlines, along the straight parts only.
CoverageVertex* WriteBands(CoverageVertex* at, RectF const& straight, Outline const& outer,
                           Outline const& inner) {
    auto const horizontal = [&](float outerY, float innerY) {
        at = WriteQuad(at, {straight.left, outerY, outer.coverage}, {straight.left, innerY, inner.coverage},
                       {straight.right, outerY, outer.coverage}, {straight.right, innerY, inner.coverage});
    };
    auto const vertical = [&](float outerX, float innerX) {
        at = WriteQuad(at, {outerX, straight.top, outer.coverage}, {outerX, straight.bottom, outer.coverage},
                       {innerX, straight.top, inner.coverage}, {innerX, straight.bottom, inner.coverage});
    };
    horizontal(outer.edges.top, inner.edges.top);
    horizontal(outer.edges.bottom, inner.edges.bottom);
    vertical(outer.edges.left, inner.edges.left);
    vertical(outer.edges.right, inner.edges.right);
    return at;
}

void WriteFillBody(CoverageVertex* at, RectF const& rect, RectF const& straight) {
    RectF const solid = Grown(rect, -0.5f);
    at = WriteBands(at, straight, {Grown(rect, 0.5f), 0}, {solid, 1});
    at = WriteSolid(at, {straight.left, solid.top, straight.right, straight.top});
    at = WriteSolid(at, {solid.left, straight.top, solid.right, straight.bottom});
    WriteSolid(at, {straight.left, straight.bottom, straight.right, solid.bottom});
}

void WriteStrokeBody(CoverageVertex* at, RectF const& rect, RectF const& straight, float halfWidth) {
    WriteStrokeBands(at, rect, halfWidth,
                     [&](CoverageVertex* to, Outline const& outer, Outline const& inner) {
                         return WriteBands(to, straight, outer, inner);
                     });
}

// Writes one quad for each corner, from the corner of the outer rectangle to the centre of the round corner.
// Every vertex contains that centre.
void WriteCorners(CornerVertex* at, RectF const& outer, RectF const& centers) {
    auto const corner = [&](float x, float y, float cx, float cy) {
        // cppcheck-suppress uselessAssignmentPtrArg ; the next corner starts there
        at = WriteQuad(at, {x, y, cx, cy}, {x, cy, cx, cy}, {cx, y, cx, cy}, {cx, cy, cx, cy});
    };
    corner(outer.left, outer.top, centers.left, centers.top);
    corner(outer.right, outer.top, centers.right, centers.top);
    corner(outer.left, outer.bottom, centers.left, centers.bottom);
    corner(outer.right, outer.bottom, centers.right, centers.bottom);
}

} // namespace

MKRoundRectDrawable::MKRoundRectDrawable()
    : mBodyGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({3}))),
      mCornerGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({4}))),
      mBodyShader(GetShader<MKRoundRectShader>()),
      mCornerShader(GetShader<MKRoundRectRoundShader>()) {}

MKRoundRectDrawable::~MKRoundRectDrawable() {
    mBodyGraphics.reset();
    mCornerGraphics.reset();
    mState.Release();
    mBodyShader.reset();
    mCornerShader.reset();
}

bool MKRoundRectDrawable::DrawRoundRectRT(RectF const& rect, float rx, float ry,
                                          Matrix4<float> const& projection, MKPaint const& paint) {
    if (!mBodyGraphics || !mCornerGraphics || !mState || !mBodyShader || !mCornerShader) return false;
    Shape const shape(rect, rx, ry);
    mState.Apply(paint.GetXFermode());
    bool drawn = true;
    MKPaint::Style const style = paint.GetStyle();
    if (IsFilled(style)) drawn = DrawFill(shape, projection, paint);
    if (IsStroked(style) && paint.GetLineWidth() >= 1.0f) drawn = DrawStroke(shape, projection, paint);
    return drawn;
}

bool MKRoundRectDrawable::DrawFill(Shape const& shape, Matrix4<float> const& projection,
                                   MKPaint const& paint) {
    CoverageVertex vertices[kFillVertices];
    WriteFillBody(vertices, shape.rect, shape.straight);
    DrawBody(vertices, kFillVertices, shape.GetHull(0.5f), projection, paint);
    return DrawCorners(shape, 0.5f, true, projection, paint);
}

bool MKRoundRectDrawable::DrawStroke(Shape const& shape, Matrix4<float> const& projection,
                                     MKPaint const& paint) {
    float const halfWidth = paint.GetLineWidth() * 0.5f;
    CoverageVertex vertices[kStrokeVertices];
    WriteStrokeBody(vertices, shape.rect, shape.straight, halfWidth);
    DrawBody(vertices, kStrokeVertices, shape.GetHull(halfWidth + 0.5f), projection, paint);
    return DrawCorners(shape, halfWidth + 0.5f, false, projection, paint);
}

void MKRoundRectDrawable::DrawBody(void const* vertices, int count, RectF const& hull,
                                   Matrix4<float> const& projection, MKPaint const& paint) {
    mBodyGraphics->SetVertices(0, vertices, count);
    mBodyGraphics->SetBounds(Project(hull, projection));
    UseShader(*mBodyShader, projection, paint);
    DrawAll(*mBodyGraphics);
}

bool MKRoundRectDrawable::DrawCorners(Shape const& shape, float reach, bool fill,
                                      Matrix4<float> const& projection, MKPaint const& paint) {
    CornerVertex vertices[kCornersVertices];
    WriteCorners(vertices, Grown(shape.rect, reach), shape.straight);
    mCornerGraphics->SetVertices(0, vertices, kCornersVertices);
    mCornerGraphics->SetBounds(Project(shape.GetHull(reach), projection));
    UseShader(*mCornerShader, projection, paint);
    mCornerShader->uIsFill = fill ? 1 : 0;
    mCornerShader->uStrokeWidth = paint.GetLineWidth();
    mCornerShader->uRxry = Vector2<float>(shape.rx, shape.ry);
    return DrawAll(*mCornerGraphics);
}

} // namespace Moka
