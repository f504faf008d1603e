// PenFrontEnd: the caller's side of what IMKPenCanvas adds; see CanvasFrontEnd.
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"

namespace Moka {

class MKPenCanvasImpl;

namespace detail {

template <class Reach>
class PenFrontEnd : public CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, Reach> {
public:
    Matrix3<float> GetModelMatrix() override { return this->GetCurrentMatrix(); }
    Matrix4<float> GetCanvasMatrix() override;
    // Never posted: they stand around drawing on the render thread.
    void EnableClipRT(int frameBuffer) override;
    void DisableClipRT() override;

protected:
    // A bitmap that is no texture bitmap leaves the canvas without a render side, with an error line that
    // gives the class's name.
    PenFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap, char const* className);
};

} // namespace detail
} // namespace Moka
