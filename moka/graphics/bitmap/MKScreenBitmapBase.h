// MKScreenBitmapBase: the render side of a screen bitmap, shared by its two flavours. A screen bitmap draws
// into a frame buffer of the host. It cannot be sampled.
// Owner:  the bitmap owns its render target; the host owns the frame buffer. Attaching a canvas only takes a
//         reference.
// Thread: the getters on any thread. Functions ending in RT and the protected ones on the render thread.
// Fails:  without a render target nothing is drawn or read. An unknown type logs an error.
// Units:  GetBitmapData returns the frame buffer's rows from bottom to top, relative to the frame buffer's
//         corner, not to the bitmap's position. GetPixel counts rows from the top but is one row off: row y
//         reads row y - 1, and row 0 reads 0.
// Limits: the library attaches no stencil buffer to it. So clips that need the stencil (rotated ones, and all
//         operations except Intersect and Replace) do not work on a screen bitmap.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapCanvasAttachable.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/bitmap/MKBitmap.h"

namespace Moka {

class IRenderTarget;

class MOKA_API MKScreenBitmapBase : public MKBitmap,
                                    public IMKBitmapWritable,
                                    public IMKBitmapCanvasAttachable {
public:
    // Returns a caller-side bitmap with the same rectangle for the other of the two frame buffers, because
    // the type is passed where the factory expects a switch. // Compat: screen-clone
    IMKBitmap* Clone() override;

    IMKBitmapWritable* GetBitmapWritable() override { return this; }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override { return this; }

    // Maps row 0 to 1, the top of a bottom-up frame buffer. Ignores the bitmap's position.
    Matrix4<float> GetProjectionMatrix() override;

    void ActivateFrameBufferRT(bool release) override;
    void DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) override;
    void ClearColorRT(float r, float g, float b, float a) override;
    void ClearDepthStencilRT(bool, float, bool, int) override {}

    void AttachToCanvas() override { Ref(); }
    void DetachFromCanvas() override { Unref(); }
    void AttachToCanvasRT(bool release) override;
    void DetachFromCanvasRT(bool release) override;
    bool HasFrameBufferRT(int) override { return mRenderTarget != nullptr; }

protected:
    MKScreenBitmapBase(IGLMsgQueue* queue, int x, int y, int width, int height, FramebufferType type);

    // The error message contains caller.
    void CreateRenderTarget(int width, int height, FramebufferType type, char const* caller);

    unsigned int ReadPixel(Point const& p);
    void ReadBlock(Rect const& r, void* destination);

    IRenderTarget* GetRenderTarget() const { return mRenderTarget; }
    FramebufferType GetFramebufferType() const { return mFramebufferType; }

private:
    IRenderTarget* mRenderTarget = nullptr;
    FramebufferType const mFramebufferType;
};

} // namespace Moka
