/// IDepthStencilState: a depth-stencil state that can be applied.
/// Owner:  the creator, until Release(), which leaves an applied state set.
/// Thread: render thread.
#pragma once

#include "moka/renderer/DepthStencilStateDescriptor.h"

namespace Moka {

class IDepthStencilState {
public:
    /// Takes effect with the next Apply().
    virtual void SetDescriptor(DepthStencilStateDescriptor const& descriptor) = 0;

    /// Sets the depth-stencil state of later draws. While a stencil clip is on
    /// (RendererFactory::SetStencilClip), applying a state without a stencil test does nothing.
    virtual void Apply() = 0;

    /// Deletes the object.
    virtual void Release() = 0;

protected:
    ~IDepthStencilState() = default;
};

} // namespace Moka
