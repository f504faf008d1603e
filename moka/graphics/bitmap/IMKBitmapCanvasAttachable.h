/// IMKBitmapCanvasAttachable: how a canvas announces itself to its target bitmap. Attaching takes one
/// reference on the bitmap and makes it drawable; detaching undoes both.
/// Thread:  the plain operations from any thread, those ending in RT on the render thread, where `release`
///          drops one reference more.
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

    /// Whether drawing into a strip, or with -1 into the bitmap as one frame buffer, reaches the bitmap. It
    /// does not where the frame buffer could not be created, or not yet; a draw would then go to the frame
    /// buffer that the host has bound.
    virtual bool HasFrameBufferRT(int /*strip*/) { return true; }
};

} // namespace Moka
