// CanvasFrontEnd: the caller's side of every canvas: clearing, the matrix, clips, the save stack, the
// tag. DrawingCanvas (MKCanvas.h) and PenCanvas (MKPenCanvas.h) add their operations to it. kPosts tells
// their two flavours apart: true posts each request to the render thread, false calls the render side at
// once.
// Owner:  holds the render side, which dies on the render thread.
// Thread: one at a time; not posting, the render thread.
// Fails:  without a render side (memory ran out, or the target does not suit) the local state works on, and
//         every request is dropped. Requests that the queue refuses are dropped; references taken for them
//         stay.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/RefCount.h"
#include "moka/base/Tag.h"
#include "moka/graphics/canvas/IMKCanvasBase.h"

#include <vector>

namespace Moka {

// Matrix, clip count, saved levels of both, and the tag. A value.
class MOKA_API CanvasState {
public:
    Matrix3<float> matrix;
    int clipCount = 0; // clips requested, whether or not the queue took them
    Tag tag;

    // Returns the index of the new level. A part that the flag leaves out gets its value in the level below,
    // or the identity or 0 without one, so that restoring resets it. When memory runs out there is no new
    // level, and restoring to the index does nothing. // Compat: save-one-part
    int Save(IMKCanvasBase::SaveFlag flag);
    // False, and nothing changes, for a level that does not exist. A negative one is the last.
    bool Restore(int level);

private:
    struct Level {
        Matrix3<float> matrix;
        int clipCount = 0;
    };

    std::vector<Level> mLevels;
};

template <class Interface, class Impl, bool kPosts>
class CanvasFrontEnd : public Interface, public RefCount {
public:
    using ClipOp = IMKCanvasBase::ClipOp;
    using SaveFlag = IMKCanvasBase::SaveFlag;

    ~CanvasFrontEnd() override;

    void Clear(int argb) override;
    void Clear(float r, float g, float b, float a) override;
    void ClearAll(int argb) override;
    void ClearAll(float r, float g, float b, float a) override;

    int Save(SaveFlag flag) override { return mState.Save(flag); }
    void Restore(int level) override;
    void SetClipRect(int x, int y, int width, int height, ClipOp op) override;

    void SetMatrix(Matrix3<float> const& m) override { mState.matrix = m; }
    Matrix3<float> GetMatrix() override { return mState.matrix; }
    void PreConcat(Matrix3<float> const& m) override { mState.matrix.preConcat(m); }
    void PostConcat(Matrix3<float> const& m) override { mState.matrix.postConcat(m); }
    void PreScale(float sx, float sy) override { mState.matrix.preScale(sx, sy); }
    void PostScale(float sx, float sy) override { mState.matrix.postScale(sx, sy); }
    void PreRotate(float degrees) override { mState.matrix.preRotate(degrees); }
    void PreRotate(float degrees, float px, float py) override { mState.matrix.preRotate(degrees, px, py); }
    void PostRotate(float degrees) override { mState.matrix.postRotate(degrees); }
    void PostRotate(float degrees, float px, float py) override { mState.matrix.postRotate(degrees, px, py); }
    void PreTranslate(float tx, float ty) override { mState.matrix.preTranslate(tx, ty); }
    void PostTranslate(float tx, float ty) override { mState.matrix.postTranslate(tx, ty); }

    void SetTag(char const* tag) override { mState.tag.Overwrite(tag); }
    char const* GetTag() override { return mState.tag.Get(); }
    IGLMsgQueue* GetMsgQueue() override { return mMsgQueue; }
    IMKBitmap* GetBitmap() override;

    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

protected:
    // A null bitmap makes no render side.
    CanvasFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap);

    IGLMsgQueue* const mMsgQueue; // not owned
    Impl* const mImpl;
    CanvasState mState;
};

} // namespace Moka
