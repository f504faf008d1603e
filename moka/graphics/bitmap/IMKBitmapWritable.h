/// IMKBitmapWritable: a bitmap, or a strip of one, as a render target.
/// Thread: the functions ending in RT run on the render thread at once; with `release` they drop one
///         reference at the end, which tasks need. ActivateFrameBuffer and DeactivateFrameBuffer are posted.
#pragma once

#include "moka/graphics/math/Matrix4.h"

namespace Moka {

/// Contents that may be discarded when a frame buffer is deactivated: a set of two bits.
enum DiscardFramebufferType : int {
    DiscardFramebufferNone = 0,
    DiscardFramebufferColor = 1,
    DiscardFramebufferDepthStencil = 2,
    DiscardFramebufferBoth = 3,
};

class IMKBitmapWritable {
public:
    virtual ~IMKBitmapWritable() = default;

    /// The orthographic matrix from the bitmap's pixels to clip space.
    virtual Matrix4<float> GetProjectionMatrix() = 0;

    /// Make the bitmap the draw target, or end drawing into it.
    virtual void ActivateFrameBuffer() = 0;
    virtual void DeactivateFrameBuffer(DiscardFramebufferType discard) = 0;

    /// The same functions, executed at once.
    virtual void ActivateFrameBufferRT(bool release) = 0;
    virtual void DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) = 0;

    /// Clears the colour within the scissor. Components 0 ... 1, premultiplied.
    virtual void ClearColorRT(float r, float g, float b, float a) = 0;
    /// Clears the depth, the stencil, or both, within the scissor.
    virtual void ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) = 0;
};

} // namespace Moka
