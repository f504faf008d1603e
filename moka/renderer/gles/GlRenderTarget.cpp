#include "moka/renderer/gles/GlRenderTarget.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlDepthStencil.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlPixels.h"

#include <utility>

namespace Moka::detail {
namespace {

// Through the reading side, which is free when the target is the active one and otherwise leaves the drawing
// side alone.
void AttachToReadTarget(GLuint renderBuffer) {
    glFramebufferRenderbuffer(GL_READ_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER,
                              renderBuffer);
}

} // namespace

GlRenderTarget::GlRenderTarget(std::shared_ptr<GlContext> context, std::shared_ptr<GlFrameBuffer> frameBuffer,
                               int width, int height)
    : mContext(std::move(context)), mFrameBuffer(std::move(frameBuffer)), mWidth(width), mHeight(height) {
    ++mContext->statistics.renderTargets;
}

GlRenderTarget::~GlRenderTarget() { --mContext->statistics.renderTargets; }

GLuint GlRenderTarget::GetName() const { return mFrameBuffer->GetName(); }

GlTextureStorage const* GlRenderTarget::GetStorage() const { return mFrameBuffer->GetStorage(); }

void GlRenderTarget::Activate() {
    GlOperation const operation(*mContext);
    if (operation) mContext->targets.Activate(*this);
}

void GlRenderTarget::Deactivate(bool discardColor, bool discardDepthStencil) {
    GlOperation const operation(*mContext);
    if (!operation || mContext->targets.GetActive() != this) return;
    if (discardColor || discardDepthStencil) Discard(discardColor, discardDepthStencil);
    mContext->targets.Deactivate(*this);
}

// A frame buffer object and the default frame buffer have different names for their parts.
void GlRenderTarget::Discard(bool color, bool depthStencil) const {
    bool const isObject = GetName() != 0;
    GLenum parts[3] = {};
    GLsizei count = 0;
    if (color) parts[count++] = isObject ? GL_COLOR_ATTACHMENT0 : GL_COLOR;
    if (depthStencil) {
        parts[count++] = isObject ? GL_DEPTH_ATTACHMENT : GL_DEPTH;
        parts[count++] = isObject ? GL_STENCIL_ATTACHMENT : GL_STENCIL;
    }
    mContext->targets.BindDraw(GetName());
    glInvalidateFramebuffer(GL_DRAW_FRAMEBUFFER, count, parts);
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
    GlBlock block = GlBlock::Clip(x, y, width, height, mWidth, mHeight);
    if (block.width == 0) return;
    block.skippedRows += destination.skipRows;
    block.skippedPixels += destination.skipPixels;
    mContext->targets.BindRead(GetName());
    ReadBackPixels(mContext->state, block, destination.pixels, rowLength);
    mContext->statistics.bytesReadBack += block.GetBytes();
    mContext->debug.Check("reading pixels back");
}

void GlRenderTarget::Release() {
    // The context outlives the operation, whoever else holds it.
    std::shared_ptr<GlContext> const context = mContext;
    GlOperation const operation(*context);
    Detach();
    if (operation) context->targets.Deactivate(*this);
    delete this;
}

void GlRenderTarget::ClearColor(float r, float g, float b, float a) {
    GlOperation const operation(*mContext);
    if (!operation) return;
    mContext->targets.BindDraw(GetName());
    GlOverride<GlObstaclesAccess> const obstacles(mContext->state.obstacles, 0);
    GlOverride<GlColorMaskAccess> const mask(mContext->state.colorMask, kGlAllColors);
    // Unlike glClear it needs no clear colour, which foreign code may have set for itself.
    GLfloat const color[4] = {r, g, b, a};
    glClearBufferfv(GL_COLOR, 0, color);
    ++mContext->statistics.clears;
}

void GlRenderTarget::AttachDepthStencil(IDepthStencilBuffer* buffer) {
    GlOperation const operation(*mContext);
    if (!operation) return;
    auto* const wanted = static_cast<GlDepthStencil*>(buffer);
    if (wanted == mDepthStencil || (wanted && !MayAttach(*wanted))) return;
    Detach();
    if (!wanted) return;
    if (GlRenderTarget* const other = wanted->GetTarget()) other->Detach();
    mDepthStencil = wanted;
    wanted->SetTarget(this);
    mContext->targets.BindRead(GetName());
    AttachToReadTarget(wanted->GetName());
}

bool GlRenderTarget::MayAttach(GlDepthStencil const& buffer) const {
    bool const fits = buffer.GetWidth() == mWidth && buffer.GetHeight() == mHeight;
    bool const sameContext = buffer.GetContext() == mContext;
    if (GetStorage() && fits && sameContext) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "a depth-stencil buffer of %d x %d cannot be attached to a %s of %d x %d%s",
                        buffer.GetWidth(), buffer.GetHeight(),
                        GetStorage() ? "render target" : "frame buffer of the host's", mWidth, mHeight,
                        sameContext ? "" : " of another context");
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
    if (!mContext->IsAttached()) return;
    mContext->targets.BindRead(GetName());
    AttachToReadTarget(0);
}

void GlRenderTarget::ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) {
    GlOperation const operation(*mContext);
    if (!operation || !mDepthStencil || (!clearDepth && !clearStencil)) return;
    mContext->targets.BindDraw(GetName());
    GlOverride<GlObstaclesAccess> const obstacles(mContext->state.obstacles, 0);
    GlOverride<GlDepthStencilMaskAccess> const mask(mContext->state.depthStencilMask, kGlAllDepthStencil);
    if (clearDepth && clearStencil) {
        glClearBufferfi(GL_DEPTH_STENCIL, 0, depth, stencil);
    } else if (clearDepth) {
        glClearBufferfv(GL_DEPTH, 0, &depth);
    } else {
        glClearBufferiv(GL_STENCIL, 0, &stencil);
    }
    ++mContext->statistics.clears;
}

} // namespace Moka::detail
