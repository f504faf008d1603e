// MKPenCanvasImpl: the render side of a pen canvas. It applies the clip around external draws and has no
// drawables.
// Thread: render thread. The constructor without onRenderThread, and GetCanvasMatrix, may run on any thread.
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

    // The matrix from the target's pixels to clip space.
    Matrix4<float> GetCanvasMatrix() const;

    // Without a frame buffer, logs an error and sets no clip.
    // Uses the bitmap as one frame buffer and ignores the index. // Compat: whole-frame-buffer
    void EnableClipRT(int frameBuffer);
    void DisableClipRT();

private:
    void SwitchColorWritesOn();

    detail::RendererPtr<IBlendStateObject> mColorWrites; // created by the first EnableClipRT
};

} // namespace Moka
