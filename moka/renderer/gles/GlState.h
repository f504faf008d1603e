// GlState: the shadow of the GL state that the renderer sets or depends on, one small value a concept.
// Thread: render thread.
// Does not know what the state is for: who draws where is GlTargetSwitch's business.
#pragma once

#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/gles/GlDrawAccess.h"
#include "moka/renderer/gles/GlPixelStore.h"
#include "moka/renderer/gles/GlShadow.h"

#include <GLES3/gl3.h>

#include <vector>

namespace Moka {
class BlendStateDescriptor;
class DepthStencilStateDescriptor;
} // namespace Moka

namespace Moka::detail {

struct GlStatistics;

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

// What must be off for everything the renderer does, a bit for each that is on: nothing is culled, dithered,
// offset, covered by samples, or thrown away before the rasterizer, nor tested for depth unless a state asks.
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

class GlState {
public:
    // Reads the number of texture units from the current context.
    explicit GlState(GlStatistics& statistics);

    // Somebody else may have changed anything.
    void Invalidate();

    // What a draw is made under; each counts what it changes.
    void SetScissorTest(bool on);
    void SetScissorRect(GlBox const& box);
    void SetBlend(BlendStateDescriptor const& blend);
    void SetDepthStencil(DepthStencilStateDescriptor const& depthStencil);
    void SetProgram(GLuint name);

    GlStatistics& statistics;

    GlShadow<GlFrameBuffersAccess> frameBuffers{statistics};
    GlShadow<GlViewportAccess> viewport{statistics};
    GlShadow<GlScissorTestAccess> scissorTest{statistics};
    GlShadow<GlScissorRectAccess> scissorRect{statistics};
    GlShadow<GlColorMaskAccess> colorMask{statistics};
    GlShadow<GlDepthStencilMaskAccess> depthStencilMask{statistics};
    GlShadow<GlObstaclesAccess> obstacles{statistics};
    GlShadow<GlActiveUnitAccess> activeUnit{statistics};
    GlShadow<GlRenderBufferAccess> renderBuffer{statistics};
    GlShadow<GlProgramAccess> program{statistics};
    GlShadow<GlBlendAccess> blend{statistics};
    GlShadow<GlStencilAccess> stencil{statistics};
    GlShadow<GlVertexArrayAccess> vertexArray{statistics};
    GlShadow<GlArrayBufferAccess> arrayBuffer{statistics};
    GlShadow<GlPixelStoreAccess<GlUnpackNames>> unpack{statistics};
    GlShadow<GlPixelStoreAccess<GlPackNames>> pack{statistics};

    // Units for sampling are 0 up to this number. The one after them is kept for uploads and copies, so that
    // what foreign code and draws have bound stays bound.
    int GetSamplingUnitCount() const { return static_cast<int>(mUnits.size()) - 1; }

    void BindTexture(int unit, GLuint texture, GLuint sampler);
    // No sampler of ours stays on any unit, where it would overrule the parameters of a foreign texture.
    void UnbindSamplers();

    // GL undoes the bindings of what is deleted; so does the shadow.
    void ForgetTexture(GLuint texture);
    void ForgetSampler(GLuint sampler);
    void ForgetVertexArray(GLuint name);
    void ForgetArrayBuffer(GLuint name);
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
