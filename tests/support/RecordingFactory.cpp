// RendererFactory as the recording renderer implements it.
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <cstring>

namespace Moka {

using namespace Testing;
using namespace Testing::detail;

namespace {

class RecordingCaps final : public IRendererDeviceCaps {
public:
    int GetMaxTextureSize() const override {
        DeviceAccess const device;
        return device->GetMaxTextureSize();
    }
    char const* GetVendor() const override { return IfAttached("Moka"); }
    char const* GetRenderer() const override { return IfAttached(DeviceAccess()->gpuName.c_str()); }
    char const* GetVersion() const override { return IfAttached("OpenGL ES 3.0 in memory"); }

private:
    static char const* IfAttached(char const* text) {
        DeviceAccess const device;
        return device->attached ? text : "";
    }
};

RecordingCaps const theCaps;

bool IsValid(Device& device, TextureDescriptor const& descriptor) {
    int const largest = device.GetMaxTextureSize();
    char const* reason = nullptr;
    if (descriptor.width < 1 || descriptor.height < 1) {
        reason = "is empty";
    } else if (descriptor.width > largest || descriptor.height > largest) {
        reason = "is too large";
    } else if (descriptor.dimension != 0 || descriptor.format != 2 || descriptor.internalFormat != 6 ||
               descriptor.type != 1) {
        reason = "is not RGBA8";
    }
    if (reason) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::CreateTextureObject: %d x %d %s (at most %d)", descriptor.width,
                            descriptor.height, reason, largest);
    }
    return !reason;
}

// The model's own image, or a new transparent one.
std::shared_ptr<Surface> ChooseSurface(Device& device, TextureDescriptor const& descriptor) {
    if (!descriptor.model) return std::make_shared<Surface>(descriptor.width, descriptor.height);
    TextureState const& model = static_cast<RecordingTexture const*>(descriptor.model)->GetState();
    if (model.released) {
        device.Violate(model.GetName() + " used as a model after its release");
        return nullptr;
    }
    return model.surface;
}

std::string Describe(TextureDescriptor const& descriptor, PixelSource const& source) {
    std::string text = Join(descriptor.width, descriptor.height);
    if (descriptor.flag) text += " flag";
    if (descriptor.model) text += " of " + RecordingRenderer::NameOf(descriptor.model);
    if (source.pixels) text += " pixels " + Join(source.x, source.y, source.rowLength);
    return text;
}

void UploadSource(Device& device, TextureState& texture, PixelSource const& source) {
    if (!source.pixels) return;
    Surface const& surface = *texture.surface;
    auto const rowLength = static_cast<std::size_t>(source.rowLength > 0 ? source.rowLength : surface.width);
    std::ptrdiff_t const offset =
        source.y * static_cast<std::ptrdiff_t>(rowLength) + static_cast<std::ptrdiff_t>(source.x);
    auto const* const first = static_cast<unsigned char const*>(source.pixels) + offset * 4;
    device.counters.bytesUploaded +=
        texture.Upload(Rect(0, 0, surface.width, surface.height), first, rowLength * 4);
}

IRenderTarget* AddTarget(Device& device, std::shared_ptr<Surface> surface, int width, int height,
                         bool offscreen, std::string const& arguments) {
    auto* const target = device.Add<RecordingTarget>(std::move(surface), width, height, offscreen);
    device.Record(target->GetName(), "Create", arguments);
    return target;
}

} // namespace

bool RendererFactory::AttachContext(RendererLimits const& limits, RendererProcLoader) {
    DeviceAccess const device;
    if (device->attached) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::AttachContext: a context is attached already");
        return false;
    }
    device->attached = true;
    ++device->context;
    device->renderThread = std::this_thread::get_id();
    device->limitedTextureSize = limits.maxTextureSize;
    device->counters = {};
    device->ForgetState();
    return true;
}

void RendererFactory::DetachContext() {
    DeviceAccess const device;
    device->CheckThread("renderer", "DetachContext");
    device->attached = false;
    device->ForgetState();
}

IRendererDeviceCaps const* RendererFactory::GetRendererDeviceCaps() { return &theCaps; }

bool RendererFactory::IsGPUNameEqualTo(char const* name) {
    return name && std::strcmp(name, theCaps.GetRenderer()) == 0;
}

ITextureObject* RendererFactory::CreateTextureObject(TextureDescriptor const& descriptor,
                                                     TextureParameter const* parameters, int parameterCount,
                                                     PixelSource const& source) {
    DeviceAccess const device;
    std::string const arguments = Describe(descriptor, source);
    if (!device->MayCreate(ObjectKind::Texture, "CreateTextureObject", arguments)) return nullptr;
    if (!IsValid(*device, descriptor)) return nullptr;
    std::shared_ptr<Surface> surface = ChooseSurface(*device, descriptor);
    if (!surface) return nullptr;
    auto* const texture = device->Add<TextureState>(std::move(surface));
    device->Record(texture->GetName(), "Create", arguments);
    UploadSource(*device, *texture, source);
    for (int i = 0; i < parameterCount; ++i) texture->SetParameter(parameters[i].id, parameters[i].value);
    return texture->GetObject();
}

IRenderTarget* RendererFactory::CreateOffscreenRenderTarget(ITextureObject* texture) {
    DeviceAccess const device;
    std::string const arguments = RecordingRenderer::NameOf(texture);
    if (!device->MayCreate(ObjectKind::RenderTarget, "CreateOffscreenRenderTarget", arguments))
        return nullptr;
    if (!texture) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::CreateOffscreenRenderTarget: no texture");
        return nullptr;
    }
    TextureState const& state = static_cast<RecordingTexture const*>(texture)->GetState();
    if (state.released) {
        device->Violate(state.GetName() + " made a target after its release");
        return nullptr;
    }
    return AddTarget(*device, state.surface, state.surface->width, state.surface->height, true, arguments);
}

IRenderTarget* RendererFactory::CreateRenderTargetFromDefault(int width, int height) {
    DeviceAccess const device;
    std::string const arguments = Join("default", width, height);
    if (!device->MayCreate(ObjectKind::RenderTarget, "CreateRenderTargetFromDefault", arguments))
        return nullptr;
    if (!device->host) device->host = std::make_shared<Surface>(0, 0);
    device->host->Grow(std::max(width, 0), std::max(height, 0));
    return AddTarget(*device, device->host, width, height, false, arguments);
}

IRenderTarget* RendererFactory::CreateRenderTargetFromCurrent(int width, int height) {
    DeviceAccess const device;
    std::string const arguments = Join("current", width, height);
    if (!device->MayCreate(ObjectKind::RenderTarget, "CreateRenderTargetFromCurrent", arguments))
        return nullptr;
    if (device->active) {
        return AddTarget(*device, device->active->ShareSurface(), width, height, false, arguments);
    }
    if (!device->host) device->host = std::make_shared<Surface>(0, 0);
    device->host->Grow(std::max(width, 0), std::max(height, 0));
    return AddTarget(*device, device->host, width, height, false, arguments);
}

IDepthStencilBuffer* RendererFactory::CreateDepthStencilBuffer(int width, int height) {
    DeviceAccess const device;
    std::string const arguments = Join(width, height);
    if (!device->MayCreate(ObjectKind::DepthStencilBuffer, "CreateDepthStencilBuffer", arguments)) {
        return nullptr;
    }
    if (width < 1 || height < 1) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::CreateDepthStencilBuffer: %d x %d is empty", width, height);
        return nullptr;
    }
    auto* const buffer = device->Add<RecordingBuffer>(width, height);
    device->Record(buffer->GetName(), "Create", arguments);
    return buffer;
}

IShaderProgram* RendererFactory::CreateShaderProgram(char const* vertexSource, char const* fragmentSource,
                                                     char const* name) {
    DeviceAccess const device;
    device->CheckThread("renderer", "CreateShaderProgram");
    char const* const label = name ? name : "";
    auto* const program = device->Add<RecordingProgram>(vertexSource, fragmentSource, label);
    device->Record(program->GetName(), "Create", label);
    return program;
}

void RendererFactory::SetDeferred(bool on) {
    DeviceAccess const device;
    device->RecordStatic("renderer", "SetDeferred", on);
}

void RendererFactory::Flush() {
    DeviceAccess const device;
    device->RecordStatic("renderer", "Flush");
}

void RendererFactory::Commit() {
    DeviceAccess const device;
    device->RecordStatic("renderer", "Commit");
}

void RendererFactory::InvalidateState() {
    DeviceAccess const device;
    device->RecordStatic("renderer", "InvalidateState");
}

RendererStatistics RendererFactory::GetStatistics() {
    DeviceAccess const device;
    return device->CountObjects();
}

} // namespace Moka
