// GlState: the cache of the actual GL state, with one GlShadow for each part that the renderer sets or
// depends on. It leaves out redundant GL calls. GlHostState keeps the state of the host.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"
#include "moka/renderer/gles/GlShadow.h"
#include "moka/renderer/gles/GlStateValues.h"

#include <vector>

namespace Moka::detail {

struct Counters;

class GlState {
public:
    // Reads the number of texture units from the current context.
    explicit GlState(Counters& counters);

    // Makes all values unknown, because external GL may have changed any.
    void Invalidate();

    // Set the state of a draw, and count changes in the statistics.
    void SetScissorTest(bool on);
    void SetScissorRect(GlBox const& box);
    // Sets the rectangle only if the test is on.
    void SetScissor(ScissorState const& scissor);
    void SetBlend(BlendStateDescriptor const& blend);
    void SetDepthStencil(DepthStencilStateDescriptor const& depthStencil);

    Counters& counters;

    GlShadow<GlFrameBuffersAccess> frameBuffers{counters};
    GlShadow<GlViewportAccess> viewport{counters};
    GlShadow<GlScissorTestAccess> scissorTest{counters};
    GlShadow<GlScissorRectAccess> scissorRect{counters};
    GlShadow<GlColorMaskAccess> colorMask{counters};
    GlShadow<GlDepthStencilMaskAccess> depthStencilMask{counters};
    GlShadow<GlObstaclesAccess> obstacles{counters};
    GlShadow<GlActiveUnitAccess> activeUnit{counters};
    GlShadow<GlRenderBufferAccess> renderBuffer{counters};
    GlShadow<GlProgramAccess> program{counters};
    GlShadow<GlBlendAccess> blend{counters};
    GlShadow<GlStencilAccess> stencil{counters};
    GlShadow<GlVertexArrayAccess> vertexArray{counters};
    GlShadow<GlArrayBufferAccess> arrayBuffer{counters};
    GlShadow<GlUniformBufferAccess> uniformBuffer{counters};
    GlShadow<GlPixelStoreAccess<GlUnpackNames>> unpack{counters};
    GlShadow<GlPixelStoreAccess<GlPackNames>> pack{counters};

    // Draws sample units 0 to this number minus 1. The next unit is reserved for uploads and copies, so that
    // these do not change the bindings of draws and of external GL.
    int GetSamplingUnitCount() const { return static_cast<int>(mUnits.size()) - 1; }

    void BindTexture(int unit, GLuint texture, GLuint sampler);
    // Unbinds our samplers from all units, because they would override the parameters of external textures.
    void UnbindSamplers();

    // Call these when an object is deleted: GL unbinds it, and so does the cache.
    void ForgetTexture(GLuint texture);
    void ForgetSampler(GLuint sampler);
    void ForgetVertexArray(GLuint name);
    // For array buffers and uniform buffers.
    void ForgetBuffer(GLuint name);
    void ForgetFrameBuffer(GLuint frameBuffer);

private:
    friend class GlEditTexture;

    static constexpr GLuint kUnknown = ~0u;
    struct Unit {
        GLuint texture = kUnknown;
        GLuint sampler = kUnknown;
    };

    std::vector<Unit> mUnits;
    std::vector<int> mSamplerUnits; // the units that have one of our samplers bound
};

// Binds a texture to the reserved unit, to change it, and makes that unit active for a scope.
class GlEditTexture {
public:
    GlEditTexture(GlState& state, GLuint texture);

private:
    GlOverride<GlActiveUnitAccess> mUnit;
};

} // namespace Moka::detail
