#include "moka/graphics/drawable/DrawState.h"

#include "moka/graphics/drawable/MKGraphicsUtil.h"
#include "moka/renderer/RendererFactory.h"

#include <utility>

namespace Moka::detail {

DrawState::DrawState()
    : mBlend(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true))),
      mDepthStencil(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false))) {}

void DrawState::Apply(MKPaint::XFermode mode) {
    ApplyBlend(mode);
    mDepthStencil->Apply();
}

void DrawState::ApplyBlend(MKPaint::XFermode mode) {
    mBlend->SetDescriptor(MKGraphicsUtil::GetBlendingStateDescriptor(mode));
    mBlend->Apply();
}

void DrawState::Release() {
    mBlend.reset();
    mDepthStencil.reset();
}

void DrawState::PostRelease(IGLMsgQueue* queue) {
    detail::PostRelease(queue, std::move(mBlend));
    detail::PostRelease(queue, std::move(mDepthStencil));
}

} // namespace Moka::detail
