/// IDepthStencilBuffer: one combined depth and stencil buffer, to be attached to a render target of its size.
/// Owner:  the creator, until Release(). Release it after detaching; released while attached, it is
///         detached first.
/// Thread: render thread.
#pragma once

namespace Moka {

class IDepthStencilBuffer {
public:
    /// Deletes the object.
    virtual void Release() = 0;

protected:
    ~IDepthStencilBuffer() = default;
};

} // namespace Moka
