// CanvasFrontEnd: what every canvas does on its caller's side, written once for plain and pen canvases and
// for both ways of reaching their render side:
//
//     MKCanvas    DrawingFrontEnd<ByTask>  CanvasFrontEnd<IMKCanvas, MKCanvasImpl, ByTask>
//     MKCanvasRT  DrawingFrontEnd<AtOnce>  CanvasFrontEnd<IMKCanvas, MKCanvasImpl, AtOnce>
//     MKPenCanvas, MKPenCanvasRT           PenFrontEnd and IMKPenCanvas likewise
//
// ByTask posts each request, AtOnce runs it before the call returns; see CanvasReach.h. The bodies are in
// CanvasFrontEndBodies.h, which only the sources of the four classes include. Their headers export what they
// instantiate, since the classes they instantiate it for stay hidden.
// Owner:  holds the render side, which dies on the render thread.
// Fails:  without a render side (memory ran out, or the target does not suit) the local state works on, and
//         every request is dropped.
#pragma once

#include "moka/base/RefCount.h"
#include "moka/graphics/canvas/CanvasState.h"
#include "moka/graphics/canvas/IMKCanvasBase.h"

namespace Moka::detail {

struct ByTask;
struct AtOnce;

template <class Interface, class Impl, class Reach>
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

    void SetTag(char const* tag) override { mState.SetTag(tag); }
    char const* GetTag() override { return mState.GetTag(); }
    IGLMsgQueue* GetMsgQueue() override { return mMsgQueue; }
    IMKBitmap* GetBitmap() override;

    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

protected:
    // A null bitmap makes no render side.
    CanvasFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap);

    Impl* GetImpl() const { return mImpl; }
    Matrix3<float> const& GetCurrentMatrix() const { return mState.matrix; }

    // Has the render side run a function with these arguments. False when it never will: what they own then
    // still belongs to the caller.
    template <class Function, class... Values>
    bool Request(Function function, Values&&... values);

private:
    IGLMsgQueue* const mMsgQueue; // not owned
    Impl* const mImpl;
    CanvasState mState;
};

} // namespace Moka::detail
