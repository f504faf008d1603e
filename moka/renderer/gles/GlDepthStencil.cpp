#include "moka/renderer/gles/GlDepthStencil.h"

#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlRenderTarget.h"

#include <utility>

namespace Moka::detail {

GlDepthStencil* GlDepthStencil::Create(std::shared_ptr<GlContext> context, int width, int height) {
    GLuint const name = context->depthStencilPool.Take(width, height);
    return name != 0 ? new GlDepthStencil(std::move(context), name, width, height) : nullptr;
}

GlDepthStencil::GlDepthStencil(std::shared_ptr<GlContext> context, GLuint name, int width, int height)
    : mContext(std::move(context)), mName(name), mWidth(width), mHeight(height) {
    ++mContext->statistics.depthStencilBuffers;
}

GlDepthStencil::~GlDepthStencil() { --mContext->statistics.depthStencilBuffers; }

void GlDepthStencil::Release() {
    // The context outlives the operation, whoever else holds it.
    std::shared_ptr<GlContext> const context = mContext;
    GlOperation const operation(*context);
    if (mTarget) mTarget->Detach();
    if (operation) {
        if (context->depthStencilPool.IsFull()) context->Play();
        context->depthStencilPool.Give(mName, mWidth, mHeight);
    }
    delete this;
}

} // namespace Moka::detail
