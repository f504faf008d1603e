/// IRenderTarget: a target of draws: a texture, or a frame buffer of the host.
/// Owner:  the creator, until Release(). A host's frame buffer is never deleted.
/// Thread: render thread.
/// Units:  pixels from the target's own corner. Off-screen targets keep texture row 0 at GL row 0; a host's
///         frame buffer is bottom-up.
/// The vtable order is ABI.
#pragma once

#include "moka/renderer/PixelBuffer.h"

namespace Moka {

class IDepthStencilBuffer;

class IRenderTarget {
public:
    /// Makes this the draw target and sets the viewport to its whole size. Does not change scissor, stencil,
    /// blend and masks. Activations do not nest: activating the active target does nothing.
    virtual void Activate() = 0;

    /// Ends drawing, and binds the frame buffer and viewport that were set before the first activation (in
    /// deferred mode only at RendererFactory::Flush). Does nothing if the target is not active. The flags let
    /// the driver discard the colour, and the depth and stencil contents.
    virtual void Deactivate(bool discardColor, bool discardDepthStencil) = 0;

    /// Reads a block back. Pixels outside the target are not written. Logs an error and reads nothing if rows
    /// would overlap in the destination.
    virtual void ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) = 0;

    /// Deletes the object.
    virtual void Release() = 0;

    /// Clears within the scissor and ignores the colour mask; the draw target does not change.
    virtual void ClearColor(float r, float g, float b, float a) = 0;

    /// Attaches a depth-stencil buffer, in place of the attached one. A buffer that is attached to another
    /// target is detached there. The draw target does not change. A buffer of another size, or any buffer for
    /// a frame buffer of the host, logs an error and is not attached.
    virtual void AttachDepthStencil(IDepthStencilBuffer* buffer) = 0;
    /// Detaches the buffer, if there is one. The draw target does not change.
    virtual void DetachDepthStencil() = 0;

    /// Clears depth, stencil, or both, within the scissor. Ignores the write masks. Without a buffer it does
    /// nothing.
    virtual void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) = 0;

protected:
    ~IRenderTarget() = default;
};

} // namespace Moka
