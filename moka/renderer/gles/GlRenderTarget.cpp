#include "moka/renderer/gles/GlRenderTarget.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlDepthStencil.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlPixels.h"

#include <utility>

namespace Moka::detail {

GlRenderTarget::GlRenderTarget(std::shared_ptr<GlContext> context, std::shared_ptr<GlFrameBuffer> frameBuffer,
                               int width, int height)
    : mContext(std::move(context)), mUse{std::move(frameBuffer), width, height, 0} {
    ++mContext->statistics.renderTargets;
}

GlRenderTarget::~GlRenderTarget() { --mContext->statistics.renderTargets; }

GLuint GlRenderTarget::GetName() const { return mUse.frameBuffer->GetName(); }

GlTextureStorage* GlRenderTarget::GetStorage() const { return mUse.frameBuffer->GetStorage(); }

void GlRenderTarget::Activate() {
    GlOperation const operation(*mContext);
    if (operation) mContext->Activate(*this);
}

void GlRenderTarget::Deactivate(bool discardColor, bool discardDepthStencil) {
    GlOperation const operation(*mContext);
    if (!operation || mContext->targets.GetActive() != this) return;
    if (discardColor || discardDepthStencil) {
        mContext->list.Add(GlDiscard{GetUse(), discardColor, discardDepthStencil});
    }
    mContext->Deactivate(*this);
}

void GlRenderTarget::ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) {
    GlOperation const operation(*mContext);
    if (!operation || !destination.pixels) return;
    int const rowLength = destination.rowLength > 0 ? destination.rowLength : width;
    if (rowLength < width || destination.skipRows < 0 || destination.skipPixels < 0) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "reading %d pixels a row into rows of %d, %d rows down and %d pixels in, is "
                            "refused; rows must not overlap and nothing can be skipped backwards",
                            width, rowLength, destination.skipRows, destination.skipPixels);
        return;
    }
    GlBlock block = GlBlock::Clip(x, y, width, height, GetWidth(), GetHeight());
    if (block.width == 0) return;
    block.skippedRows += destination.skipRows;
    block.skippedPixels += destination.skipPixels;
    mContext->Play();
    GLuint const name = GetName();
    if (mContext->workarounds.Needs(GlWorkaround::BindForDrawingToRead)) {
        mContext->targets.Bind({name, name});
    } else {
        mContext->targets.BindRead(name);
    }
    ReadBackPixels(mContext->state, block, destination.pixels, rowLength);
    mContext->statistics.bytesReadBack += block.GetBytes();
    mContext->debug.Check("reading pixels back");
}

void GlRenderTarget::Release() {
    // The context outlives the operation, whoever else holds it.
    std::shared_ptr<GlContext> const context = mContext;
    GlOperation const operation(*context);
    Detach();
    if (operation) {
        context->Deactivate(*this);
        if (context->list.IsEmpty()) context->current.LetGo();
    }
    delete this;
}

void GlRenderTarget::ClearColor(float r, float g, float b, float a) {
    GlOperation const operation(*mContext);
    if (!operation) return;
    std::array<GLfloat, 4> const color{r, g, b, a};
    if (mContext->current.GetDepthStencil().IsStencil() && HasStencil()) {
        mContext->fill.Add(mContext, GetUse(), color);
    } else {
        mContext->list.Add(GlColorClear{GetUse(), mContext->current.GetScissor(), color});
    }
    mContext->AfterAdding();
}

// A host's frame buffer may or may not have one; drawing is right either way.
bool GlRenderTarget::HasStencil() const { return mDepthStencil || !GetStorage(); }

void GlRenderTarget::AttachDepthStencil(IDepthStencilBuffer* buffer) {
    GlOperation const operation(*mContext);
    if (!operation) return;
    auto* const wanted = static_cast<GlDepthStencil*>(buffer);
    if (wanted == mDepthStencil || (wanted && !MayAttach(*wanted))) return;
    Detach();
    if (!wanted) return;
    if (GlRenderTarget* const other = wanted->GetTarget()) other->Detach();
    mDepthStencil = wanted;
    mUse.depthStencil = wanted->GetName();
    wanted->SetTarget(this);
}

bool GlRenderTarget::MayAttach(GlDepthStencil const& buffer) const {
    bool const fits = buffer.GetWidth() == GetWidth() && buffer.GetHeight() == GetHeight();
    bool const sameContext = buffer.GetContext() == mContext;
    if (GetStorage() && fits && sameContext) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "a depth-stencil buffer of %d x %d cannot be attached to a %s of %d x %d%s",
                        buffer.GetWidth(), buffer.GetHeight(),
                        GetStorage() ? "render target" : "frame buffer of the host's", GetWidth(),
                        GetHeight(), sameContext ? "" : " of another context");
    return false;
}

void GlRenderTarget::DetachDepthStencil() {
    GlOperation const operation(*mContext);
    if (operation) Detach();
}

void GlRenderTarget::Detach() {
    if (!mDepthStencil) return;
    mDepthStencil->SetTarget(nullptr);
    mDepthStencil = nullptr;
    mUse.depthStencil = 0;
}

void GlRenderTarget::ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) {
    GlOperation const operation(*mContext);
    if (!operation || !mDepthStencil || (!clearDepth && !clearStencil)) return;
    mContext->list.Add(GlDepthStencilClear{GetUse(), mContext->current.GetScissor(), clearDepth, clearStencil,
                                           depth, stencil});
    mContext->AfterAdding();
}

} // namespace Moka::detail
