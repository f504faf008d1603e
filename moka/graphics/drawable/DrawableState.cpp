#include "moka/graphics/drawable/DrawableState.h"

#include "moka/graphics/drawable/MKGraphicsUtil.h"
#include "moka/renderer/RendererFactory.h"

#include <utility>

namespace Moka::detail {

DrawableState::DrawableState()
    : mBlend(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true))),
      mDepthStencil(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false))) {}

void DrawableState::ApplyBlend(MKPaint::XFermode mode) {
    if (mode != mMode) mBlend->SetDescriptor(MKGraphicsUtil::GetBlendingStateDescriptor(mode));
    mMode = mode;
    mBlend->Apply();
}

void DrawableState::Release() {
    mBlend.reset();
    mDepthStencil.reset();
}

void DrawableState::PostRelease(IGLMsgQueue* queue) {
    detail::PostRelease(queue, std::move(mBlend));
    detail::PostRelease(queue, std::move(mDepthStencil));
}

} // namespace Moka::detail
