/// IMKBitmapCanvasAttachable: canvases attach themselves to their target bitmap with it. Attaching takes one
/// reference on the bitmap and creates its frame buffers; detaching undoes both.
/// Thread:  the plain operations from any thread, those ending in RT on the render thread, where `release`
///          drops one more reference.
#pragma once

namespace Moka {

class IMKBitmapCanvasAttachable {
public:
    virtual ~IMKBitmapCanvasAttachable() = default;

    /// Called by canvases.
    virtual void AttachToCanvas() = 0;
    virtual void DetachFromCanvas() = 0;
    virtual void AttachToCanvasRT(bool release) = 0;
    virtual void DetachFromCanvasRT(bool release) = 0;

    /// True if the strip has a frame buffer; -1 asks for the bitmap as one frame buffer. If the frame buffer
    /// does not exist yet or could not be created, a draw would go to the frame buffer that the host has
    /// bound.
    virtual bool HasFrameBufferRT(int /*strip*/) { return true; }
};

} // namespace Moka
