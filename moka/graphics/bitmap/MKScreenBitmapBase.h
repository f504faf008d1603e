// MKScreenBitmapBase: the render side of a screen bitmap, shared by its two flavours: a bitmap that stands
// for a frame buffer of the host's. It can be drawn into, not sampled.
// Owner:  the bitmap owns its render target; the frame buffer stays the host's. Attaching a canvas only
//         counts a reference.
// Thread: the getters anywhere; everything ending in RT, and the protected bodies, on the render thread.
// Fails:  without a render target (an unknown type gives one error line) nothing is drawn or read.
// Units:  GetBitmapData gives the frame buffer's own rows, the bottom one first, counted from its corner, not
//         from where the bitmap lies. GetPixel counts from the top but is one row off: row y reads row y - 1,
//         and row 0 reads 0.
// Limits: there is no stencil of ours: clips that need one (turned ones, and all operations but Intersect and
//         Replace) do not work on a screen bitmap.
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
    // The same rectangle, always caller-side, over the other of the two frame buffers: the type is passed
    // where the factory takes a switch. // Compat: screen-clone
    IMKBitmap* Clone() override;

    IMKBitmapWritable* GetBitmapWritable() override { return this; }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override { return this; }

    // Row 0 maps to 1: the top of a bottom-up frame buffer. Where the bitmap lies does not enter.
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

    // caller names whoever asks, in the error line.
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
