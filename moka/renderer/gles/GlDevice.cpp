#include "moka/renderer/gles/GlDevice.h"

#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlPixels.h"
#include "moka/renderer/gles/GlProgramBuilder.h"
#include "moka/renderer/gles/GlTables.h"

#include <cstdio>
#include <utility>

namespace Moka::detail {
namespace {

constexpr GLint kMostLevels = 1000; // GL's default

std::string GetText(GLenum name) {
    auto const* const text = reinterpret_cast<char const*>(Gl::GetString(name));
    return text ? text : "";
}

bool IsGles3(std::string const& version) {
    int major = 0;
    return std::sscanf(version.c_str(), "OpenGL ES %d.", &major) == 1 && major >= 3;
}

} // namespace

std::unique_ptr<Device> MakeDevice(RendererProcLoader loader, Counters& counters) {
    std::string const version = GetText(GL_VERSION);
    if (!IsGles3(version)) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "RendererFactory::AttachContext needs a current context of OpenGL ES 3.0 or later; "
            "found \"%s\"",
            version.c_str());
        return nullptr;
    }
    return std::make_unique<GlDevice>(loader, counters);
}

GlDevice::GlDevice(RendererProcLoader loader, Counters& countersOfContext)
    : counters(countersOfContext), state(countersOfContext), debug(countersOfContext) {
    debug.Attach(loader);
}

GlDevice::~GlDevice() {
    mergedRuns.Clear();
    vertexFormats.Clear();
    samplers.Clear();
    debug.Detach();
}

DeviceCaps GlDevice::GetCaps() const {
    DeviceCaps caps;
    Gl::GetIntegerv(GL_MAX_TEXTURE_SIZE, &caps.maxTextureSize);
    caps.samplingUnits = state.GetSamplingUnitCount();
    caps.vendor = GetText(GL_VENDOR);
    caps.renderer = GetText(GL_RENDERER);
    caps.version = GetText(GL_VERSION);
    return caps;
}

DeviceName GlDevice::CreateTexture(int width, int height) {
    GLuint name = 0;
    Gl::GenTextures(1, &name);
    GlEditTexture const edit(state, name);
    // Our draws use samplers, which override these parameters. External GL may sample the texture without a
    // sampler. The parameters are set before the storage is allocated, because drivers allocate all mipmap
    // levels if the filter or the maximum level suggests that they are needed.
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAX_LEVEL, 0);
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_LINEAR);
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_LINEAR);
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_S, GL_CLAMP_TO_EDGE);
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_T, GL_CLAMP_TO_EDGE);
    ReservePixels(state, width, height);
    if (debug.Check("making a texture")) return name;
    DeleteTexture(name);
    return 0;
}

void GlDevice::DeleteTexture(DeviceName texture) {
    Gl::DeleteTextures(1, &texture);
    state.ForgetTexture(texture);
}

void GlDevice::Upload(DeviceName texture, PixelBlock const& block, void const* pixels, std::int64_t stride) {
    GlEditTexture const edit(state, texture);
    UploadPixels(state, block, pixels, stride);
    debug.Check("uploading pixels");
}

void GlDevice::UpdateMipmap(DeviceName texture) {
    GlEditTexture const edit(state, texture);
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAX_LEVEL, kMostLevels);
    Gl::GenerateMipmap(GL_TEXTURE_2D);
    ++counters.mipmapUpdates;
    if (debug.Check("making the levels of a texture")) return;
    // GL samples an incomplete texture as black, so go back to level 0 only.
    Gl::TexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAX_LEVEL, 0);
}

void GlDevice::ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels, int rowLength) {
    if (workarounds.Needs(GlWorkaround::BindForDrawingToRead)) {
        host.Bind({target.frameBuffer, target.frameBuffer});
    } else {
        host.BindRead(target.frameBuffer);
    }
    ReadBackPixels(state, block, pixels, rowLength);
    debug.Check("reading pixels back");
}

DeviceName GlDevice::CreateFrameBuffer(DeviceName texture, int width, int height) {
    return frameBuffers.Create(texture, width, height);
}

void GlDevice::DeleteFrameBuffer(DeviceName frameBuffer) { frameBuffers.Delete(frameBuffer); }

DeviceName GlDevice::CreateDepthStencil(int width, int height) {
    return frameBuffers.CreateDepthStencil(width, height);
}

void GlDevice::DeleteDepthStencil(DeviceName depthStencil) { frameBuffers.DeleteDepthStencil(depthStencil); }

DeviceName GlDevice::CreateProgram(char const* vertexSource, char const* fragmentSource, char const* label,
                                   ProgramLayout* layout) {
    TraceScope const trace("renderer", "CreateProgram");
    GlslStages sources{vertexSource, fragmentSource};
    if (workarounds.Needs(GlWorkaround::AvoidMediump)) {
        sources = {MakeGlslHighp(vertexSource), MakeGlslHighp(fragmentSource)};
    }
    GLuint const name =
        BuildGlProgram(sources.vertex.c_str(), sources.fragment.c_str(), label, &layout->draws);
    if (!layout->draws) ++counters.errors;
    if (name == 0) return 0;
    debug.Label(GL_PROGRAM_KHR, name, label);
    programs.Add(name, std::move(sources), label, layout);
    return name;
}

void GlDevice::DeleteProgram(DeviceName program) { programs.Delete(program); }

int GlDevice::AddVertexFormat(VertexDescriptor const& descriptor) { return vertexFormats.Find(descriptor); }

void GlDevice::Submit(DrawList const& list) { mSubmitter.Submit(list); }

void GlDevice::Commit(StateCommit const& commit) {
    if (TargetRef const* const target = commit.target) {
        host.BindTarget(target->frameBuffer, target->width, target->height);
        if (target->texture != 0) frameBuffers.Attach(*target);
    }
    if (commit.scissorTest) state.SetScissorTest(*commit.scissorTest);
    if (commit.scissorRect) state.SetScissorRect(ToGlBox(*commit.scissorRect));
    if (commit.blend) state.SetBlend(*commit.blend);
    if (commit.depthStencil) {
        host.SaveObstacles();
        state.SetDepthStencil(*commit.depthStencil);
    }
    if (commit.program != 0) programs.Apply(commit.program, commit.values);
    for (std::size_t i = 0; i < commit.textureCount; ++i) BindTexture(commit.textures[i]);
}

void GlDevice::RestoreHost(HostState what) {
    switch (what) {
    case HostState::FrameBuffers:
        host.RestoreFrameBuffers();
        return;
    case HostState::VertexInput:
        host.RestoreVertexInput();
        return;
    case HostState::All:
        host.RestoreAll();
        return;
    }
}

void GlDevice::InvalidateState() { state.Invalidate(); }

DeviceName GlDevice::GetHostFrameBuffer() { return host.GetFrameBuffer(); }

bool GlDevice::QueryScissorTest() { return state.scissorTest.Get(); }

ScissorRect GlDevice::QueryScissorRect() {
    GlBox const& box = state.scissorRect.Get();
    return {box.x, box.y, box.width, box.height};
}

void GlDevice::LabelTexture(DeviceName texture, char const* text) { debug.Label(GL_TEXTURE, texture, text); }

void GlDevice::DeleteSamplers() { samplers.Clear(); }

void GlDevice::BindTexture(TextureRef const& texture) {
    state.BindTexture(texture.unit, texture.texture, samplers.Get(texture.sampling));
}

} // namespace Moka::detail
