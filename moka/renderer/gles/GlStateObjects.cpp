#include "moka/renderer/gles/GlStateObjects.h"

#include "moka/renderer/gles/GlContext.h"

#include <utility>

namespace Moka::detail {
namespace {

void PutInForce(GlContext& context, BlendStateDescriptor const& descriptor) {
    context.current.SetBlend(descriptor);
    if (context.IsThrough()) context.state.SetBlend(descriptor);
}

// What a clip holds in place stays.
void PutInForce(GlContext& context, DepthStencilStateDescriptor const& descriptor) {
    context.current.SetDepthStencil(descriptor);
    if (context.IsThrough()) context.state.SetDepthStencil(context.current.GetDepthStencil());
}

} // namespace

template <class Interface, class Descriptor>
GlStateObject<Interface, Descriptor>::GlStateObject(std::shared_ptr<GlContext> context,
                                                    Descriptor const& descriptor)
    : mContext(std::move(context)), mDescriptor(descriptor) {
    ++mContext->statistics.stateObjects;
}

template <class Interface, class Descriptor>
GlStateObject<Interface, Descriptor>::~GlStateObject() {
    --mContext->statistics.stateObjects;
}

template <class Interface, class Descriptor>
void GlStateObject<Interface, Descriptor>::Apply() {
    GlOperation const operation(*mContext);
    if (operation) PutInForce(*mContext, mDescriptor);
}

template class GlStateObject<IBlendStateObject, BlendStateDescriptor>;
template class GlStateObject<IDepthStencilState, DepthStencilStateDescriptor>;

} // namespace Moka::detail
