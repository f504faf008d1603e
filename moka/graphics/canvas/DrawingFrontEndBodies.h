// DrawingFrontEndBodies.h: the bodies of DrawingFrontEnd, for the sources that instantiate it.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/CanvasFrontEndBodies.h"
#include "moka/graphics/canvas/DrawingFrontEnd.h"
#include "moka/graphics/canvas/MKCanvasImpl.h"
#include "moka/graphics/canvas/VectorOnHeap.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"

#include <utility>

namespace Moka::detail {

inline MKPaint const& PaintOrDefault(MKPaint const* paint) {
    static MKPaint const unset;
    return paint ? *paint : unset;
}

// Width and height where right and bottom belong: not the bitmap's own rectangle unless it lies at the
// origin. Relied upon.
inline RectF WholeOf(IMKBitmap* bitmap) {
    return RectF(Rect(bitmap->GetX(), bitmap->GetY(), bitmap->GetWidth(), bitmap->GetHeight()));
}

inline RectF PlacedAt(IMKBitmap* bitmap, float x, float y) {
    return RectF(x, y, x + static_cast<float>(bitmap->GetWidth()),
                 y + static_cast<float>(bitmap->GetHeight()));
}

template <class Reach>
DrawingFrontEnd<Reach>::DrawingFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : CanvasFrontEnd<IMKCanvas, MKCanvasImpl, Reach>(queue, bitmap) {}

template <class Reach>
void DrawingFrontEnd<Reach>::Draw(IMKCustomDrawable* drawable, MKPaint const* paint) {
    if (!drawable || !this->GetImpl()) return;
    drawable->Ref(); // the request's
    this->Request(&MKCanvasImpl::DrawRT, drawable, this->GetCurrentMatrix(), PaintOrDefault(paint));
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawLine(PointF(x1, y1), PointF(x2, y2), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    this->Request(&MKCanvasImpl::DrawLineRT, from, to, this->GetCurrentMatrix(), PaintOrDefault(paint));
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawSimpleLine(PointF(x1, y1), PointF(x2, y2), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    this->Request(&MKCanvasImpl::DrawSimpleLineRT, from, to, this->GetCurrentMatrix(), PaintOrDefault(paint));
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) {
    // The render side deletes the copy, also when it throws.
    std::vector<PointF>* const copy = CopyVector(points).release();
    if (!copy) return;
    if (!this->Request(&MKCanvasImpl::DrawSimpleLinesRT, copy, this->GetCurrentMatrix(),
                       PaintOrDefault(paint)))
        delete copy;
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawRect(float left, float top, float right, float bottom,
                                      MKPaint const* paint) {
    DrawRect(RectF(left, top, right, bottom), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawRect(RectF const& rect, MKPaint const* paint) {
    this->Request(&MKCanvasImpl::DrawRectRT, rect, this->GetCurrentMatrix(), PaintOrDefault(paint));
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawRoundRect(float left, float top, float right, float bottom, float rx,
                                           float ry, MKPaint const* paint) {
    DrawRoundRect(RectF(left, top, right, bottom), rx, ry, paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) {
    if (rx > 0 && ry > 0)
        this->Request(&MKCanvasImpl::DrawRoundRectRT, rect, rx, ry, this->GetCurrentMatrix(),
                      PaintOrDefault(paint));
    else
        DrawRect(rect, paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawCircle(float cx, float cy, float radius, MKPaint const* paint) {
    this->Request(&MKCanvasImpl::DrawCircleRT, PointF(cx, cy), radius, this->GetCurrentMatrix(),
                  PaintOrDefault(paint));
}

template <class Reach>
bool DrawingFrontEnd<Reach>::CanDraw(IMKBitmap* bitmap) const {
    return this->GetImpl() && bitmap && bitmap->GetBitmapReadable();
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, PlacedAt(bitmap, x, y), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, WholeOf(bitmap), dst, paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst,
                                        MKPaint const* paint) {
    if (!CanDraw(bitmap)) return;
    bitmap->Ref(); // the request's
    this->Request(&MKCanvasImpl::DrawBitmapRT, bitmap, src, dst, this->GetCurrentMatrix(),
                  PaintOrDefault(paint));
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points,
                                         MKPaint const* paint) {
    if (!CanDraw(bitmap)) return;
    auto const place = [&](PointF const& p) { return PlacedAt(bitmap, p.x, p.y); };
    RequestBitmaps(bitmap, WholeOf(bitmap), NewVector<RectF>(points, place), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts,
                                         MKPaint const* paint) {
    if (bitmap) DrawBitmaps(bitmap, WholeOf(bitmap), dsts, paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                                         MKPaint const* paint) {
    if (CanDraw(bitmap)) RequestBitmaps(bitmap, src, CopyVector(dsts), paint);
}

template <class Reach>
void DrawingFrontEnd<Reach>::RequestBitmaps(IMKBitmap* bitmap, RectF const& src,
                                            std::unique_ptr<std::vector<RectF>> dsts, MKPaint const* paint) {
    if (!dsts) return;
    bitmap->Ref(); // the request's
    // The render side deletes the rectangles, also when it throws.
    std::vector<RectF>* const given = dsts.release();
    if (!this->Request(&MKCanvasImpl::DrawBitmapsRT, bitmap, src, given, this->GetCurrentMatrix(),
                       PaintOrDefault(paint)))
        delete given;
}

} // namespace Moka::detail
