/// IMKBitmapBufferUpdatable: uploads pixels, and asks for a depth and stencil buffer.
/// Thread: the plain operations post; those ending in RT run on the render thread.
/// Units:  pixels of RGBA8, premultiplied; stride in bytes, 0 or less for tightly packed rows.
#pragma once

#include "moka/base/Rect.h"

namespace Moka {

class IMKBitmapBufferUpdatable {
public:
    virtual ~IMKBitmapBufferUpdatable() = default;

    /// Depth and stencil share one buffer and one count of requests; it exists while the count is above zero.
    virtual void AttachStencilBufferRT(bool release) = 0;
    virtual void DetachStencilBufferRT(bool release) = 0;
    virtual void AttachDepthBuffer() = 0;
    virtual void DetachDepthBuffer() = 0;

    /// pixels stays valid until the render thread has run the upload. It addresses the first pixel of what is
    /// replaced: everything, or r. Each strip of a tall bitmap gets the same pointer and the same r: the whole
    /// bitmap's rows say which strips r touches, but in each of them r counts from that strip's own first row.
    virtual void UpdateBitmap(void const* pixels, int stride) = 0;
    virtual void UpdateBitmap(Rect const& r, void const* pixels, int stride) = 0;
};

} // namespace Moka
