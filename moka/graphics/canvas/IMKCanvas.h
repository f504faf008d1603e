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
    /// Draws a custom drawable. Calls its DrawRT once for each strip of the target.
    virtual void Draw(IMKCustomDrawable* drawable, MKPaint const* paint) = 0;

    /// Draws a line with caps and dashes, always anti-aliased. If it is narrower than 1, it draws nothing.
    virtual void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) = 0;
    virtual void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) = 0;

    /// Draws a line without caps and dashes, with square ends. If it is narrower than 1, it draws nothing.
    virtual void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) = 0;
    virtual void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) = 0;
    /// Draws simple lines: from the first point to the second, from the third to the fourth, and so on. An
    /// odd last point is ignored.
    virtual void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) = 0;

    /// Draws a rectangle. Strokes narrower than 1 draw nothing.
    virtual void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) = 0;
    virtual void DrawRect(RectF const& rect, MKPaint const* paint) = 0;

    /// Draws a rectangle with elliptic corners, always anti-aliased. If a radius is not positive, draws a
    /// plain rectangle. Strokes narrower than 1 draw nothing.
    virtual void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                               MKPaint const* paint) = 0;
    virtual void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) = 0;

    /// Draws a circle, always anti-aliased. Strokes may have any positive width.
    virtual void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) = 0;

    /// Draws a bitmap in its own size, with its upper left corner at (x, y). Screen bitmaps cannot be sampled
    /// and are not drawn.
    virtual void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) = 0;
    /// Draws a bitmap scaled to dst. The source rectangle is (GetX(), GetY()) to (GetWidth(), GetHeight()).
    /// It differs from the bitmap's own rectangle if the bitmap does not lie at the origin.
    virtual void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) = 0;
    /// Draws the part src of a bitmap, scaled to dst.
    virtual void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) = 0;

    /// Draws the same bitmap many times in one request: in its own size at each point. Samples only the first
    /// strip of the bitmap, and draws only into the first strip of the target.
    virtual void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) = 0;
    /// Draws the bitmap, or its part src, scaled to each of dsts. Otherwise like the function above.
    virtual void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) = 0;
    virtual void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                             MKPaint const* paint) = 0;
};

} // namespace Moka
