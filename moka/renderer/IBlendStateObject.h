/// IBlendStateObject: a blend state that can be applied.
/// Owner:  the creator, until Release(), which leaves an applied state set.
/// Thread: render thread.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"

namespace Moka {

class IBlendStateObject {
public:
    /// Takes effect with the next Apply().
    virtual void SetDescriptor(BlendStateDescriptor const& descriptor) = 0;
    /// Sets the blend state of later draws.
    virtual void Apply() = 0;
    /// Deletes the object.
    virtual void Release() = 0;

protected:
    ~IBlendStateObject() = default;
};

} // namespace Moka
