// GlDevice: implements Device with OpenGL ES 3.0 core.
// Thread: render thread, with the context current.
#pragma once

#include "moka/renderer/device/Device.h"
#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlFrameBuffers.h"
#include "moka/renderer/gles/GlHostState.h"
#include "moka/renderer/gles/GlMergedRuns.h"
#include "moka/renderer/gles/GlPrograms.h"
#include "moka/renderer/gles/GlSamplers.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlSubmitter.h"
#include "moka/renderer/gles/GlVertexFormats.h"
#include "moka/renderer/gles/GlWorkarounds.h"

namespace Moka::detail {

class GlDevice final : public Device {
public:
    GlDevice(RendererProcLoader loader, Counters& countersOfContext);
    ~GlDevice() override;

    DeviceCaps GetCaps() const override;
    DeviceName CreateTexture(int width, int height) override;
    void DeleteTexture(DeviceName texture) override;
    void Upload(DeviceName texture, PixelBlock const& block, void const* pixels,
                std::int64_t stride) override;
    void ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels, int rowLength) override;
    DeviceName CreateFrameBuffer(DeviceName texture, int width, int height) override;
    void DeleteFrameBuffer(DeviceName frameBuffer) override;
    DeviceName CreateDepthStencil(int width, int height) override;
    void DeleteDepthStencil(DeviceName depthStencil) override;
    DeviceName CreateProgram(char const* vertexSource, char const* fragmentSource, char const* label,
                             ProgramLayout* layout) override;
    void DeleteProgram(DeviceName program) override;
    int AddVertexFormat(VertexDescriptor const& descriptor) override;
    void Submit(DrawList const& list) override;
    void Commit(StateCommit const& commit) override;
    void RestoreHost(HostState what) override;
    void InvalidateState() override;
    DeviceName GetHostFrameBuffer() override;
    bool QueryScissorTest() override;
    ScissorRect QueryScissorRect() override;
    void LabelTexture(DeviceName texture, char const* text) override;
    void DeleteSamplers() override;

    void BindTexture(TextureRef const& texture);
    void UpdateMipmap(DeviceName texture);

    Counters& counters;
    GlWorkarounds const workarounds;
    GlState state;
    GlDebug debug;
    GlHostState host{state};
    GlFrameBuffers frameBuffers{state, host, debug};
    GlPrograms programs{state, debug};
    GlSamplers samplers{state};
    GlVertexFormats vertexFormats{state};
    GlMergedRuns mergedRuns{*this};

private:
    GlSubmitter mSubmitter{*this};
};

} // namespace Moka::detail
