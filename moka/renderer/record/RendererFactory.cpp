// RendererFactory: validates all arguments, the same way for every device, and creates the recorder's
// objects.
#include "moka/renderer/RendererFactory.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/record/Caps.h"
#include "moka/renderer/record/DepthStencilBuffer.h"
#include "moka/renderer/record/FrameBuffer.h"
#include "moka/renderer/record/GraphicsObject.h"
#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/record/RenderTarget.h"
#include "moka/renderer/record/ShaderProgram.h"
#include "moka/renderer/record/StateObjects.h"
#include "moka/renderer/record/TextureObject.h"
#include "moka/renderer/record/TextureStorage.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <new>
#include <utility>

namespace Moka {

using namespace detail;

namespace {

constexpr ObjectKind kRenderer = ObjectKind::kRenderer;

void LogRefusal(char const* function, char const* reason) {
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "RendererFactory::%s: %s", function, reason);
}

// Returns the recorder of the attached context. Without one, logs an error and returns null.
std::shared_ptr<Recorder> GetAttached(char const* function) {
    std::shared_ptr<Recorder> recorder = GetRecorder();
    if (recorder && recorder->IsAttached()) return recorder;
    LogRefusal(function, "no context is attached; call AttachContext first");
    return nullptr;
}

// Calls create(recorder) within a request and returns its object. Returns null if no context is attached, the
// observer refuses, or memory runs out.
template <class Create>
auto CreateIn(char const* function, ObjectKind kind, Create create) -> decltype(create(nullptr)) {
    std::shared_ptr<Recorder> const recorder = GetAttached(function);
    if (!recorder) return nullptr;
    if (theObserver && !theObserver->MayCreate(kind)) {
        LogRefusal(function, "no memory");
        return nullptr;
    }
    RequestScope const scope(*recorder);
    try {
        return create(recorder);
    } catch (std::bad_alloc const&) {
        LogRefusal(function, "no memory");
        return nullptr;
    }
}

bool IsSizeOk(char const* function, int width, int height) {
    int const largest = RecorderCaps::Get().GetMaxTextureSize();
    if (width > 0 && height > 0 && width <= largest && height <= largest) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "RendererFactory::%s: %d x %d is refused; sides are 1 to %d on this device", function,
                        width, height, largest);
    return false;
}

// True for two-dimensional RGBA8, the only format.
bool IsKnownFormat(TextureDescriptor const& descriptor) {
    return descriptor.dimension == 0 && descriptor.format == 2 && descriptor.internalFormat == 6 &&
           descriptor.type == 1;
}

bool IsDescriptorOk(TextureDescriptor const& descriptor, PixelSource const& source) {
    char const* const function = "CreateTextureObject";
    if (!IsSizeOk(function, descriptor.width, descriptor.height)) return false;
    if (!IsKnownFormat(descriptor)) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::%s: format codes %d, %d, %d, %d are refused; only 0, 2, 6, 1 "
                            "(RGBA8) are known",
                            function, descriptor.dimension, descriptor.format, descriptor.internalFormat,
                            descriptor.type);
        return false;
    }
    if (source.pixels && source.rowLength != 0 && source.rowLength < descriptor.width) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::%s: pixels in rows of %d cannot fill a texture %d wide",
                            function, source.rowLength, descriptor.width);
        return false;
    }
    return true;
}

// Returns the storage of the texture that the descriptor shares, or a new one.
std::shared_ptr<TextureStorage> ChooseStorage(std::shared_ptr<Recorder> const& recorder,
                                              TextureDescriptor const& descriptor,
                                              PixelSource const& source) {
    if (!descriptor.model) {
        return TextureStorage::Create(recorder, descriptor.width, descriptor.height, source);
    }
    auto const& storage = static_cast<TextureObject const*>(descriptor.model)->GetStorage();
    if (storage->GetRecorder() == recorder) return storage;
    LogRefusal("CreateTextureObject", "the model belongs to a context that is gone");
    return nullptr;
}

IRenderTarget* MakeTarget(std::shared_ptr<Recorder> const& recorder, std::shared_ptr<FrameBuffer> frameBuffer,
                          int width, int height) {
    return new RenderTarget(recorder, std::move(frameBuffer), std::max(width, 0), std::max(height, 0));
}

std::shared_ptr<FrameBuffer> MakeHostFrameBuffer(Recorder& recorder) {
    return std::make_shared<FrameBuffer>(recorder.GetDevice().GetHostFrameBuffer());
}

template <class State, class Interface, class Descriptor>
Interface* MakeState(std::shared_ptr<Recorder> const& recorder, ObjectKind kind,
                     Descriptor const& descriptor) {
    Interface* const state = new State(recorder, descriptor);
    Observe(kind, state, "Create");
    return state;
}

} // namespace

bool RendererFactory::AttachContext(RendererLimits const& limits, RendererProcLoader loader) {
    std::shared_ptr<Recorder> const previous = GetRecorder();
    if (previous && previous->IsAttached()) {
        LogRefusal("AttachContext", "a context is attached; call DetachContext first");
        return false;
    }
    std::shared_ptr<Recorder> recorder = Recorder::Create(limits, loader);
    if (!recorder) return false;
    SetRecorder(std::move(recorder));
    return true;
}

void RendererFactory::DetachContext() {
    std::shared_ptr<Recorder> const recorder = GetRecorder();
    if (!recorder || !recorder->IsAttached()) return;
    recorder->Detach();
    SetRecorder(recorder);
}

IRendererDeviceCaps const* RendererFactory::GetRendererDeviceCaps() { return &RecorderCaps::Get(); }

bool RendererFactory::IsGPUNameEqualTo(char const* name) {
    return name && std::strcmp(name, RecorderCaps::Get().GetRenderer()) == 0;
}

ITextureObject* RendererFactory::CreateTextureObject(TextureDescriptor const& descriptor,
                                                     TextureParameter const* parameters, int parameterCount,
                                                     PixelSource const& source) {
    using Result = ITextureObject*;
    return CreateIn("CreateTextureObject", ObjectKind::kTexture, [&](auto const& recorder) -> Result {
        if (!IsDescriptorOk(descriptor, source)) return nullptr;
        std::shared_ptr<TextureStorage> storage = ChooseStorage(recorder, descriptor, source);
        if (!storage) return nullptr;
        auto* const texture = new TextureObject(std::move(storage));
        for (int i = 0; i < parameterCount; ++i) texture->Store(parameters[i].id, parameters[i].value);
        Observe(ObjectKind::kTexture, static_cast<Result>(texture), "Create", descriptor.width,
                descriptor.height);
        return texture;
    });
}

IRenderTarget* RendererFactory::CreateOffscreenRenderTarget(ITextureObject* texture) {
    char const* const function = "CreateOffscreenRenderTarget";
    using Result = IRenderTarget*;
    return CreateIn(function, ObjectKind::kRenderTarget, [&](auto const& recorder) -> Result {
        auto const* const object = static_cast<TextureObject*>(texture);
        if (!object || object->GetStorage()->GetRecorder() != recorder) {
            LogRefusal(function,
                       object ? "the texture belongs to a context that is gone" : "no texture is given");
            return nullptr;
        }
        auto frameBuffer = std::make_shared<FrameBuffer>(object->GetStorage());
        if (frameBuffer->GetName() == 0) return nullptr;
        Result const target =
            MakeTarget(recorder, std::move(frameBuffer), texture->GetWidth(), texture->GetHeight());
        Observe(ObjectKind::kRenderTarget, target, "Create", static_cast<void const*>(texture));
        return target;
    });
}

IRenderTarget* RendererFactory::CreateRenderTargetFromDefault(int width, int height) {
    using Result = IRenderTarget*;
    return CreateIn(
        "CreateRenderTargetFromDefault", ObjectKind::kRenderTarget, [&](auto const& recorder) -> Result {
            Result const target = MakeTarget(recorder, MakeHostFrameBuffer(*recorder), width, height);
            Observe(ObjectKind::kRenderTarget, target, "Create", "default", width, height);
            return target;
        });
}

IRenderTarget* RendererFactory::CreateRenderTargetFromCurrent(int width, int height) {
    using Result = IRenderTarget*;
    return CreateIn(
        "CreateRenderTargetFromCurrent", ObjectKind::kRenderTarget, [&](auto const& recorder) -> Result {
            RenderTarget const* const active = recorder->GetActive();
            Result const target = MakeTarget(
                recorder, active ? active->GetFrameBuffer() : MakeHostFrameBuffer(*recorder), width, height);
            Observe(ObjectKind::kRenderTarget, target, "Create", "current", width, height);
            return target;
        });
}

IDepthStencilBuffer* RendererFactory::CreateDepthStencilBuffer(int width, int height) {
    char const* const function = "CreateDepthStencilBuffer";
    using Result = IDepthStencilBuffer*;
    return CreateIn(function, ObjectKind::kDepthStencilBuffer, [&](auto const& recorder) -> Result {
        if (!IsSizeOk(function, width, height)) return nullptr;
        DeviceName const name = recorder->depthStencilPool.Take(width, height);
        if (name == 0) return nullptr;
        Result const buffer = new (std::nothrow) DepthStencilBuffer(recorder, name, width, height);
        if (!buffer) recorder->depthStencilPool.Return(name, width, height);
        if (buffer) Observe(ObjectKind::kDepthStencilBuffer, buffer, "Create", width, height);
        return buffer;
    });
}

IShaderProgram* RendererFactory::CreateShaderProgram(char const* vertexSource, char const* fragmentSource,
                                                     char const* name) {
    std::shared_ptr<Recorder> const recorder = GetAttached("CreateShaderProgram");
    try {
        if (recorder) recorder->Begin();
        auto state = std::make_shared<ProgramState>(recorder, vertexSource, fragmentSource, name);
        auto* const program = new ShaderProgram(std::move(state));
        Observe(ObjectKind::kProgram, static_cast<IShaderProgram*>(program), "Create", name ? name : "");
        return program;
    } catch (std::bad_alloc const&) {
        LogRefusal("CreateShaderProgram", "no memory; the program draws nothing");
        return ShaderProgram::GetInert();
    }
}

IGraphicsObject* RendererFactory::CreateGraphicsObject(int streams, PrimitiveType primitive,
                                                       VertexDescriptor const* descriptor, int indices,
                                                       int instanceStreams) {
    using Result = IGraphicsObject*;
    return CreateIn("CreateGraphicsObject", ObjectKind::kGraphicsObject, [&](auto const& recorder) -> Result {
        int const attributes = descriptor ? descriptor->GetAttributeCount() : 0;
        if (streams != 1 || indices != 0 || instanceStreams != 0 || attributes == 0) {
            __android_log_print(
                ANDROID_LOG_ERROR, "mok_log",
                "RendererFactory::CreateGraphicsObject: %d streams, %d attributes, %d indices, %d "
                "instance streams are refused; 1 stream with attributes is drawn, the others are 0",
                streams, attributes, indices, instanceStreams);
            return nullptr;
        }
        Result const object = new GraphicsObject(recorder, primitive, *descriptor);
        Observe(ObjectKind::kGraphicsObject, object, "Create", static_cast<int>(primitive),
                descriptor->GetFloatCount());
        return object;
    });
}

IBlendStateObject* RendererFactory::CreateBlendStateObject(BlendStateDescriptor const& descriptor) {
    return CreateIn("CreateBlendStateObject", ObjectKind::kBlendState, [&](auto const& recorder) {
        return MakeState<BlendState, IBlendStateObject>(recorder, ObjectKind::kBlendState, descriptor);
    });
}

IDepthStencilState* RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor const& descriptor) {
    return CreateIn("CreateDepthStencilState", ObjectKind::kDepthStencilState, [&](auto const& recorder) {
        return MakeState<DepthStencilState, IDepthStencilState>(recorder, ObjectKind::kDepthStencilState,
                                                                descriptor);
    });
}

IRasterizerState* RendererFactory::GetRasterizerState() {
    static RasterizerState rasterizer;
    return &rasterizer;
}

RenderTargetSize RendererFactory::GetActiveTargetSize() {
    Recorder const* const recorder = GetAttachedRecorder();
    if (!recorder || !recorder->GetActive()) return {};
    TargetRef const& target = recorder->GetActive()->GetRef();
    return {target.width, target.height};
}

void RendererFactory::SetStencilClip(bool on) {
    if (theObserver) Observe(kRenderer, nullptr, "SetStencilClip", on);
    if (Recorder* const recorder = GetAttachedRecorder()) recorder->requested->SetStencilClip(on);
}

void RendererFactory::SetDeferred(bool on) {
    Observe(kRenderer, nullptr, "SetDeferred", on);
    if (std::shared_ptr<Recorder> const recorder = GetRecorder()) recorder->SetDeferred(on);
}

void RendererFactory::Flush() {
    Observe(kRenderer, nullptr, "Flush");
    if (std::shared_ptr<Recorder> const recorder = GetRecorder()) recorder->FlushForHost();
}

void RendererFactory::Commit() {
    Observe(kRenderer, nullptr, "Commit");
    if (std::shared_ptr<Recorder> const recorder = GetRecorder()) recorder->CommitForExternal();
}

void RendererFactory::InvalidateState() {
    Observe(kRenderer, nullptr, "InvalidateState");
    if (std::shared_ptr<Recorder> const recorder = GetRecorder()) recorder->InvalidateState();
}

RendererStatistics RendererFactory::GetStatistics() {
    std::shared_ptr<Recorder> const recorder = GetRecorder();
    return recorder ? recorder->counters.Snapshot() : RendererStatistics{};
}

} // namespace Moka
