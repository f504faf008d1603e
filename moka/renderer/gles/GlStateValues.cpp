#include "moka/renderer/gles/GlStateValues.h"

#include <iterator>

namespace Moka::detail {
namespace {

GLint QueryInteger(GLenum name) {
    GLint value = 0;
    Gl::GetIntegerv(name, &value);
    return value;
}

GLuint QueryName(GLenum name) { return static_cast<GLuint>(QueryInteger(name)); }

GlBox QueryBox(GLenum name) {
    GLint v[4] = {};
    Gl::GetIntegerv(name, v);
    return {v[0], v[1], v[2], v[3]};
}

// The capability of each bit of GlObstaclesAccess. The first one is kDepthTest.
constexpr GLenum kObstacles[] = {
    GL_DEPTH_TEST,      GL_CULL_FACE,         GL_DITHER, GL_POLYGON_OFFSET_FILL, GL_SAMPLE_ALPHA_TO_COVERAGE,
    GL_SAMPLE_COVERAGE, GL_RASTERIZER_DISCARD};

// Enables or disables the capability unless it is known to be in that state.
void Switch(GLenum capability, bool on, bool const* known) {
    if (known && *known == on) return;
    on ? Gl::Enable(capability) : Gl::Disable(capability);
}

} // namespace

GlBoundFrameBuffers GlFrameBuffersAccess::Query() {
    return {QueryName(GL_DRAW_FRAMEBUFFER_BINDING), QueryName(GL_READ_FRAMEBUFFER_BINDING)};
}

void GlFrameBuffersAccess::Apply(Value const& value, Value const* known) {
    bool const draw = !known || known->draw != value.draw;
    bool const read = !known || known->read != value.read;
    if (draw && read && value.draw == value.read) {
        Gl::BindFramebuffer(GL_FRAMEBUFFER, value.draw);
        return;
    }
    if (draw) Gl::BindFramebuffer(GL_DRAW_FRAMEBUFFER, value.draw);
    if (read) Gl::BindFramebuffer(GL_READ_FRAMEBUFFER, value.read);
}

GlBox GlViewportAccess::Query() { return QueryBox(GL_VIEWPORT); }

void GlViewportAccess::Apply(Value const& value, Value const*) {
    Gl::Viewport(value.x, value.y, value.width, value.height);
}

GlBox GlScissorRectAccess::Query() { return QueryBox(GL_SCISSOR_BOX); }

void GlScissorRectAccess::Apply(Value const& value, Value const*) {
    Gl::Scissor(value.x, value.y, value.width, value.height);
}

bool GlScissorTestAccess::Query() { return Gl::IsEnabled(GL_SCISSOR_TEST) == GL_TRUE; }

void GlScissorTestAccess::Apply(bool value, bool const*) {
    value ? Gl::Enable(GL_SCISSOR_TEST) : Gl::Disable(GL_SCISSOR_TEST);
}

GlColorMaskAccess::Value GlColorMaskAccess::Query() {
    GLboolean mask[4] = {};
    Gl::GetBooleanv(GL_COLOR_WRITEMASK, mask);
    return {mask[0], mask[1], mask[2], mask[3]};
}

void GlColorMaskAccess::Apply(Value const& value, Value const*) {
    Gl::ColorMask(value.r, value.g, value.b, value.a);
}

GlDepthStencilMaskAccess::Value GlDepthStencilMaskAccess::Query() {
    GLboolean depth = GL_TRUE;
    Gl::GetBooleanv(GL_DEPTH_WRITEMASK, &depth);
    return {depth, QueryName(GL_STENCIL_WRITEMASK), QueryName(GL_STENCIL_BACK_WRITEMASK)};
}

void GlDepthStencilMaskAccess::Apply(Value const& value, Value const*) {
    Gl::DepthMask(value.depth);
    if (value.front == value.back) {
        Gl::StencilMask(value.front);
    } else {
        Gl::StencilMaskSeparate(GL_FRONT, value.front);
        Gl::StencilMaskSeparate(GL_BACK, value.back);
    }
}

unsigned GlObstaclesAccess::Query() {
    unsigned on = 0;
    for (unsigned i = 0; i < std::size(kObstacles); ++i) {
        if (Gl::IsEnabled(kObstacles[i])) on |= 1u << i;
    }
    return on;
}

void GlObstaclesAccess::Apply(unsigned value, unsigned const* known) {
    for (unsigned i = 0; i < std::size(kObstacles); ++i) {
        unsigned const bit = 1u << i;
        if (known && ((*known ^ value) & bit) == 0) continue;
        (value & bit) ? Gl::Enable(kObstacles[i]) : Gl::Disable(kObstacles[i]);
    }
}

int GlActiveUnitAccess::Query() { return QueryInteger(GL_ACTIVE_TEXTURE) - GL_TEXTURE0; }

void GlActiveUnitAccess::Apply(int value, int const*) {
    Gl::ActiveTexture(GL_TEXTURE0 + static_cast<GLenum>(value));
}

GLuint GlRenderBufferAccess::Query() { return QueryName(GL_RENDERBUFFER_BINDING); }

void GlRenderBufferAccess::Apply(GLuint value, GLuint const*) {
    Gl::BindRenderbuffer(GL_RENDERBUFFER, value);
}

GLuint GlProgramAccess::Query() { return QueryName(GL_CURRENT_PROGRAM); }

void GlProgramAccess::Apply(GLuint value, GLuint const*) { Gl::UseProgram(value); }

void GlBlendAccess::Apply(Value const& value, Value const* known) {
    Switch(GL_BLEND, value.on, known ? &known->on : nullptr);
    if (!value.on) return;
    // The renderer always uses GL_FUNC_ADD, so only external GL may have set another equation.
    if (!known) Gl::BlendEquation(GL_FUNC_ADD);
    Gl::BlendFuncSeparate(value.color[0], value.color[1], value.alpha[0], value.alpha[1]);
}

void GlStencilAccess::Apply(Value const& value, Value const* known) {
    Switch(GL_STENCIL_TEST, value.on, known ? &known->on : nullptr);
    if (!value.on) return;
    Gl::StencilFunc(value.comparison, value.reference, value.readMask);
    Gl::StencilOp(value.stencilFail, value.depthFail, value.pass);
}

GLuint GlVertexArrayAccess::Query() { return QueryName(GL_VERTEX_ARRAY_BINDING); }

void GlVertexArrayAccess::Apply(GLuint value, GLuint const*) { Gl::BindVertexArray(value); }

GLuint GlArrayBufferAccess::Query() { return QueryName(GL_ARRAY_BUFFER_BINDING); }

void GlArrayBufferAccess::Apply(GLuint value, GLuint const*) { Gl::BindBuffer(GL_ARRAY_BUFFER, value); }

GLuint GlUniformBufferAccess::Query() { return QueryName(GL_UNIFORM_BUFFER_BINDING); }

void GlUniformBufferAccess::Apply(GLuint value, GLuint const*) { Gl::BindBuffer(GL_UNIFORM_BUFFER, value); }

} // namespace Moka::detail
