// The canvas's state, and its shapes; ReferenceCanvasBitmaps.cpp draws the bitmaps.
#include "tests/support/reference/ReferenceCanvas.h"

#include <cmath>

namespace Moka::Testing {
namespace {

bool Fills(MKPaint const& p) {
    return p.GetStyle() == MKPaint::Fill || p.GetStyle() == MKPaint::FillAndStroke;
}
bool Strokes(MKPaint const& p) {
    return p.GetStyle() == MKPaint::Stroke || p.GetStyle() == MKPaint::FillAndStroke;
}
bool IsFlat(RectF const& r) { return r.left == r.right || r.top == r.bottom; }

RectF BoxAround(PointF const* points, std::size_t count) {
    RectF box(points[0].x, points[0].y, points[0].x, points[0].y);
    for (std::size_t i = 1; i < count; ++i) box.MakeRect(points[i].x, points[i].y);
    return box;
}

} // namespace

ReferenceCanvas::ReferenceCanvas(ReferenceBitmap& target, Device const& device)
    : mTarget(target),
      mStripHeight(device.maxTextureSize),
      mRaster(target.image, device.maxTextureSize, device.subpixelBits) {}

// What is not saved counts as saved where it was saved last, or as new; so restoring resets it.
int ReferenceCanvas::Save(SaveFlag flag) {
    SavedState state = mSaved.empty() ? SavedState() : mSaved.back();
    if (flag == SaveAll || flag == SaveMatrix) state.matrix = mMatrix;
    if (flag == SaveAll || flag == SaveClip) state.clips = mClipCount;
    mSaved.push_back(state);
    return static_cast<int>(mSaved.size()) - 1;
}

void ReferenceCanvas::Restore(int level) {
    int const count = static_cast<int>(mSaved.size());
    int const to = level < 0 ? count - 1 : level;
    if (to < 0 || to >= count) return;
    auto const index = static_cast<std::size_t>(to);
    mMatrix = mSaved[index].matrix;
    mClipCount = mSaved[index].clips;
    mSaved.resize(index);
    ClipEntry const nothing{0, 0, 0, 0, Intersect, Matrix3f(0.0f)};
    mClips.resize(static_cast<std::size_t>(mClipCount), nothing);
}

void ReferenceCanvas::SetClipRect(int x, int y, int width, int height, ClipOp op) {
    mClips.push_back({x, y, width, height, op, mMatrix});
    ++mClipCount;
}

void ReferenceCanvas::DrawShapes(std::vector<Shape> const& shapes, RectF const& extent, MKPaint const& paint,
                                 bool arePieces) {
    Painting painting;
    painting.arePieces = arePieces;
    painting.matrix = mMatrix;
    painting.extent = extent;
    painting.mode = paint.GetXFermode();
    for (Shape const& shape : shapes) {
        painting.brushes.push_back({shape.bounds, [&](PointD const& p) -> std::optional<Ink> {
                                        Coverage const c = shape.at(p);
                                        if (!c) return {};
                                        return Ink{PaintColor(paint, c->coverage), c->vague ? 255.0 : 0.0};
                                    }});
    }
    mRaster.Draw(painting, GetClip());
}

void ReferenceCanvas::DrawLine(PointF const& from, PointF const& to, MKPaint const* given) {
    MKPaint const paint = Given(given);
    if (from == to || paint.GetLineWidth() < 1) return;
    PointF const ends[] = {from, to};
    DrawShapes({Line(from, to, paint)}, BoxAround(ends, 2), paint);
}

// One by one: no segment meets its neighbour without a seam.
void ReferenceCanvas::DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* given) {
    MKPaint const paint = Given(given);
    if (points.empty() || paint.GetLineWidth() < 1) return;
    RectF const extent = BoxAround(points.data(), points.size());
    for (std::size_t i = 0; i + 1 < points.size(); i += 2) {
        DrawShapes(
            {SimpleLine(points[i], points[i + 1], double{paint.GetLineWidth()}, paint.IsAntiAliasing())},
            extent, paint);
    }
}

void ReferenceCanvas::DrawRect(RectF const& rect, MKPaint const* given) {
    MKPaint const paint = Given(given);
    if (IsFlat(rect)) return;
    std::vector<Shape> shapes;
    if (Fills(paint)) shapes.push_back(FilledRect(rect, paint.IsAntiAliasing()));
    if (Strokes(paint) && paint.GetLineWidth() >= 1) {
        shapes.push_back(StrokedRect(rect, double{paint.GetLineWidth()}, paint.IsAntiAliasing()));
    }
    DrawShapes(shapes, rect, paint);
}

void ReferenceCanvas::DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* given) {
    if (!(rx > 0 && ry > 0)) return DrawRect(rect, given);
    MKPaint const paint = Given(given);
    if (IsFlat(rect)) return;
    auto const x = double{rx};
    auto const y = double{ry};
    if (Fills(paint)) DrawShapes(FilledRoundRect(rect, x, y), rect, paint, true);
    if (Strokes(paint) && paint.GetLineWidth() >= 1) {
        DrawShapes(StrokedRoundRect(rect, x, y, double{paint.GetLineWidth()}), rect, paint, true);
    }
}

void ReferenceCanvas::DrawCircle(float cx, float cy, float radius, MKPaint const* given) {
    MKPaint const paint = Given(given);
    if (!(radius > 0)) return;
    PointD const center{double{cx}, double{cy}};
    auto const r = double{radius};
    std::vector<Shape> shapes;
    if (Fills(paint)) shapes.push_back(FilledCircle(center, r));
    if (Strokes(paint) && paint.GetLineWidth() > 0) {
        shapes.push_back(StrokedCircle(center, r, double{paint.GetLineWidth()}));
    }
    RectF extent(cx, cy, cx, cy);
    extent.IncreaseRect(radius, radius);
    DrawShapes(shapes, extent, paint);
}

} // namespace Moka::Testing
