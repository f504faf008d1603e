// GlState: the cache of the actual GL state, one value for each part that the renderer sets or depends on.
// Redundant calls are not made. GlHostState keeps the state of the host.
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

    // Somebody else may have changed anything.
    void Invalidate();

    // The state of a draw. Each setter counts its changes.
    void SetScissorTest(bool on);
    void SetScissorRect(GlBox const& box);
    // The rectangle only while the test is on.
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

    // Units for sampling are 0 up to this number. The one after them is kept for uploads and copies, so that
    // bindings of external GL and of draws stay.
    int GetSamplingUnitCount() const { return static_cast<int>(mUnits.size()) - 1; }

    void BindTexture(int unit, GLuint texture, GLuint sampler);
    // No sampler of ours stays on any unit, where it would overrule the parameters of an external texture.
    void UnbindSamplers();

    // GL unbinds deleted objects; so does the shadow.
    void ForgetTexture(GLuint texture);
    void ForgetSampler(GLuint sampler);
    void ForgetVertexArray(GLuint name);
    // Of vertices or of uniforms.
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
