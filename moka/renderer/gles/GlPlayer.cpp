#include "moka/renderer/gles/GlPlayer.h"

#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlTables.h"
#include "moka/renderer/gles/GlTextureStorage.h"
#include "moka/renderer/gles/GlUniforms.h"

namespace Moka::detail {

void GlPlayer::Play(GlDrawList const& list) {
    mList = &list;
    mState = nullptr;
    if (!list.GetVertices().empty()) {
        mContext.targets.TakeVertexInput();
        mContext.vertexFormats.Upload(list.GetVertices());
    }
    for (GlCommand const& command : list.GetCommands()) {
        std::visit([this](auto const& what) { Do(what); }, command);
    }
    ++mContext.statistics.plays;
    mContext.debug.Check("drawing");
}

void GlPlayer::Do(GlRun const& run) {
    GlDrawState const& state = mList->GetState(run.state);
    if (&state != mState) PutInForce(state);
    state.program->PutInForce(mList->GetUniforms(run.uniforms));
    glDrawArrays(ToGlPrimitive(state.primitive), run.first, run.count);
    ++mContext.statistics.draws;
}

void GlPlayer::PutInForce(GlDrawState const& state) {
    GlState& gl = mContext.state;
    mContext.targets.BindTarget(state.target);
    // A buffer that nothing reads or writes may stay attached or not.
    if (state.depthStencil.IsStencil() || state.depthStencil.IsDepth()) {
        mContext.depthStencilPool.Attach(state.target);
    }
    gl.SetDepthStencil(state.depthStencil);
    SetScissor(state.scissor);
    gl.SetBlend(state.blend);
    for (GlTextureUse const& texture : state.textures) {
        if (texture.storage) gl.BindTexture(texture.unit, texture.storage->GetName(), texture.sampler);
    }
    mContext.vertexFormats.Bind(state.format);
    mState = &state;
}

void GlPlayer::SetScissor(GlScissor const& scissor) {
    mContext.state.SetScissorTest(scissor.on);
    if (scissor.on) mContext.state.SetScissorRect(ToGlBox(scissor.rect));
}

// For what has no use for the viewport.
void GlPlayer::BindAlone(GlTargetUse const& target) {
    mState = nullptr;
    GLuint const name = target.frameBuffer->GetName();
    mContext.targets.Bind({name, name});
}

void GlPlayer::Do(GlColorClear const& clear) {
    BindAlone(clear.target);
    SetScissor(clear.scissor);
    GlOverride<GlObstaclesAccess> const obstacles(mContext.state.obstacles, 0);
    GlOverride<GlColorMaskAccess> const mask(mContext.state.colorMask, kGlAllColors);
    // Unlike glClear it needs no clear colour, which foreign code may have set for itself.
    glClearBufferfv(GL_COLOR, 0, clear.color.data());
    ++mContext.statistics.clears;
}

void GlPlayer::Do(GlDepthStencilClear const& clear) {
    BindAlone(clear.target);
    mContext.depthStencilPool.Attach(clear.target);
    SetScissor(clear.scissor);
    GlOverride<GlObstaclesAccess> const obstacles(mContext.state.obstacles, 0);
    GlOverride<GlDepthStencilMaskAccess> const mask(mContext.state.depthStencilMask, kGlAllDepthStencil);
    if (clear.clearDepth && clear.clearStencil) {
        glClearBufferfi(GL_DEPTH_STENCIL, 0, clear.depth, clear.stencil);
    } else if (clear.clearDepth) {
        glClearBufferfv(GL_DEPTH, 0, &clear.depth);
    } else {
        glClearBufferiv(GL_STENCIL, 0, &clear.stencil);
    }
    ++mContext.statistics.clears;
}

// A frame buffer object and the default frame buffer have different names for their parts.
void GlPlayer::Do(GlDiscard const& discard) {
    bool const isObject = discard.target.frameBuffer->GetName() != 0;
    GLenum parts[3] = {};
    GLsizei count = 0;
    if (discard.color) parts[count++] = isObject ? GL_COLOR_ATTACHMENT0 : GL_COLOR;
    if (discard.depthStencil) {
        parts[count++] = isObject ? GL_DEPTH_ATTACHMENT : GL_DEPTH;
        parts[count++] = isObject ? GL_STENCIL_ATTACHMENT : GL_STENCIL;
    }
    BindAlone(discard.target);
    glInvalidateFramebuffer(GL_DRAW_FRAMEBUFFER, count, parts);
}

void GlPlayer::Do(GlTargetCopy const& copy) {
    mState = nullptr;
    GLuint const from = copy.target.frameBuffer->GetName();
    bool hasAlpha = true;
    if (!copy.target.frameBuffer->GetStorage()) {
        // A host may bind another surface under the same name, so the answer cannot be kept. It is cheap
        // beside the copy.
        mContext.targets.BindDraw(from);
        GLint bits = 0;
        glGetIntegerv(GL_ALPHA_BITS, &bits);
        ++mContext.statistics.queries;
        hasAlpha = bits > 0;
    }
    copy.to->CopyFrom(from, hasAlpha, copy.target.width, copy.target.height);
}

} // namespace Moka::detail
