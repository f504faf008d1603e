#include "moka/renderer/gles/GlState.h"

#include "moka/renderer/gles/GlTables.h"

#include <algorithm>

namespace Moka::detail {

namespace {

std::size_t CountUnits() {
    GLint count = 0;
    Gl::GetIntegerv(GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS, &count);
    return static_cast<std::size_t>(count);
}

} // namespace

GlState::GlState(Counters& countersOfContext) : counters(countersOfContext), mUnits(CountUnits()) {
    mSamplerUnits.reserve(mUnits.size());
}

void GlState::Invalidate() {
    frameBuffers.Forget();
    viewport.Forget();
    scissorTest.Forget();
    scissorRect.Forget();
    colorMask.Forget();
    depthStencilMask.Forget();
    obstacles.Forget();
    activeUnit.Forget();
    renderBuffer.Forget();
    program.Forget();
    blend.Forget();
    stencil.Forget();
    vertexArray.Forget();
    arrayBuffer.Forget();
    uniformBuffer.Forget();
    unpack.Forget();
    pack.Forget();
    std::fill(mUnits.begin(), mUnits.end(), Unit{});
}

void GlState::SetScissorTest(bool on) {
    if (scissorTest.Set(on)) ++counters.scissorChanges;
}

void GlState::SetScissorRect(GlBox const& box) {
    if (scissorRect.Set(box)) ++counters.scissorChanges;
}

void GlState::SetScissor(ScissorState const& scissor) {
    SetScissorTest(scissor.on);
    if (scissor.on) SetScissorRect(ToGlBox(scissor.rect));
}

void GlState::SetBlend(BlendStateDescriptor const& descriptor) {
    if (blend.Set(ToGlBlend(descriptor))) ++counters.blendChanges;
    GLboolean const write = descriptor.IsColorWrite() ? GL_TRUE : GL_FALSE;
    if (colorMask.Set({write, write, write, write})) ++counters.blendChanges;
}

// Sets the write masks only while a test is on, because they have no effect otherwise.
void GlState::SetDepthStencil(DepthStencilStateDescriptor const& descriptor) {
    bool const depth = descriptor.IsDepth();
    if (obstacles.Set(depth ? GlObstaclesAccess::kDepthTest : 0)) {
        ++counters.depthStencilChanges;
        if (depth) Gl::DepthFunc(GL_LESS);
    }
    if (stencil.Set(ToGlStencil(descriptor))) ++counters.depthStencilChanges;
    if (!depth && !descriptor.IsStencil()) return;
    GLuint const mask = descriptor.IsStencil() ? descriptor.GetWriteMask() : 0;
    if (depthStencilMask.Set({depth ? GLboolean{GL_TRUE} : GLboolean{GL_FALSE}, mask, mask})) {
        ++counters.depthStencilChanges;
    }
}

void GlState::BindTexture(int unit, GLuint texture, GLuint sampler) {
    Unit& bound = mUnits[static_cast<std::size_t>(unit)];
    if (bound.texture != texture) {
        // Restores the active unit afterwards, for external GL.
        GlOverride<GlActiveUnitAccess> const active(activeUnit, unit);
        Gl::BindTexture(GL_TEXTURE_2D, texture);
        bound.texture = texture;
        ++counters.textureSwitches;
    }
    if (bound.sampler == sampler) return;
    ++counters.textureSwitches;
    Gl::BindSampler(static_cast<GLuint>(unit), sampler);
    bound.sampler = sampler;
    if (std::find(mSamplerUnits.begin(), mSamplerUnits.end(), unit) == mSamplerUnits.end()) {
        mSamplerUnits.push_back(unit);
    }
}

void GlState::UnbindSamplers() {
    for (int unit : mSamplerUnits) {
        Gl::BindSampler(static_cast<GLuint>(unit), 0);
        mUnits[static_cast<std::size_t>(unit)].sampler = 0;
    }
    mSamplerUnits.clear();
}

void GlState::ForgetTexture(GLuint texture) {
    for (Unit& unit : mUnits) {
        if (unit.texture == texture) unit.texture = 0;
    }
}

void GlState::ForgetSampler(GLuint sampler) {
    for (Unit& unit : mUnits) {
        if (unit.sampler == sampler) unit.sampler = 0;
    }
}

void GlState::ForgetVertexArray(GLuint name) {
    if (GLuint* const bound = vertexArray.Known(); bound && *bound == name) *bound = 0;
}

void GlState::ForgetBuffer(GLuint name) {
    for (GLuint* const bound : {arrayBuffer.Known(), uniformBuffer.Known()}) {
        if (bound && *bound == name) *bound = 0;
    }
}

void GlState::ForgetFrameBuffer(GLuint frameBuffer) {
    GlBoundFrameBuffers* const bound = frameBuffers.Known();
    if (!bound) return;
    if (bound->draw == frameBuffer) bound->draw = 0;
    if (bound->read == frameBuffer) bound->read = 0;
}

GlEditTexture::GlEditTexture(GlState& state, GLuint texture)
    : mUnit(state.activeUnit, state.GetSamplingUnitCount()) {
    GLuint& bound = state.mUnits.back().texture;
    if (bound == texture) return;
    Gl::BindTexture(GL_TEXTURE_2D, texture);
    bound = texture;
}

} // namespace Moka::detail
