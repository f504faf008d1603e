// ReferenceCanvas: the canvas as it should be, computed on the CPU from the geometry: what the real one's
// pictures are compared with. Slow, and shares with the library only matrices, paints and rectangles.
// Owner: the bitmap drawn on outlives it. Custom drawables draw nothing: they are the GPU's.
// Thread: one at a time.
#pragma once

#include "moka/base/RefCount.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "tests/support/reference/ReferenceBitmap.h"
#include "tests/support/reference/ReferenceRaster.h"

namespace Moka::Testing {

class ReferenceCanvas final : public IMKCanvas, public RefCount {
public:
    struct Device {
        int maxTextureSize = 4096; // targets and sources are cut into strips of so many rows
        int subpixelBits = 8;      // of its rasteriser
    };

    ReferenceCanvas(ReferenceBitmap& target, Device const& device);

    Slack const& GetSlack() const { return mRaster.GetSlack(); }

    void Clear(int argb) override { mRaster.Fill(Unpack(argb), GetClip()); }
    void Clear(float r, float g, float b, float a) override { mRaster.Fill({r, g, b, a}, GetClip()); }
    void ClearAll(int argb) override { mRaster.Fill(Unpack(argb), {}); }
    void ClearAll(float r, float g, float b, float a) override { mRaster.Fill({r, g, b, a}, {}); }

    int Save(SaveFlag flag) override;
    void Restore(int level) override;
    void SetClipRect(int x, int y, int width, int height, ClipOp op) override;

    void SetMatrix(Matrix3f const& m) override { mMatrix = m; }
    Matrix3f GetMatrix() override { return mMatrix; }
    void PreConcat(Matrix3f const& m) override { mMatrix.preConcat(m); }
    void PostConcat(Matrix3f const& m) override { mMatrix.postConcat(m); }
    void PreScale(float sx, float sy) override { mMatrix.preScale(sx, sy); }
    void PostScale(float sx, float sy) override { mMatrix.postScale(sx, sy); }
    void PreRotate(float degrees) override { mMatrix.preRotate(degrees); }
    void PreRotate(float degrees, float px, float py) override { mMatrix.preRotate(degrees, px, py); }
    void PostRotate(float degrees) override { mMatrix.postRotate(degrees); }
    void PostRotate(float degrees, float px, float py) override { mMatrix.postRotate(degrees, px, py); }
    void PreTranslate(float tx, float ty) override { mMatrix.preTranslate(tx, ty); }
    void PostTranslate(float tx, float ty) override { mMatrix.postTranslate(tx, ty); }

    void SetTag(char const* tag) override { mTag = tag ? tag : ""; }
    char const* GetTag() override { return mTag.c_str(); }
    IGLMsgQueue* GetMsgQueue() override { return nullptr; }
    IMKBitmap* GetBitmap() override { return &mTarget; }
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

    void Draw(IMKCustomDrawable*, MKPaint const*) override {}
    void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override {
        DrawLine(PointF(x1, y1), PointF(x2, y2), paint);
    }
    void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) override;
    void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override {
        DrawSimpleLine(PointF(x1, y1), PointF(x2, y2), paint);
    }
    void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) override {
        if (!(from == to)) DrawSimpleLines({from, to}, paint);
    }
    void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) override;
    void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) override {
        DrawRect(RectF(left, top, right, bottom), paint);
    }
    void DrawRect(RectF const& rect, MKPaint const* paint) override;
    void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                       MKPaint const* paint) override {
        DrawRoundRect(RectF(left, top, right, bottom), rx, ry, paint);
    }
    void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) override;
    void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                     MKPaint const* paint) override;

private:
    struct SavedState {
        Matrix3f matrix;
        int clips = 0;
    };

    static MKPaint Given(MKPaint const* paint) { return paint ? *paint : MKPaint(); }
    static Rgba Unpack(int argb) {
        MKPaint paint;
        paint.SetColor(argb);
        return Rgba(paint.GetColor());
    }
    ClipSet GetClip() const { return ClipSet(mClips, mTarget.image.height); }
    void DrawShapes(std::vector<Shape> const& shapes, RectF const& extent, MKPaint const& paint,
                    bool arePieces = false);
    void DrawQuads(Picture const& image, ReferenceBitmap const& bitmap, std::vector<BitmapQuad> const& quads,
                   MKPaint const& paint, bool batch);

    ReferenceBitmap& mTarget;
    int const mStripHeight;
    ReferenceRaster mRaster;
    std::string mTag;
    Matrix3f mMatrix;
    std::vector<SavedState> mSaved;
    std::vector<ClipEntry> mClips;
    int mClipCount = 0;
};

} // namespace Moka::Testing
