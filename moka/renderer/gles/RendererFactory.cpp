// RendererFactory over OpenGL ES 3.0.
#include "moka/renderer/RendererFactory.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlDepthStencil.h"
#include "moka/renderer/gles/GlDeviceCaps.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlGraphicsObject.h"
#include "moka/renderer/gles/GlProgram.h"
#include "moka/renderer/gles/GlRasterizer.h"
#include "moka/renderer/gles/GlRenderTarget.h"
#include "moka/renderer/gles/GlStateObjects.h"
#include "moka/renderer/gles/GlTables.h"
#include "moka/renderer/gles/GlTexture.h"
#include "moka/renderer/gles/GlTextureStorage.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <mutex>
#include <utility>

namespace Moka {

using namespace detail;

namespace {

// The context attached now or, for the statistics, the last one. Locked, because they are asked for anywhere.
std::mutex theContextLock;
std::shared_ptr<GlContext> theContext;

std::shared_ptr<GlContext> GetContext() {
    std::lock_guard const lock(theContextLock);
    return theContext;
}

// The attached context, or null with an error line.
std::shared_ptr<GlContext> GetAttached(char const* function) {
    std::shared_ptr<GlContext> context = GetContext();
    if (context && context->IsAttached()) return context;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "RendererFactory::%s: no context is attached; call AttachContext first", function);
    return nullptr;
}

bool IsSizeOk(char const* function, int width, int height) {
    int const largest = GlDeviceCaps::Get().GetMaxTextureSize();
    if (width > 0 && height > 0 && width <= largest && height <= largest) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "RendererFactory::%s: %d x %d is refused; sides are 1 to %d on this device", function,
                        width, height, largest);
    return false;
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

// The model's storage, or a new one.
std::shared_ptr<GlTextureStorage> ChooseStorage(std::shared_ptr<GlContext> const& context,
                                                TextureDescriptor const& descriptor,
                                                PixelSource const& source) {
    if (!descriptor.model) {
        return GlTextureStorage::Create(context, descriptor.width, descriptor.height, source);
    }
    auto const& storage = static_cast<GlTexture const*>(descriptor.model)->GetStorage();
    if (storage->GetContext() == context) return storage;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "RendererFactory::CreateTextureObject: the model belongs to a context that is gone");
    return nullptr;
}

IRenderTarget* MakeTarget(std::shared_ptr<GlContext> const& context,
                          std::shared_ptr<GlFrameBuffer> frameBuffer, int width, int height) {
    return new GlRenderTarget(context, std::move(frameBuffer), std::max(width, 0), std::max(height, 0));
}

} // namespace

bool RendererFactory::AttachContext(RendererLimits const& limits, RendererProcLoader loader) {
    std::shared_ptr<GlContext> const previous = GetContext();
    if (previous && previous->IsAttached()) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "RendererFactory::AttachContext: a context is attached; call DetachContext first");
        return false;
    }
    if (!GlDeviceCaps::Get().Read(limits)) return false;
    auto context = std::make_shared<GlContext>(loader);
    std::lock_guard const lock(theContextLock);
    theContext = std::move(context);
    return true;
}

void RendererFactory::DetachContext() {
    std::shared_ptr<GlContext> const context = GetContext();
    if (context && context->IsAttached()) context->Detach();
}

IRendererDeviceCaps const* RendererFactory::GetRendererDeviceCaps() { return &GlDeviceCaps::Get(); }

bool RendererFactory::IsGPUNameEqualTo(char const* name) {
    return name && std::strcmp(name, GlDeviceCaps::Get().GetRenderer()) == 0;
}

ITextureObject* RendererFactory::CreateTextureObject(TextureDescriptor const& descriptor,
                                                     TextureParameter const* parameters, int parameterCount,
                                                     PixelSource const& source) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateTextureObject");
    if (!context || !IsDescriptorOk(descriptor, source)) return nullptr;
    GlOperation const operation(*context);
    std::shared_ptr<GlTextureStorage> storage = ChooseStorage(context, descriptor, source);
    if (!storage) return nullptr;
    auto* const texture = new GlTexture(std::move(storage));
    for (int i = 0; i < parameterCount; ++i) texture->SetParameter(parameters[i].id, parameters[i].value);
    return texture;
}

IRenderTarget* RendererFactory::CreateOffscreenRenderTarget(ITextureObject* texture) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateOffscreenRenderTarget");
    if (!context) return nullptr;
    if (!texture || static_cast<GlTexture*>(texture)->GetStorage()->GetContext() != context) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "RendererFactory::CreateOffscreenRenderTarget: %s",
                            texture ? "the texture belongs to a context that is gone"
                                    : "no texture is given");
        return nullptr;
    }
    GlOperation const operation(*context);
    std::shared_ptr<GlFrameBuffer> frameBuffer =
        GlFrameBuffer::Over(static_cast<GlTexture*>(texture)->GetStorage());
    if (!frameBuffer) return nullptr;
    return MakeTarget(context, std::move(frameBuffer), texture->GetWidth(), texture->GetHeight());
}

IRenderTarget* RendererFactory::CreateRenderTargetFromDefault(int width, int height) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateRenderTargetFromDefault");
    if (!context) return nullptr;
    GlOperation const operation(*context);
    return MakeTarget(context, GlFrameBuffer::OfHost(context->targets.GetHosts()), width, height);
}

IRenderTarget* RendererFactory::CreateRenderTargetFromCurrent(int width, int height) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateRenderTargetFromCurrent");
    if (!context) return nullptr;
    GlOperation const operation(*context);
    GlRenderTarget const* const active = context->targets.GetActive();
    return MakeTarget(context,
                      active ? active->GetFrameBuffer() : GlFrameBuffer::OfHost(context->targets.GetHosts()),
                      width, height);
}

IDepthStencilBuffer* RendererFactory::CreateDepthStencilBuffer(int width, int height) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateDepthStencilBuffer");
    if (!context || !IsSizeOk("CreateDepthStencilBuffer", width, height)) return nullptr;
    GlOperation const operation(*context);
    return GlDepthStencil::Create(context, width, height);
}

IShaderProgram* RendererFactory::CreateShaderProgram(char const* vertexSource, char const* fragmentSource,
                                                     char const* name) {
    std::shared_ptr<GlContext> const context = GetAttached("CreateShaderProgram");
    if (!context) return new GlProgram(nullptr, vertexSource, fragmentSource, name);
    GlOperation const operation(*context);
    return new GlProgram(context, vertexSource, fragmentSource, name);
}

IGraphicsObject* RendererFactory::CreateGraphicsObject(int streams, PrimitiveType primitive,
                                                       VertexDescriptor const* descriptor, int indices,
                                                       int instanceStreams) {
    std::shared_ptr<GlContext> context = GetAttached("CreateGraphicsObject");
    if (!context) return nullptr;
    if (streams != 1 || indices != 0 || instanceStreams != 0 || !descriptor ||
        descriptor->GetAttributeCount() == 0) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "RendererFactory::CreateGraphicsObject: %d streams, %d attributes, %d indices, %d "
            "instance streams are refused; 1 stream with attributes is drawn, the others are 0",
            streams, descriptor ? descriptor->GetAttributeCount() : 0, indices, instanceStreams);
        return nullptr;
    }
    GlOperation const operation(*context);
    return new GlGraphicsObject(std::move(context), primitive, *descriptor);
}

IBlendStateObject* RendererFactory::CreateBlendStateObject(BlendStateDescriptor const& descriptor) {
    std::shared_ptr<GlContext> context = GetAttached("CreateBlendStateObject");
    return context ? new GlBlendState(std::move(context), descriptor) : nullptr;
}

IDepthStencilState* RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor const& descriptor) {
    std::shared_ptr<GlContext> context = GetAttached("CreateDepthStencilState");
    return context ? new GlDepthStencilState(std::move(context), descriptor) : nullptr;
}

IRasterizerState* RendererFactory::GetRasterizerState() {
    static GlRasterizer rasterizer;
    return &rasterizer;
}

void RendererFactory::SetStencilClip(bool on) {
    if (GlContext* const context = GlContext::GetAttached()) context->current.SetStencilClip(on);
}

void RendererFactory::SetDeferred(bool on) {
    if (std::shared_ptr<GlContext> const context = GetContext()) context->SetDeferred(on);
}

void RendererFactory::Flush() {
    if (std::shared_ptr<GlContext> const context = GetContext()) context->Flush();
}

void RendererFactory::Commit() {
    if (std::shared_ptr<GlContext> const context = GetContext()) context->Commit();
}

void RendererFactory::InvalidateState() {
    if (std::shared_ptr<GlContext> const context = GetContext()) context->InvalidateState();
}

RendererStatistics RendererFactory::GetStatistics() {
    std::shared_ptr<GlContext> const context = GetContext();
    return context ? context->statistics.Snapshot() : RendererStatistics{};
}

} // namespace Moka
