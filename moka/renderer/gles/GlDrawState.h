// GlDrawState.h: what a draw depends on beside its vertices and the values of its uniforms, as values.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"
#include "moka/renderer/DepthStencilStateDescriptor.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IRasterizerState.h"

#include <GLES3/gl3.h>

#include <array>
#include <memory>

namespace Moka::detail {

class GlFrameBuffer;
class GlTextureStorage;
class GlUniforms;

struct GlTargetUse {
    std::shared_ptr<GlFrameBuffer> frameBuffer;
    GLsizei width = 0; // 0: the viewport is the host's
    GLsizei height = 0;
    GLuint depthStencil = 0; // the render buffer, 0 for none

    friend bool operator==(GlTargetUse const& a, GlTargetUse const& b) {
        return a.frameBuffer == b.frameBuffer && a.width == b.width && a.height == b.height &&
               a.depthStencil == b.depthStencil;
    }
};

struct GlScissor {
    bool on = false;
    ScissorRect rect;

    friend bool operator==(GlScissor const& a, GlScissor const& b) {
        return a.on == b.on && a.rect == b.rect;
    }
};

struct GlTextureUse {
    std::shared_ptr<GlTextureStorage> storage;
    GLuint sampler = 0;
    int unit = 0;

    friend bool operator==(GlTextureUse const& a, GlTextureUse const& b) {
        return a.storage == b.storage && a.sampler == b.sampler && a.unit == b.unit;
    }
};

// The samplers that one program may have.
inline constexpr int kMaxSamplers = 4;
// Those that are in use stand first.
using GlTextureUses = std::array<GlTextureUse, kMaxSamplers>;

struct GlDrawState {
    GlTargetUse target;
    GlScissor scissor;
    BlendStateDescriptor blend = WithoutBlending();
    DepthStencilStateDescriptor depthStencil{false, false};
    std::shared_ptr<GlUniforms> program;
    GlTextureUses textures;
    int format = 0; // as GlVertexFormats counts them
    PrimitiveType primitive = PrimitiveType::TriangleList;

    static BlendStateDescriptor WithoutBlending() {
        BlendStateDescriptor blend(true);
        blend.SetEnabled(false, true);
        return blend;
    }

    friend bool operator==(GlDrawState const& a, GlDrawState const& b) {
        return a.target == b.target && a.scissor == b.scissor && a.blend == b.blend &&
               a.depthStencil == b.depthStencil && a.program == b.program && a.textures == b.textures &&
               a.format == b.format && a.primitive == b.primitive;
    }
};

} // namespace Moka::detail
