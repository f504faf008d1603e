// MKCanvas: a canvas for any thread. Each request is posted to the render thread with copies of everything it
// needs. MKGraphicsFactory::CreateCanvas creates it. MKCanvasRT is the flavour for the render thread.
// Owner:  as IMKCanvas. Posted requests are drawn even if the canvas is deleted first.
// Thread: any, one at a time.
// Cost:   each call posts one task. Only calls that take a vector also copy it.
// Fails:  requests that the queue refuses are dropped. References that a request took on a bitmap or a
//         drawable are then kept. // Compat: refused-post
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/IMKCanvas.h"

#include <memory>
#include <vector>

namespace Moka {

class MKCanvasImpl;

// The drawing operations of both flavours; a null paint is a default one.
template <bool kPosts>
class DrawingCanvas : public CanvasFrontEnd<IMKCanvas, MKCanvasImpl, kPosts> {
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
    DrawingCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);

private:
    // Requests a function of the render side. Appends the current matrix and the paint to the values.
    template <class Function, class... Values>
    bool RequestDraw(MKPaint const* paint, Function function, Values&&... values);

    bool CanDraw(IMKBitmap* bitmap) const;
    // Takes a reference on the bitmap, and ownership of the rectangles.
    void RequestBitmaps(IMKBitmap* bitmap, RectF const& src, std::unique_ptr<std::vector<RectF>> dsts,
                        MKPaint const* paint);
};

// Exported here, because their template argument MKCanvasImpl is not exported.
extern template class MOKA_API CanvasFrontEnd<IMKCanvas, MKCanvasImpl, true>;
extern template class MOKA_API DrawingCanvas<true>;

class MOKA_API MKCanvas final : public DrawingCanvas<true> {
public:
    // Neither argument may be null.
    MKCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKCanvas() override;
};

} // namespace Moka
