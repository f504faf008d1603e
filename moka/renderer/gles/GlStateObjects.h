// GlStateObjects: blend and depth-stencil states as they are handed out: a descriptor that is put in force.
#pragma once

#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"

#include <memory>

namespace Moka::detail {

class GlContext;

// Interface: IBlendStateObject or IDepthStencilState.
template <class Interface, class Descriptor>
class GlStateObject final : public Interface {
public:
    GlStateObject(std::shared_ptr<GlContext> context, Descriptor const& descriptor);
    GlStateObject(GlStateObject const&) = delete;
    ~GlStateObject();
    GlStateObject& operator=(GlStateObject const&) = delete;

    void SetDescriptor(Descriptor const& descriptor) override { mDescriptor = descriptor; }
    void Apply() override;
    void Release() override { delete this; }

private:
    std::shared_ptr<GlContext> const mContext;
    Descriptor mDescriptor;
};

using GlBlendState = GlStateObject<IBlendStateObject, BlendStateDescriptor>;
using GlDepthStencilState = GlStateObject<IDepthStencilState, DepthStencilStateDescriptor>;
extern template class GlStateObject<IBlendStateObject, BlendStateDescriptor>;
extern template class GlStateObject<IDepthStencilState, DepthStencilStateDescriptor>;

} // namespace Moka::detail
