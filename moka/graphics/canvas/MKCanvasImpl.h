// MKCanvasImpl: the render side of a canvas. For each request it calls a drawable once for every frame buffer
// of the target that the shape can touch, under the clip.
// It keeps neither matrix nor paint: each request has its own.
// Thread: render thread. The constructor without onRenderThread may run on any thread.
// Units:  pixels before the matrix. The GPU applies the matrix.
// Cost:   a drawable is created at the first request that needs it. Strip culling uses the mapped corners
//         only and ignores stroke width and fringe. // Compat: culling
// Fails:  silently. If a drawable could not be created, the next request tries again. Exceptions of a
//         shader's constructor pass through, after the request has released everything that it held.
#pragma once

#include "moka/base/Point.h"
#include "moka/base/Rect.h"
#include "moka/graphics/canvas/MKCanvasImplBase.h"
#include "moka/graphics/drawable/MKBitmapDrawable.h"
#include "moka/graphics/drawable/MKCircleDrawable.h"
#include "moka/graphics/drawable/MKLineDrawable.h"
#include "moka/graphics/drawable/MKRectDrawable.h"
#include "moka/graphics/drawable/MKRoundRectDrawable.h"
#include "moka/graphics/paint/MKPaint.h"

#include <memory>
#include <vector>

namespace Moka {

class IMKCustomDrawable;

class MKCanvasImpl final : public MKCanvasImplBase {
public:
    MKCanvasImpl(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread);
    ~MKCanvasImpl() override;

    // Drops one reference on the drawable. Draws into every frame buffer, each with index -1. So stencil
    // clips have no effect on it on texture bitmaps. // Compat: whole-frame-buffer
    void DrawRT(IMKCustomDrawable* drawable, Matrix3<float> const& m, MKPaint const& paint);

    void DrawLineRT(PointF const& a, PointF const& b, Matrix3<float> const& m, MKPaint const& paint);
    void DrawSimpleLineRT(PointF const& a, PointF const& b, Matrix3<float> const& m, MKPaint const& paint);
    // Takes ownership of the vector.
    void DrawSimpleLinesRT(std::vector<PointF>* points, Matrix3<float> const& m, MKPaint const& paint);
    void DrawRectRT(RectF const& r, Matrix3<float> const& m, MKPaint const& paint);
    void DrawRoundRectRT(RectF const& r, float rx, float ry, Matrix3<float> const& m, MKPaint const& paint);
    void DrawCircleRT(PointF const& c, float radius, Matrix3<float> const& m, MKPaint const& paint);

    // These two drop one reference on src. If the paint does not tile, each strip of src is drawn separately,
    // clamped at its edges.
    void DrawBitmapRT(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect, Matrix3<float> const& m,
                      MKPaint const& paint);
    // Deletes the vector. Uses the first strips only, with index -1. // Compat: first-strips
    void DrawBitmapsRT(IMKBitmap* src, RectF const& srcRect, std::vector<RectF>* dstRects,
                       Matrix3<float> const& m, MKPaint const& paint);

private:
    // The matrices of the last draw and their product. Consecutive draws mostly use the same two matrices.
    struct Projection {
        Matrix4<float> target;
        Matrix3<float> model;
        Matrix4<float> product;
    };

    // Returns the matrix from model coordinates (pixels) to the target's clip coordinates. The reference is
    // valid until the next call.
    Matrix4<float> const& Project(IMKBitmapWritable& target, Matrix3<float> const& model);

    template <class Draw>
    void DrawWhereTouched(RectF const& shape, Matrix3<float> const& m, Draw const& draw);
    void DrawWhole(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect, Matrix3<float> const& m,
                   MKPaint const& paint);
    void DrawInPieces(IMKBitmap* src, RectF const& srcRect, RectF const& dstRect, Matrix3<float> const& m,
                      MKPaint const& paint);

    IGLMsgQueue* const mQueue; // not owned
    Projection mLast;
    std::unique_ptr<MKLineDrawable> mLineDrawable;
    std::unique_ptr<MKRectDrawable> mRectDrawable;
    std::unique_ptr<MKRoundRectDrawable> mRoundRectDrawable;
    std::unique_ptr<MKCircleDrawable> mCircleDrawable;
    std::unique_ptr<MKBitmapDrawable> mBitmapDrawable;
};

} // namespace Moka
