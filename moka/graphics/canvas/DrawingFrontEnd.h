// DrawingFrontEnd: the caller's side of IMKCanvas's drawing; see CanvasFrontEnd.
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/IMKCanvas.h"

#include <memory>
#include <vector>

namespace Moka {

class MKCanvasImpl;

namespace detail {

template <class Reach>
class DrawingFrontEnd : public CanvasFrontEnd<IMKCanvas, MKCanvasImpl, Reach> {
public:
    void Draw(IMKCustomDrawable* drawable, MKPaint const* paint) override;

    void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override;
    void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) override;
    void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override;
    void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) override;
    void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) override;

    void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) override;
    void DrawRect(RectF const& rect, MKPaint const* paint) override;
    void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                       MKPaint const* paint) override;
    void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) override;
    void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) override;

    void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) override;

    void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                     MKPaint const* paint) override;

protected:
    DrawingFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap);

private:
    bool CanDraw(IMKBitmap* bitmap) const;
    // Takes a reference on the bitmap, and over the rectangles.
    void RequestBitmaps(IMKBitmap* bitmap, RectF const& src, std::unique_ptr<std::vector<RectF>> dsts,
                        MKPaint const* paint);
};

} // namespace detail
} // namespace Moka
