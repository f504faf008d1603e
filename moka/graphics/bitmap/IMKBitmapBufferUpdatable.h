/// IMKBitmapBufferUpdatable: uploads pixels, and attaches a depth-stencil buffer.
/// Thread: the plain operations post; those ending in RT run on the render thread.
/// Units:  pixels of RGBA8, premultiplied; stride in bytes, 0 or less for tightly packed rows.
#pragma once

#include "moka/base/Rect.h"

namespace Moka {

class IMKBitmapBufferUpdatable {
public:
    virtual ~IMKBitmapBufferUpdatable() = default;

    /// Depth and stencil share one buffer. It exists while there are more attach than detach requests of
    /// either kind. The two functions of the stencil run at once; those of the depth are posted. `release`
    /// drops one reference.
    virtual void AttachStencilBufferRT(bool release) = 0;
    virtual void DetachStencilBufferRT(bool release) = 0;
    virtual void AttachDepthBuffer() = 0;
    virtual void DetachDepthBuffer() = 0;

    /// Replaces all pixels, or those of r. pixels points to the first pixel of the replaced area, and must
    /// stay valid until the render thread has uploaded it. Each strip of a tall bitmap that r touches gets
    /// the same pointer and the same r, but counts r from its own first row.
    virtual void UpdateBitmap(void const* pixels, int stride) = 0;
    virtual void UpdateBitmap(Rect const& r, void const* pixels, int stride) = 0;
};

} // namespace Moka
