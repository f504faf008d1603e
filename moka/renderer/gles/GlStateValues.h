// GlStateValues.h: the parts of GL state that the renderer sets. For each, a comparable value and the
// functions that query and apply it, for GlShadow.
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

// A rectangle in pixels of the frame buffer, from GL's origin (bottom left).
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

// GL switches that must be off while the renderer draws, one bit for each that is on: culling, dithering,
// polygon offset, sample coverage, rasterizer discard, and the depth test unless a state enables it.
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
    // While blending is off, the factors stay zero, so that all such values are equal.
    struct Value {
        bool on = false;
        GLenum color[2] = {}; // the factors of source and destination
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
    // While the test is off, the other members keep their defaults, so that all such values are equal.
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

// The general uniform buffer binding, not the indexed ones.
struct GlUniformBufferAccess {
    using Value = GLuint;
    static Value Query();
    static void Apply(Value value, Value const* known);
};

// The pixel store parameters of two-dimensional transfers. The default values are those of GL. The renderer
// restores them after each transfer.
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

// The GL names of the parameters for uploads, and below for read-backs.
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

// For GlShadow. It has no Query(): after a transfer external GL finds GL's defaults, not its previous values.
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
