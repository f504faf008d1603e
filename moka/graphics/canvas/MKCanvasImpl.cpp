#include "moka/graphics/canvas/MKCanvasImpl.h"

#include "moka/base/Likely.h"
#include "moka/base/RefPtr.h"
#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/SourcePiece.h"
#include "moka/graphics/canvas/VectorOnHeap.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"

#include <algorithm>
#include <new>

namespace Moka {
namespace {

// Returns the drawable; creates it at the first call. Call it before activating anything, because the
// constructor may throw.
template <class T, class... Arguments>
T* FindOrMake(std::unique_ptr<T>& drawable, Arguments... arguments) {
    if (!drawable) drawable.reset(new (std::nothrow) T(arguments...));
    return drawable.get();
}

bool HasNoExtent(RectF const& r) { return r.left == r.right || r.top == r.bottom; }

bool DrawsNoLine(PointF const& a, PointF const& b, MKPaint const& paint) {
    return a == b || paint.GetLineWidth() < 1.0f;
}

RectF BoxOf(PointF const& a, PointF const& b) {
    RectF box(a.x, a.y, a.x, a.y);
    box.MakeRect(b.x, b.y);
    return box;
}

RectF BoxOf(std::vector<PointF> const& points) {
    RectF box(points[0].x, points[0].y, points[0].x, points[0].y);
    for (PointF const& p : points) box.MakeRect(p.x, p.y);
    return box;
}

bool Touches(RectF const& frame, RectF const& shape, Matrix3<float> const& m) {
    RectF box;
    m.mapRect(&box, shape);
    return frame.IsIntersect(box);
}

bool IsOneFrameBuffer(IMKBitmap* target) {
    IMKTextureBitmap* const tiled = target->GetTextureBitmap();
    return !tiled || tiled->GetSubBitmapCount() == 1;
}

void LogLineDrawableCreated() {
    // A fixed text, because log filters search for it.
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "%s MKLineDrawable Created",
                        "void Moka::MKCanvasImpl::DrawSimpleLinesRT(vector<Moka::PointF> *, Moka::Matrix3f, "
                        "Moka::MKPaint)");
}

} // namespace

MKCanvasImpl::MKCanvasImpl(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread)
    : MKCanvasImplBase(queue, bitmap, onRenderThread), mQueue(queue) {}

MKCanvasImpl::~MKCanvasImpl() {
    DeleteClipping();
    mLineDrawable.reset();
    mRectDrawable.reset();
    mRoundRectDrawable.reset();
    mCircleDrawable.reset();
    mBitmapDrawable.reset();
}

// Calls draw(bounds, projection) for each frame buffer that the shape can touch, while it is active and
// clipped. bounds is the frame buffer's part of the target.
template <class Draw>
void MKCanvasImpl::DrawWhereTouched(RectF const& shape, Matrix3<float> const& m, Draw const& draw) {
    ForEachFrameBuffer([&](FrameBuffer const& frame) {
        if (MOKA_UNLIKELY(!Touches(frame.bounds, shape, m))) return;
        Drawing const ready(GetClipping(), frame.writable, frame.index);
        draw(frame.bounds, Project(*frame.writable, m));
    });
}

Matrix4<float> const& MKCanvasImpl::Project(IMKBitmapWritable& target, Matrix3<float> const& model) {
    Matrix4<float> const projection = target.GetProjectionMatrix();
    if (!(mLast.target == projection) || !(mLast.model == model)) {
        mLast.target = projection;
        mLast.model = model;
        mLast.product = projection * FromMatrix3(model);
    }
    return mLast.product;
}

void MKCanvasImpl::DrawRT(IMKCustomDrawable* drawable, Matrix3<float> const& m, MKPaint const& paint) {
    Trace::NameTask("DrawRT");
    auto const held = RefPtr<IMKCustomDrawable>::Adopt(drawable);
    if (!held) return;
    ForEachFrameBuffer([&](FrameBuffer const& frame) {
        Drawing const ready(GetClipping(), frame.writable, -1);
        // A custom drawable gets its own copy of the paint.
        drawable->DrawRT(frame.writable->GetProjectionMatrix() * FromMatrix3(m), MKPaint(paint));
    });
}

void MKCanvasImpl::DrawLineRT(PointF const& a, PointF const& b, Matrix3<float> const& m,
                              MKPaint const& paint) {
    Trace::NameTask("DrawLineRT");
    if (DrawsNoLine(a, b, paint)) return;
    MKLineDrawable* const drawable = FindOrMake(mLineDrawable);
    if (!drawable) return;
    DrawWhereTouched(BoxOf(a, b), m, [&](RectF const&, Matrix4<float> const& projection) {
        drawable->DrawLineRT(a, b, projection, paint);
    });
}

void MKCanvasImpl::DrawSimpleLineRT(PointF const& a, PointF const& b, Matrix3<float> const& m,
                                    MKPaint const& paint) {
    Trace::NameTask("DrawSimpleLineRT");
    if (DrawsNoLine(a, b, paint)) return;
    MKLineDrawable* const drawable = FindOrMake(mLineDrawable);
    if (!drawable) return;
    DrawWhereTouched(BoxOf(a, b), m, [&](RectF const&, Matrix4<float> const& projection) {
        drawable->DrawSimpleLineRT(a, b, projection, paint);
    });
}

void MKCanvasImpl::DrawSimpleLinesRT(std::vector<PointF>* points, Matrix3<float> const& m,
                                     MKPaint const& paint) {
    Trace::NameTask("DrawSimpleLinesRT");
    std::unique_ptr<std::vector<PointF>> own(points);
    if (!own || own->empty() || paint.GetLineWidth() < 1.0f) return;
    bool const isFirst = !mLineDrawable;
    MKLineDrawable* const drawable = FindOrMake(mLineDrawable);
    if (!drawable) return;
    if (isFirst) LogLineDrawableCreated();
    // The drawable deletes the vector at every call, so each of several strips gets a copy.
    bool const once = IsOneFrameBuffer(GetBitmap());
    DrawWhereTouched(BoxOf(*own), m, [&](RectF const&, Matrix4<float> const& projection) {
        std::vector<PointF>* const given = once ? own.release() : detail::CopyVector(*own).release();
        if (given) drawable->DrawSimpleLinesRT(given, projection, paint);
    });
}

void MKCanvasImpl::DrawRectRT(RectF const& r, Matrix3<float> const& m, MKPaint const& paint) {
    Trace::NameTask("DrawRectRT");
    if (HasNoExtent(r)) return;
    MKRectDrawable* const drawable = FindOrMake(mRectDrawable);
    if (!drawable) return;
    DrawWhereTouched(r, m, [&](RectF const&, Matrix4<float> const& projection) {
        drawable->DrawRectRT(r, projection, paint);
    });
}

void MKCanvasImpl::DrawRoundRectRT(RectF const& r, float rx, float ry, Matrix3<float> const& m,
                                   MKPaint const& paint) {
    Trace::NameTask("DrawRoundRectRT");
    if (HasNoExtent(r)) return;
    MKRoundRectDrawable* const drawable = FindOrMake(mRoundRectDrawable);
    if (!drawable) return;
    DrawWhereTouched(r, m, [&](RectF const&, Matrix4<float> const& projection) {
        drawable->DrawRoundRectRT(r, rx, ry, projection, paint);
    });
}

void MKCanvasImpl::DrawCircleRT(PointF const& c, float radius, Matrix3<float> const& m,
                                MKPaint const& paint) {
    Trace::NameTask("DrawCircleRT");
    if (!(radius > 0)) return;
    MKCircleDrawable* const drawable = FindOrMake(mCircleDrawable);
    if (!drawable) return;
    RectF box = BoxOf(c, c);
    box.IncreaseRect(radius, radius);
    DrawWhereTouched(box, m, [&](RectF const&, Matrix4<float> const& projection) {
        drawable->DrawCircleRT(c, radius, projection, paint);
    });
}

void MKCanvasImpl::DrawBitmapRT(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect,
                                Matrix3<float> const& m, MKPaint const& paint) {
    Trace::NameTask("DrawBitmapRT");
    auto const held = RefPtr<IMKBitmap>::Adopt(src);
    if (!held || HasNoExtent(dstRect)) return;
    if (!FindOrMake(mBitmapDrawable, mQueue) || !src->GetTextureBitmap()) return;
    if (paint.GetTileModeX() == MKPaint::Default && paint.GetTileModeY() == MKPaint::Default)
        DrawInPieces(src, srcRect, dstRect, m, paint);
    else
        DrawWhole(src, srcRect, dstRect, m, paint);
}

void MKCanvasImpl::DrawWhole(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect,
                             Matrix3<float> const& m, MKPaint const& paint) {
    RectF const srcBounds(src->GetBitmapRect());
    DrawWhereTouched(dstRect, m, [&](RectF const& bounds, Matrix4<float> const& projection) {
        mBitmapDrawable->DrawBitmapRT(src->GetBitmapReadable(), srcBounds, bounds, srcRect, dstRect,
                                      projection, paint);
    });
}

void MKCanvasImpl::DrawInPieces(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect,
                                Matrix3<float> const& m, MKPaint const& paint) {
    MKPaint clamped(paint);
    clamped.SetTileMode(MKPaint::Clamp);
    IMKTextureBitmap* const tiled = src->GetTextureBitmap();
    for (int i = 0; i < tiled->GetSubBitmapCount(); ++i) {
        IMKSubBitmap* const strip = tiled->GetSubBitmap(i);
        detail::SourcePiece piece;
        if (!strip || !detail::CutToStrip(strip->GetBitmapRect(), srcRect, dstRect, piece)) continue;
        RectF const stripBounds(strip->GetBitmapRect());
        DrawWhereTouched(piece.dst, m, [&](RectF const& bounds, Matrix4<float> const& projection) {
            mBitmapDrawable->DrawBitmapRT(strip, stripBounds, bounds, piece.src, piece.dst, projection,
                                          clamped);
        });
    }
}

void MKCanvasImpl::DrawBitmapsRT(IMKBitmap* src, RectF const& srcRect, std::vector<RectF>* dstRects,
                                 Matrix3<float> const& m, MKPaint const& paint) {
    Trace::NameTask("DrawBitmapsRT");
    auto const held = RefPtr<IMKBitmap>::Adopt(src);
    std::unique_ptr<std::vector<RectF>> const dsts(dstRects);
    IMKBitmapWritable* const writable = GetBitmap()->GetBitmapWritable();
    if (!held || !dsts || !writable || !FindOrMake(mBitmapDrawable, mQueue)) return;
    if (!HasFrameBuffer(-1)) return;
    RectF const srcBounds(src->GetBitmapRect());
    if (!srcRect.IsIntersect(srcBounds)) return;
    RectF const bounds(GetBitmap()->GetBitmapRect());
    auto const hidden = [&](RectF const& dst) { return !Touches(bounds, dst, m); };
    dsts->erase(std::remove_if(dsts->begin(), dsts->end(), hidden), dsts->end());
    if (dsts->empty()) return;
    Drawing const ready(GetClipping(), writable, -1);
    mBitmapDrawable->DrawBitmapsRT(src->GetBitmapReadable(), srcBounds, bounds, srcRect, dsts.get(),
                                   writable->GetProjectionMatrix() * FromMatrix3(m), paint);
}

} // namespace Moka
