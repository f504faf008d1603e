#include "moka/graphics/canvas/MKCanvas.h"

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/CanvasRequest.h"
#include "moka/graphics/canvas/MKCanvasImpl.h"
#include "moka/graphics/canvas/MKCanvasRT.h"
#include "moka/graphics/canvas/VectorOnHeap.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"

#include <utility>

namespace Moka {
namespace {

MKPaint const& PaintOrDefault(MKPaint const* paint) {
    static MKPaint const unset;
    return paint ? *paint : unset;
}

// Uses width and height as right and bottom, so this equals the bitmap's rectangle only if the bitmap lies at
// the origin.
RectF WholeOf(IMKBitmap* bitmap) {
    return RectF(Rect(bitmap->GetX(), bitmap->GetY(), bitmap->GetWidth(), bitmap->GetHeight()));
}

RectF PlacedAt(IMKBitmap* bitmap, float x, float y) {
    return RectF(x, y, x + static_cast<float>(bitmap->GetWidth()),
                 y + static_cast<float>(bitmap->GetHeight()));
}

} // namespace

template <bool kPosts>
DrawingCanvas<kPosts>::DrawingCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : CanvasFrontEnd<IMKCanvas, MKCanvasImpl, kPosts>(queue, bitmap) {}

template <bool kPosts>
template <class Function, class... Values>
bool DrawingCanvas<kPosts>::RequestDraw(MKPaint const* paint, Function function, Values&&... values) {
    return detail::Request<kPosts>(this->mMsgQueue, this->mImpl, function, std::forward<Values>(values)...,
                                   this->mState.matrix, PaintOrDefault(paint));
}

template <bool kPosts>
void DrawingCanvas<kPosts>::Draw(IMKCustomDrawable* drawable, MKPaint const* paint) {
    if (!drawable || !this->mImpl) return;
    drawable->Ref(); // for the request
    // Copies, because the drawable may change the canvas and the paint while it draws.
    detail::Request<kPosts>(this->mMsgQueue, this->mImpl, &MKCanvasImpl::DrawRT, drawable, this->GetMatrix(),
                            MKPaint(PaintOrDefault(paint)));
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawLine(PointF(x1, y1), PointF(x2, y2), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    RequestDraw(paint, &MKCanvasImpl::DrawLineRT, from, to);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawSimpleLine(PointF(x1, y1), PointF(x2, y2), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    RequestDraw(paint, &MKCanvasImpl::DrawSimpleLineRT, from, to);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) {
    // The render side deletes the copy, even if it throws.
    std::vector<PointF>* const copy = detail::CopyVector(points).release();
    if (!copy) return;
    if (!RequestDraw(paint, &MKCanvasImpl::DrawSimpleLinesRT, copy)) delete copy;
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) {
    DrawRect(RectF(left, top, right, bottom), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawRect(RectF const& rect, MKPaint const* paint) {
    RequestDraw(paint, &MKCanvasImpl::DrawRectRT, rect);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawRoundRect(float left, float top, float right, float bottom, float rx,
                                          float ry, MKPaint const* paint) {
    DrawRoundRect(RectF(left, top, right, bottom), rx, ry, paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) {
    if (rx > 0 && ry > 0)
        RequestDraw(paint, &MKCanvasImpl::DrawRoundRectRT, rect, rx, ry);
    else
        DrawRect(rect, paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawCircle(float cx, float cy, float radius, MKPaint const* paint) {
    RequestDraw(paint, &MKCanvasImpl::DrawCircleRT, PointF(cx, cy), radius);
}

template <bool kPosts>
bool DrawingCanvas<kPosts>::CanDraw(IMKBitmap* bitmap) const {
    return this->mImpl && bitmap && bitmap->GetBitmapReadable();
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, PlacedAt(bitmap, x, y), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, WholeOf(bitmap), dst, paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst,
                                       MKPaint const* paint) {
    if (!CanDraw(bitmap)) return;
    bitmap->Ref(); // the request's
    RequestDraw(paint, &MKCanvasImpl::DrawBitmapRT, bitmap, src, dst);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points,
                                        MKPaint const* paint) {
    if (!CanDraw(bitmap)) return;
    auto const place = [&](PointF const& p) { return PlacedAt(bitmap, p.x, p.y); };
    RequestBitmaps(bitmap, WholeOf(bitmap), detail::NewVector<RectF>(points, place), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts,
                                        MKPaint const* paint) {
    if (bitmap) DrawBitmaps(bitmap, WholeOf(bitmap), dsts, paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                                        MKPaint const* paint) {
    if (CanDraw(bitmap)) RequestBitmaps(bitmap, src, detail::CopyVector(dsts), paint);
}

template <bool kPosts>
void DrawingCanvas<kPosts>::RequestBitmaps(IMKBitmap* bitmap, RectF const& src,
                                           std::unique_ptr<std::vector<RectF>> dsts, MKPaint const* paint) {
    if (!dsts) return;
    bitmap->Ref(); // the request's
    // The render side deletes the rectangles, even if it throws.
    std::vector<RectF>* const given = dsts.release();
    if (!RequestDraw(paint, &MKCanvasImpl::DrawBitmapsRT, bitmap, src, given)) delete given;
}

template class DrawingCanvas<true>;
template class DrawingCanvas<false>;

MKCanvas::MKCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap) : DrawingCanvas(queue, bitmap) {}

MKCanvas::~MKCanvas() = default;

MKCanvasRT::MKCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap) : DrawingCanvas(queue, bitmap) {}

MKCanvasRT::~MKCanvasRT() = default;

} // namespace Moka
