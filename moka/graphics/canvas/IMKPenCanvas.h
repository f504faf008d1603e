/// IMKPenCanvas: a canvas without drawing operations, for external GL code that draws into a texture bitmap.
/// It provides the matrix for that code and applies the clip around its draws.
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
    /// The matrix from coordinates before the current matrix to clip space.
    virtual Matrix4<float> GetCanvasMatrix() = 0;

    /// Submits all earlier requests, enables colour writes and sets the clip. External code may call GL from
    /// here until DisableClipRT. The bitmap counts as one frame buffer; the index is ignored.
    virtual void EnableClipRT(int frameBuffer) = 0;
    /// Removes the clip. The renderer assumes that external GL has changed all state.
    virtual void DisableClipRT() = 0;
};

} // namespace Moka
