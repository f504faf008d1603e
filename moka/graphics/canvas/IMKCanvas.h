/// IMKCanvas: draws primitives, bitmaps and custom drawables onto a bitmap.
/// Each call takes its own copies of the paint, the shapes and the current matrix; the caller may change them
/// at once. A null paint draws with a new one: opaque white, source-over, filled.
/// Owner:  as IMKCanvasBase. A bitmap or drawable that a call names stays alive until it is drawn.
/// Thread: as IMKCanvasBase.
/// Units:  pixels before the current matrix, which scales widths, anti-aliasing fringes and dashes too.
/// Fails:  silently: nothing is drawn for empty shapes, null sources, or if the queue refuses.
/// The vtable order is ABI.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"
#include "moka/graphics/canvas/IMKCanvasBase.h"

#include <vector>

namespace Moka {

class IMKCustomDrawable;
class MKPaint;

class IMKCanvas : public IMKCanvasBase {
public:
    /// Calls the drawable once for each strip of the target.
    virtual void Draw(IMKCustomDrawable* drawable, MKPaint const* paint) = 0;

    /// A line with caps and dashes, always anti-aliased. Narrower than 1 it draws nothing.
    virtual void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) = 0;
    virtual void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) = 0;

    /// A line without caps and dashes, its ends cut square. Narrower than 1 it draws nothing.
    virtual void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) = 0;
    virtual void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) = 0;
    /// Simple lines between each two points; an odd last point is ignored.
    virtual void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) = 0;

    /// A rectangle. Strokes narrower than 1 draw nothing.
    virtual void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) = 0;
    virtual void DrawRect(RectF const& rect, MKPaint const* paint) = 0;

    /// A round rectangle, always anti-aliased; a rectangle if a radius is not positive. Strokes narrower than
    /// 1 draw nothing.
    virtual void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                               MKPaint const* paint) = 0;
    virtual void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) = 0;

    /// A circle, always anti-aliased. Strokes have any positive width.
    virtual void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) = 0;

    /// A bitmap at its size, or scaled into dst, or its part src scaled into dst. Screen bitmaps cannot be
    /// sampled and are not drawn. Without src the source rectangle is (GetX(),
    /// GetY()) to (GetWidth(), GetHeight()). It differs from the bitmap's own rectangle if the bitmap does
    /// not lie at the origin.
    virtual void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) = 0;
    virtual void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) = 0;
    virtual void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) = 0;

    /// The same bitmap many times in one request. Only the first strips of the bitmap and of the target are
    /// used.
    virtual void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) = 0;
    virtual void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) = 0;
    virtual void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                             MKPaint const* paint) = 0;
};

} // namespace Moka
