// IMKBitmapCanvasAttachable: how a canvas announces itself to its target bitmap. Attaching takes one
// reference on the bitmap and makes it drawable; detaching undoes both.
// Thread:  the plain operations from any thread, those ending in RT on the render thread, where `release`
//          drops one reference more.
#pragma once

namespace Moka {

class IMKBitmapCanvasAttachable {
public:
    virtual ~IMKBitmapCanvasAttachable() = default;

    virtual void AttachToCanvas() = 0;
    virtual void DetachFromCanvas() = 0;
    virtual void AttachToCanvasRT(bool release) = 0;
    virtual void DetachFromCanvasRT(bool release) = 0;
};

} // namespace Moka
