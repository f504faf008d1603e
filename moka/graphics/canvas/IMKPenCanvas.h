/// IMKPenCanvas: a canvas without drawing operations, for external GL code that draws onto a texture bitmap
/// itself: it gives that code the matrix to draw with and the clip around its drawing.
///
///     canvas->EnableClipRT(0);                             on the render thread
///     bitmap->GetBitmapWritable()->ActivateFrameBufferRT(false);
///     ... GL calls, positions mapped by canvas->GetCanvasMatrix() ...
///     canvas->DisableClipRT();
///     bitmap->GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
///
/// Owner:  as IMKCanvasBase.
/// Thread: as IMKCanvasBase; the clip operations on the render thread.
/// The vtable order is ABI.
#pragma once

#include "moka/graphics/canvas/IMKCanvasBase.h"
#include "moka/graphics/math/Matrix4.h"

namespace Moka {

class IMKPenCanvas : public IMKCanvasBase {
public:
    /// The current matrix.
    virtual Matrix3<float> GetModelMatrix() = 0;
    /// From the current matrix's pixels to clip space.
    virtual Matrix4<float> GetCanvasMatrix() = 0;

    /// Between the two, external code may call GL: all earlier requests have been drawn, colour writes are
    /// on, and the clip is set. The bitmap is one frame buffer; the index is ignored.
    virtual void EnableClipRT(int frameBuffer) = 0;
    virtual void DisableClipRT() = 0;
};

} // namespace Moka
