// GlDrawAccess.h: the GL state that only draws depend on, for GlShadow.
#pragma once

#include <GLES3/gl3.h>

namespace Moka::detail {

struct GlBlendAccess {
    // While blending is off the rest is of no interest and stays zero.
    struct Value {
        bool on = false;
        GLenum color[2] = {}; // the factors of source and destination; what is done with both is adding
        GLenum alpha[2] = {};

        friend bool operator==(Value const& a, Value const& b) {
            return a.on == b.on && a.color[0] == b.color[0] && a.color[1] == b.color[1] &&
                   a.alpha[0] == b.alpha[0] && a.alpha[1] == b.alpha[1];
        }
    };
    static void Apply(Value const& value, Value const* known);
};
using GlBlend = GlBlendAccess::Value;

// The stencil test of both faces.
struct GlStencilAccess {
    // While the test is off the rest is of no interest and stays zero.
    struct Value {
        bool on = false;
        GLenum comparison = GL_NONE;
        GLint reference = 0;
        GLuint readMask = 0;
        GLenum stencilFail = GL_NONE;
        GLenum depthFail = GL_NONE;
        GLenum pass = GL_NONE;

        friend bool operator==(Value const& a, Value const& b) {
            return a.on == b.on && a.comparison == b.comparison && a.reference == b.reference &&
                   a.readMask == b.readMask && a.stencilFail == b.stencilFail && a.depthFail == b.depthFail &&
                   a.pass == b.pass;
        }
    };
    static void Apply(Value const& value, Value const* known);
};
using GlStencil = GlStencilAccess::Value;

struct GlVertexArrayAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlArrayBufferAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

} // namespace Moka::detail
