// CanvasFrontEnd: the caller's side of every canvas: clearing, the matrix, clips, the save stack and the tag.
// DrawingCanvas (MKCanvas.h) and PenCanvas (MKPenCanvas.h) add their operations. If kPosts is true, each
// request is posted to the render thread; otherwise it calls the render side at once.
// Owner:  owns the render side, which is deleted on the render thread.
// Thread: one thread at a time; if kPosts is false, the render thread.
// Fails:  if there is no render side (memory ran out, or the target is unsuitable), the local state still
//         works, and requests are dropped. Requests that the queue refuses are dropped as well; references
//         taken for them are kept.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/RefCount.h"
#include "moka/base/Tag.h"
#include "moka/graphics/canvas/IMKCanvasBase.h"

#include <vector>

namespace Moka {

// The matrix, the clip count, the saved levels of both, and the tag.
class MOKA_API CanvasState {
public:
    Matrix3<float> matrix;
    int clipCount = 0; // the number of requested clips, including those that the queue refused
    Tag tag;

    // Returns the index of the new level. The value that the flag leaves out is saved as it is in the level
    // below, or as the identity or 0 if there is none, so that restoring resets it. If memory runs out there
    // is no new level, and restoring to the index does nothing. // Compat: save-one-part
    int Save(IMKCanvasBase::SaveFlag flag);
    // Restores a level and removes it and those above. A negative level means the last one. Returns false and
    // changes nothing if the level does not exist.
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
    // With a null bitmap there is no render side.
    CanvasFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap);

    IGLMsgQueue* const mMsgQueue; // not owned
    Impl* const mImpl;
    CanvasState mState;
};

} // namespace Moka
