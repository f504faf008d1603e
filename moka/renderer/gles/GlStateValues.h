// GlStateValues.h: the parts of GL state that the renderer sets, each a comparable value with the calls that
// query and apply it, for GlShadow.
#pragma once

#include "moka/renderer/gles/GlFunctions.h"

namespace Moka::detail {

struct GlFrameBuffersAccess {
    struct Value {
        GLuint draw;
        GLuint read;
        friend bool operator==(Value const& a, Value const& b) {
            return a.draw == b.draw && a.read == b.read;
        }
    };
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};
using GlBoundFrameBuffers = GlFrameBuffersAccess::Value;

// In pixels of the frame buffer, from GL's origin.
struct GlBox {
    GLint x = 0, y = 0, width = 0, height = 0;
    friend bool operator==(GlBox const& a, GlBox const& b) {
        return a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height;
    }
};

struct GlViewportAccess {
    using Value = GlBox;
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};

struct GlScissorRectAccess {
    using Value = GlBox;
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};

struct GlScissorTestAccess {
    using Value = bool;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlColorMaskAccess {
    struct Value {
        GLboolean r, g, b, a;
        friend bool operator==(Value const& x, Value const& y) {
            return x.r == y.r && x.g == y.g && x.b == y.b && x.a == y.a;
        }
    };
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};
inline constexpr GlColorMaskAccess::Value kGlAllColors{GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE};

// The write masks of depth and of both faces' stencil.
struct GlDepthStencilMaskAccess {
    struct Value {
        GLboolean depth;
        GLuint front, back;
        friend bool operator==(Value const& x, Value const& y) {
            return x.depth == y.depth && x.front == y.front && x.back == y.back;
        }
    };
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};
inline constexpr GlDepthStencilMaskAccess::Value kGlAllDepthStencil{GL_TRUE, 0xFFu, 0xFFu};

// Switches that must be off for all work of the renderer, a bit for each that is on: nothing is culled,
// dithered, offset, covered by samples, or thrown away before the rasterizer, nor tested for depth unless a
// state asks.
struct GlObstaclesAccess {
    using Value = unsigned;
    static constexpr Value kDepthTest = 1u;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlActiveUnitAccess {
    using Value = int;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlRenderBufferAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlProgramAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

struct GlBlendAccess {
    // While blending is off the rest is of no interest and stays zero.
    struct Value {
        bool on = false;
        GLenum color[2] = {}; // the factors of source and destination; the two are added
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

// The general binding, not the numbered ones.
struct GlUniformBufferAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

// How pixels lie in memory, as far as it concerns two-dimensional transfers. The default values are GL's own;
// the renderer leaves them behind after each transfer.
struct GlPixelStore {
    GLuint buffer = 0;
    GLint alignment = 4;
    GLint rowLength = 0; // pixels; 0 for tightly packed rows
    GLint skipRows = 0;
    GLint skipPixels = 0;

    friend bool operator==(GlPixelStore const& a, GlPixelStore const& b) {
        return a.buffer == b.buffer && a.alignment == b.alignment && a.rowLength == b.rowLength &&
               a.skipRows == b.skipRows && a.skipPixels == b.skipPixels;
    }
};

// The names of one direction.
struct GlUnpackNames {
    static constexpr GLenum kBuffer = GL_PIXEL_UNPACK_BUFFER;
    static constexpr GLenum kAlignment = GL_UNPACK_ALIGNMENT;
    static constexpr GLenum kRowLength = GL_UNPACK_ROW_LENGTH;
    static constexpr GLenum kSkipRows = GL_UNPACK_SKIP_ROWS;
    static constexpr GLenum kSkipPixels = GL_UNPACK_SKIP_PIXELS;
};

struct GlPackNames {
    static constexpr GLenum kBuffer = GL_PIXEL_PACK_BUFFER;
    static constexpr GLenum kAlignment = GL_PACK_ALIGNMENT;
    static constexpr GLenum kRowLength = GL_PACK_ROW_LENGTH;
    static constexpr GLenum kSkipRows = GL_PACK_SKIP_ROWS;
    static constexpr GLenum kSkipPixels = GL_PACK_SKIP_PIXELS;
};

// For GlShadow. There is no query: external GL finds GL's defaults again, not its own values.
template <class Names>
struct GlPixelStoreAccess {
    using Value = GlPixelStore;

    static void Apply(Value const& value, Value const* known) {
        if (!known || known->buffer != value.buffer) Gl::BindBuffer(Names::kBuffer, value.buffer);
        Store(Names::kAlignment, value.alignment, known ? &known->alignment : nullptr);
        Store(Names::kRowLength, value.rowLength, known ? &known->rowLength : nullptr);
        Store(Names::kSkipRows, value.skipRows, known ? &known->skipRows : nullptr);
        Store(Names::kSkipPixels, value.skipPixels, known ? &known->skipPixels : nullptr);
    }

private:
    static void Store(GLenum name, GLint value, GLint const* known) {
        if (!known || *known != value) Gl::PixelStorei(name, value);
    }
};

} // namespace Moka::detail
