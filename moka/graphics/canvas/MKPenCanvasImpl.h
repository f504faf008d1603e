// MKPenCanvasImpl: the render side of a pen canvas: the clip around external drawing, without drawables.
// Thread: render thread; the constructor, without onRenderThread, and GetCanvasMatrix on any.
#pragma once

#include "moka/graphics/canvas/MKCanvasImplBase.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/renderer/IBlendStateObject.h"

namespace Moka {

class MKPenCanvasImpl final : public MKCanvasImplBase {
public:
    MKPenCanvasImpl(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread);
    ~MKPenCanvasImpl() override;

    // From the target's pixels to clip space.
    Matrix4<float> GetCanvasMatrix() const;

    // Without a frame buffer no clip is made, and an error line says so.
    // Uses the bitmap as one frame buffer, whatever the index. // Compat: whole-frame-buffer
    void EnableClipRT(int frameBuffer);
    void DisableClipRT();

private:
    void SwitchColorWritesOn();

    detail::RendererPtr<IBlendStateObject> mColorWrites; // made by the first enable
};

} // namespace Moka
