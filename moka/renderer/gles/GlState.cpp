#include "moka/renderer/gles/GlState.h"

#include "moka/renderer/gles/GlStatistics.h"
#include "moka/renderer/gles/GlTables.h"

#include <algorithm>
#include <iterator>

namespace Moka::detail {
namespace {

GLint QueryInteger(GLenum name) {
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

GLuint QueryName(GLenum name) { return static_cast<GLuint>(QueryInteger(name)); }

GlBox QueryBox(GLenum name) {
    GLint v[4] = {};
    glGetIntegerv(name, v);
    return {v[0], v[1], v[2], v[3]};
}

// The first one has a name of its own.
constexpr GLenum kObstacles[] = {
    GL_DEPTH_TEST,      GL_CULL_FACE,         GL_DITHER, GL_POLYGON_OFFSET_FILL, GL_SAMPLE_ALPHA_TO_COVERAGE,
    GL_SAMPLE_COVERAGE, GL_RASTERIZER_DISCARD};

} // namespace

GlFrameBuffers GlFrameBuffersAccess::Query() {
    return {QueryName(GL_DRAW_FRAMEBUFFER_BINDING), QueryName(GL_READ_FRAMEBUFFER_BINDING)};
}

void GlFrameBuffersAccess::Apply(Value const& value, Value const* known) {
    bool const draw = !known || known->draw != value.draw;
    bool const read = !known || known->read != value.read;
    if (draw && read && value.draw == value.read) {
        glBindFramebuffer(GL_FRAMEBUFFER, value.draw);
        return;
    }
    if (draw) glBindFramebuffer(GL_DRAW_FRAMEBUFFER, value.draw);
    if (read) glBindFramebuffer(GL_READ_FRAMEBUFFER, value.read);
}

GlBox GlViewportAccess::Query() { return QueryBox(GL_VIEWPORT); }

void GlViewportAccess::Apply(Value const& value, Value const*) {
    glViewport(value.x, value.y, value.width, value.height);
}

GlBox GlScissorRectAccess::Query() { return QueryBox(GL_SCISSOR_BOX); }

void GlScissorRectAccess::Apply(Value const& value, Value const*) {
    glScissor(value.x, value.y, value.width, value.height);
}

bool GlScissorTestAccess::Query() { return glIsEnabled(GL_SCISSOR_TEST) == GL_TRUE; }

void GlScissorTestAccess::Apply(bool value, bool const*) {
    value ? glEnable(GL_SCISSOR_TEST) : glDisable(GL_SCISSOR_TEST);
}

GlColorMaskAccess::Value GlColorMaskAccess::Query() {
    GLboolean mask[4] = {};
    glGetBooleanv(GL_COLOR_WRITEMASK, mask);
    return {mask[0], mask[1], mask[2], mask[3]};
}

void GlColorMaskAccess::Apply(Value const& value, Value const*) {
    glColorMask(value.r, value.g, value.b, value.a);
}

GlDepthStencilMaskAccess::Value GlDepthStencilMaskAccess::Query() {
    GLboolean depth = GL_TRUE;
    glGetBooleanv(GL_DEPTH_WRITEMASK, &depth);
    return {depth, QueryName(GL_STENCIL_WRITEMASK), QueryName(GL_STENCIL_BACK_WRITEMASK)};
}

void GlDepthStencilMaskAccess::Apply(Value const& value, Value const*) {
    glDepthMask(value.depth);
    if (value.front == value.back) {
        glStencilMask(value.front);
    } else {
        glStencilMaskSeparate(GL_FRONT, value.front);
        glStencilMaskSeparate(GL_BACK, value.back);
    }
}

unsigned GlObstaclesAccess::Query() {
    unsigned on = 0;
    for (unsigned i = 0; i < std::size(kObstacles); ++i) {
        if (glIsEnabled(kObstacles[i])) on |= 1u << i;
    }
    return on;
}

void GlObstaclesAccess::Apply(unsigned value, unsigned const* known) {
    for (unsigned i = 0; i < std::size(kObstacles); ++i) {
        unsigned const bit = 1u << i;
        if (known && ((*known ^ value) & bit) == 0) continue;
        (value & bit) ? glEnable(kObstacles[i]) : glDisable(kObstacles[i]);
    }
}

int GlActiveUnitAccess::Query() { return QueryInteger(GL_ACTIVE_TEXTURE) - GL_TEXTURE0; }

void GlActiveUnitAccess::Apply(int value, int const*) {
    glActiveTexture(GL_TEXTURE0 + static_cast<GLenum>(value));
}

GLuint GlRenderBufferAccess::Query() { return QueryName(GL_RENDERBUFFER_BINDING); }

void GlRenderBufferAccess::Apply(GLuint value, GLuint const*) { glBindRenderbuffer(GL_RENDERBUFFER, value); }

GLuint GlProgramAccess::Query() { return QueryName(GL_CURRENT_PROGRAM); }

void GlProgramAccess::Apply(GLuint value, GLuint const*) { glUseProgram(value); }

GlState::GlState(GlStatistics& counters)
    : statistics(counters),
      mUnits(static_cast<std::size_t>(QueryInteger(GL_MAX_COMBINED_TEXTURE_IMAGE_UNITS))) {
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
    unpack.Forget();
    pack.Forget();
    std::fill(mUnits.begin(), mUnits.end(), Unit{});
}

void GlState::SetScissorTest(bool on) {
    if (scissorTest.Set(on)) ++statistics.scissorChanges;
}

void GlState::SetScissorRect(GlBox const& box) {
    if (scissorRect.Set(box)) ++statistics.scissorChanges;
}

void GlState::SetBlend(BlendStateDescriptor const& descriptor) {
    if (blend.Set(ToGlBlend(descriptor))) ++statistics.blendChanges;
    GLboolean const write = descriptor.IsColorWrite() ? GL_TRUE : GL_FALSE;
    if (colorMask.Set({write, write, write, write})) ++statistics.blendChanges;
}

// The masks hold while a test is on; otherwise they are left as they are.
void GlState::SetDepthStencil(DepthStencilStateDescriptor const& descriptor) {
    bool const depth = descriptor.IsDepth();
    if (obstacles.Set(depth ? GlObstaclesAccess::kDepthTest : 0)) {
        ++statistics.depthStencilChanges;
        if (depth) glDepthFunc(GL_LESS);
    }
    if (stencil.Set(ToGlStencil(descriptor))) ++statistics.depthStencilChanges;
    if (!depth && !descriptor.IsStencil()) return;
    GLuint const mask = descriptor.IsStencil() ? descriptor.GetWriteMask() : 0;
    if (depthStencilMask.Set({depth ? GLboolean{GL_TRUE} : GLboolean{GL_FALSE}, mask, mask})) {
        ++statistics.depthStencilChanges;
    }
}

void GlState::SetProgram(GLuint name) {
    if (program.Set(name)) ++statistics.programSwitches;
}

void GlState::BindTexture(int unit, GLuint texture, GLuint sampler) {
    Unit& bound = mUnits[static_cast<std::size_t>(unit)];
    if (bound.texture != texture) {
        // Foreign code finds its own unit active again.
        GlOverride<GlActiveUnitAccess> const active(activeUnit, unit);
        glBindTexture(GL_TEXTURE_2D, texture);
        bound.texture = texture;
        ++statistics.textureSwitches;
    }
    if (bound.sampler == sampler) return;
    ++statistics.textureSwitches;
    glBindSampler(static_cast<GLuint>(unit), sampler);
    bound.sampler = sampler;
    if (std::find(mSamplerUnits.begin(), mSamplerUnits.end(), unit) == mSamplerUnits.end()) {
        mSamplerUnits.push_back(unit);
    }
}

void GlState::UnbindSamplers() {
    for (int unit : mSamplerUnits) {
        glBindSampler(static_cast<GLuint>(unit), 0);
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

void GlState::ForgetArrayBuffer(GLuint name) {
    if (GLuint* const bound = arrayBuffer.Known(); bound && *bound == name) *bound = 0;
}

void GlState::ForgetFrameBuffer(GLuint frameBuffer) {
    GlFrameBuffers* const bound = frameBuffers.Known();
    if (!bound) return;
    if (bound->draw == frameBuffer) bound->draw = 0;
    if (bound->read == frameBuffer) bound->read = 0;
}

void GlState::TakeOffProgram(GLuint name) {
    if (program.Get() == name) program.Set(0);
}

GlEditTexture::GlEditTexture(GlState& state, GLuint texture)
    : mUnit(state.activeUnit, state.GetSamplingUnitCount()) {
    GLuint& bound = state.mUnits.back().texture;
    if (bound == texture) return;
    glBindTexture(GL_TEXTURE_2D, texture);
    bound = texture;
}

} // namespace Moka::detail
