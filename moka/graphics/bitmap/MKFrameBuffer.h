// MKFrameBuffer: the off-screen render target that draws into one strip's texture.
// Owner:  its strip. The reference count counts the canvases attached to the strip.
// Thread: render thread only. Other threads post its deletion.
// Fails:  if the renderer could not create the target, every operation does nothing.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/RefCount.h"
#include "moka/renderer/IRenderTarget.h"

namespace Moka {

class ITextureObject;
class MKDepthStencilBuffer;

class MOKA_API MKFrameBuffer : public RefCount {
public:
    // Has the size of the texture. width and height are ignored.
    MKFrameBuffer(int width, int height, ITextureObject* texture);
    ~MKFrameBuffer() override;

    void ActivateFrameBufferRT() {
        if (mRenderTarget) mRenderTarget->Activate();
    }
    void DeactivateFrameBufferRT(bool discardColor, bool discardDepthStencil) {
        if (mRenderTarget) mRenderTarget->Deactivate(discardColor, discardDepthStencil);
    }
    void AttachDepthStencilBufferRT(MKDepthStencilBuffer* buffer);
    void DetachDepthStencilBufferRT();
    void ClearColorRT(float r, float g, float b, float a);
    void ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil);

    IRenderTarget* GetOffscreenRenderTarget() const { return mRenderTarget; }

private:
    IRenderTarget* mRenderTarget;
};

} // namespace Moka
