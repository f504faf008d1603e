/// MKCanvasChecker: a canvas that forwards every call to another one while it is referenced, and throws
/// "Canvas was already released!!" afterwards. Owner, Thread, Fails: see Checker.h.
/// GetMatrix and GetBitmap end the process, as calls to pure virtual functions do.
// Compat: checker-pure
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/debug/CanvasChecker.h"

namespace Moka {

class MOKA_API MKCanvasChecker final : public detail::CanvasChecker<IMKCanvas> {
public:
    explicit MKCanvasChecker(IMKCanvas* canvas); ///< not null, not owned
    ~MKCanvasChecker() override;

    /// Ends the process.
    IMKBitmap* GetBitmap() override { detail::EndAsPureVirtual(); }

    /// Forwards while referenced.
    void Draw(IMKCustomDrawable* drawable, MKPaint const* paint) override { Checked().Draw(drawable, paint); }

    void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override {
        Checked().DrawLine(x1, y1, x2, y2, paint);
    }
    void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) override {
        Checked().DrawLine(from, to, paint);
    }
    void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override {
        Checked().DrawSimpleLine(x1, y1, x2, y2, paint);
    }
    void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) override {
        Checked().DrawSimpleLine(from, to, paint);
    }
    void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) override {
        Checked().DrawSimpleLines(points, paint);
    }

    void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) override {
        Checked().DrawRect(left, top, right, bottom, paint);
    }
    void DrawRect(RectF const& rect, MKPaint const* paint) override { Checked().DrawRect(rect, paint); }
    void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                       MKPaint const* paint) override {
        Checked().DrawRoundRect(left, top, right, bottom, rx, ry, paint);
    }
    void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) override {
        Checked().DrawRoundRect(rect, rx, ry, paint);
    }
    void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) override {
        Checked().DrawCircle(cx, cy, radius, paint);
    }

    void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) override {
        Checked().DrawBitmap(bitmap, x, y, paint);
    }
    void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) override {
        Checked().DrawBitmap(bitmap, dst, paint);
    }
    void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) override {
        Checked().DrawBitmap(bitmap, src, dst, paint);
    }

    void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) override {
        Checked().DrawBitmaps(bitmap, points, paint);
    }
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) override {
        Checked().DrawBitmaps(bitmap, dsts, paint);
    }
    void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                     MKPaint const* paint) override {
        Checked().DrawBitmaps(bitmap, src, dsts, paint);
    }
};

} // namespace Moka
