/// IDepthStencilBuffer: one combined depth and stencil buffer, to be attached to a render target of its size.
/// Owner:  the creator, until Release(). Releasing an attached buffer detaches it first.
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
