// MKPenCanvas: a pen canvas for any thread, except its two clip operations, which belong on the render
// thread. MKGraphicsFactory::CreatePenCanvas creates it. MKPenCanvasRT is the flavour for the render thread.
// Owner:  as IMKPenCanvas.
// Fails:  on a bitmap that is no texture bitmap it logs an error; then matrices, levels and the tag work,
//         nothing is posted, the bitmap is null, and the canvas matrix is the model matrix alone. Requests
//         that the queue refuses are dropped.
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"

namespace Moka {

class MKPenCanvasImpl;

// Both flavours' addition to a canvas's front end.
template <bool kPosts>
class PenCanvas : public CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, kPosts> {
public:
    Matrix3<float> GetModelMatrix() override { return this->mState.matrix; }
    Matrix4<float> GetCanvasMatrix() override;
    // Never posted: they stand around drawing on the render thread.
    void EnableClipRT(int frameBuffer) override;
    void DisableClipRT() override;

protected:
    // A bitmap that is no texture bitmap leaves the canvas without a render side; the error names the class.
    PenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap, char const* className);
};

// Exported here, because MKPenCanvasImpl, which they are instantiated for, stays hidden.
extern template class MOKA_API CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, true>;
extern template class MOKA_API PenCanvas<true>;

class MOKA_API MKPenCanvas final : public PenCanvas<true> {
public:
    // Neither is null.
    MKPenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvas() override;
};

} // namespace Moka
