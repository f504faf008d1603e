#include "moka/renderer/gles/GlDrawAccess.h"

namespace Moka::detail {
namespace {

GLuint QueryName(GLenum binding) {
    GLint value = 0;
    glGetIntegerv(binding, &value);
    return static_cast<GLuint>(value);
}

// Switches what is not known to be switched already.
void Switch(GLenum capability, bool on, bool const* known) {
    if (known && *known == on) return;
    on ? glEnable(capability) : glDisable(capability);
}

} // namespace

void GlBlendAccess::Apply(Value const& value, Value const* known) {
    Switch(GL_BLEND, value.on, known ? &known->on : nullptr);
    if (!value.on) return;
    // Nobody here sets another equation, so it needs setting only where foreign code may have.
    if (!known) glBlendEquation(GL_FUNC_ADD);
    glBlendFuncSeparate(value.color[0], value.color[1], value.alpha[0], value.alpha[1]);
}

void GlStencilAccess::Apply(Value const& value, Value const* known) {
    Switch(GL_STENCIL_TEST, value.on, known ? &known->on : nullptr);
    if (!value.on) return;
    glStencilFunc(value.comparison, value.reference, value.readMask);
    glStencilOp(value.stencilFail, value.depthFail, value.pass);
}

GLuint GlVertexArrayAccess::Query() { return QueryName(GL_VERTEX_ARRAY_BINDING); }

void GlVertexArrayAccess::Apply(GLuint value, GLuint const*) { glBindVertexArray(value); }

GLuint GlArrayBufferAccess::Query() { return QueryName(GL_ARRAY_BUFFER_BINDING); }

void GlArrayBufferAccess::Apply(GLuint value, GLuint const*) { glBindBuffer(GL_ARRAY_BUFFER, value); }

} // namespace Moka::detail
