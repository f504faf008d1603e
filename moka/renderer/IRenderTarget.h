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
    /// Makes this the draw target and sets the viewport to all of it. Not a stack: activating the active
    /// target does nothing. Leaves scissor, stencil, blend and masks alone.
    virtual void Activate() = 0;

    /// Ends drawing; external GL then finds the frame buffer that was bound before the first activation, and
    /// its viewport (while deferred, only after RendererFactory::Flush). Does nothing for a target that is
    /// not the active one. The flags let the driver drop the colour, and the depth and stencil contents.
    virtual void Deactivate(bool discardColor, bool discardDepthStencil) = 0;

    /// Reads a block. Pixels outside the target are skipped; the destination keeps its bytes there. Rows that
    /// would overlap in the destination are refused with a log line.
    virtual void ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) = 0;

    /// Deletes the object.
    virtual void Release() = 0;

    /// Clears within the scissor and ignores the colour mask; the draw target does not change.
    virtual void ClearColor(float r, float g, float b, float a) = 0;

    /// Attaching another buffer replaces the attached one; a buffer attached elsewhere moves. Both leave the
    /// draw target what it was. A buffer of another size, or any on a host's frame buffer, is refused with a
    /// log line.
    virtual void AttachDepthStencil(IDepthStencilBuffer* buffer) = 0;
    virtual void DetachDepthStencil() = 0;

    /// Clears within the scissor and ignores the write masks; without a buffer it does nothing.
    virtual void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) = 0;

protected:
    ~IRenderTarget() = default;
};

} // namespace Moka
