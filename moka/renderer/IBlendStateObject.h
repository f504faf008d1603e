/// IBlendStateObject: a blend state that can be put in force.
/// Owner:  whoever created it, until Release(), which keeps an applied state in force.
/// Thread: render thread.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"

namespace Moka {

class IBlendStateObject {
public:
    /// Takes effect with the next Apply().
    virtual void SetDescriptor(BlendStateDescriptor const& descriptor) = 0;
    virtual void Apply() = 0;
    virtual void Release() = 0;

protected:
    ~IBlendStateObject() = default;
};

} // namespace Moka
