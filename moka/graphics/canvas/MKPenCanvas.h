// MKPenCanvas: a pen canvas for any thread. Its two clip operations must be called on the render thread.
// MKGraphicsFactory::CreatePenCanvas creates it. MKPenCanvasRT is the flavour for the render thread.
// Owner:  as IMKPenCanvas.
// Fails:  if the bitmap is not a texture bitmap, logs an error. Matrices, levels and the tag then still work,
//         nothing is posted, GetBitmap() is null, and the canvas matrix is the model matrix. Requests that
//         the queue refuses are dropped.
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"

namespace Moka {

class MKPenCanvasImpl;

// The operations that both flavours add to CanvasFrontEnd.
template <bool kPosts>
class PenCanvas : public CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, kPosts> {
public:
    Matrix3<float> GetModelMatrix() override { return this->mState.matrix; }
    Matrix4<float> GetCanvasMatrix() override;
    // These are never posted: external code calls them around its draws on the render thread.
    void EnableClipRT(int frameBuffer) override;
    void DisableClipRT() override;

protected:
    // If the bitmap is not a texture bitmap, there is no render side. The error message contains className.
    PenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap, char const* className);
};

// Exported here, because their template argument MKPenCanvasImpl is not exported.
extern template class MOKA_API CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, true>;
extern template class MOKA_API PenCanvas<true>;

class MOKA_API MKPenCanvas final : public PenCanvas<true> {
public:
    // Neither argument may be null.
    MKPenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvas() override;
};

} // namespace Moka
