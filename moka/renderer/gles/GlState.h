// GlState: the shadow of the GL state that the renderer sets or depends on, one small value a concept.
// Thread: render thread.
// Does not know what the state is for: who draws where is GlTargetSwitch's business.
#pragma once

#include "moka/renderer/gles/GlPixelStore.h"
#include "moka/renderer/gles/GlShadow.h"

#include <GLES3/gl3.h>

#include <vector>

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
using GlFrameBuffers = GlFrameBuffersAccess::Value;

struct GlViewportAccess {
    struct Value {
        GLint x, y, width, height;
        friend bool operator==(Value const& a, Value const& b) {
            return a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height;
        }
    };
    static Value Query();
    static void Apply(Value const& value, Value const* known);
};
using GlViewport = GlViewportAccess::Value;

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

// What must be off for everything the renderer does, a bit for each that is on: nothing is culled, tested for
// depth, dithered, offset, covered by samples, or thrown away before the rasterizer.
struct GlObstaclesAccess {
    using Value = unsigned;
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

class GlState {
public:
    // Reads the number of texture units from the current context.
    GlState();

    // Somebody else may have changed anything.
    void Invalidate();

    GlShadow<GlFrameBuffersAccess> frameBuffers;
    GlShadow<GlViewportAccess> viewport;
    GlShadow<GlScissorTestAccess> scissorTest;
    GlShadow<GlColorMaskAccess> colorMask;
    GlShadow<GlDepthStencilMaskAccess> depthStencilMask;
    GlShadow<GlObstaclesAccess> obstacles;
    GlShadow<GlActiveUnitAccess> activeUnit;
    GlShadow<GlRenderBufferAccess> renderBuffer;
    GlShadow<GlProgramAccess> program;
    GlShadow<GlPixelStoreAccess<GlUnpackNames>> unpack;
    GlShadow<GlPixelStoreAccess<GlPackNames>> pack;

    // Units for sampling are 0 up to this number. The one after them is kept for uploads and copies, so that
    // what foreign code and draws have bound stays bound.
    int GetSamplingUnitCount() const { return static_cast<int>(mUnits.size()) - 1; }

    void BindTexture(int unit, GLuint texture, GLuint sampler);
    // No sampler of ours stays on any unit, where it would overrule the parameters of a foreign texture.
    void UnbindSamplers();

    // GL undoes the bindings of what is deleted; so does the shadow.
    void ForgetTexture(GLuint texture);
    void ForgetSampler(GLuint sampler);
    void ForgetFrameBuffer(GLuint frameBuffer);
    // Ahead of its deletion, which a current program survives.
    void TakeOffProgram(GLuint name);

private:
    friend class GlEditTexture;

    static constexpr GLuint kUnknown = ~0u;
    struct Unit {
        GLuint texture = kUnknown;
        GLuint sampler = kUnknown;
    };

    std::vector<Unit> mUnits;
    std::vector<int> mSamplerUnits; // those where a sampler of ours is bound
};

// Binds a texture for changing it, on the unit kept for that, and makes that unit the active one for a scope.
class GlEditTexture {
public:
    GlEditTexture(GlState& state, GLuint texture);

private:
    GlOverride<GlActiveUnitAccess> mUnit;
};

} // namespace Moka::detail
