/// IMKBitmapWritable: a bitmap, or a strip of one, as a render target.
/// Thread: the two plain operations post; those ending in RT run on the render thread, where `release` says
///         whether to drop one reference at the end (true when reached through a task).
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

    /// Orthographic, from the bitmap's pixel space to clip space.
    virtual Matrix4<float> GetProjectionMatrix() = 0;

    /// Makes the bitmap the draw target, or ends drawing onto it.
    virtual void ActivateFrameBuffer() = 0;
    virtual void DeactivateFrameBuffer(DiscardFramebufferType discard) = 0;

    /// The same at once.
    virtual void ActivateFrameBufferRT(bool release) = 0;
    virtual void DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) = 0;

    /// Components 0 ... 1, premultiplied.
    virtual void ClearColorRT(float r, float g, float b, float a) = 0;
    virtual void ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) = 0;
};

} // namespace Moka
