#include "tests/support/RecordingDevice.h"

#include "moka/base/log/AndroidLog.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <cstring>

namespace Moka::Testing::detail {

Surface::Surface(int w, int h)
    : width(w), height(h), pixels(static_cast<std::size_t>(w) * static_cast<std::size_t>(h) * 4) {}

unsigned char* Surface::At(int x, int y) {
    return pixels.data() +
           (static_cast<std::size_t>(y) * static_cast<std::size_t>(width) + static_cast<std::size_t>(x)) * 4;
}

void Surface::Grow(int w, int h) {
    if (w <= width && h <= height) return;
    Surface larger(std::max(w, width), std::max(h, height));
    for (int y = 0; y < height && width > 0; ++y) {
        std::memcpy(larger.At(0, y), At(0, y), static_cast<std::size_t>(width) * 4);
    }
    *this = std::move(larger);
}

std::string ObjectState::GetName() const {
    static char const* const kNames[] = {"texture ",  "target ", "buffer ",      "program ",
                                         "graphics ", "blend ",  "depthstencil "};
    return kNames[static_cast<int>(kind)] + std::to_string(number);
}

// Never destroyed: statics of a test may still release objects.
Device& Device::Get() {
    static Device& device = *new Device;
    return device;
}

void Device::Record(std::string const& object, char const* operation, std::string const& arguments) {
    if (keepsRecords) calls.push_back({object, operation, arguments});
}

void Device::CheckThread(std::string const& object, char const* operation) {
    if (!attached) {
        Violate(object + " " + operation + " without a context");
    } else if (renderThread != std::this_thread::get_id()) {
        Violate(object + " " + operation + " outside the render thread");
    }
}

bool Device::MayCreate(ObjectKind kind, char const* function, std::string const& arguments) {
    CheckThread("renderer", function);
    bool const fails = TakeFailure(kind);
    if (attached && !fails) return true;
    Record("renderer", function, arguments + " failed");
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "RendererFactory::%s failed", function);
    return false;
}

bool Device::TakeFailure(ObjectKind kind) {
    return failingCreations.erase(++creations) > 0 || failingKinds.count(kind) > 0;
}

int Device::GetMaxTextureSize() const {
    bool const limited = attached && limitedTextureSize > 0;
    return limited ? std::min(deviceMaxTextureSize, limitedTextureSize) : deviceMaxTextureSize;
}

int Device::CountLive(ObjectKind kind, bool anyContext) const {
    return static_cast<int>(std::count_if(objects.begin(), objects.end(), [&](auto const& object) {
        return object->kind == kind && !object->released && (anyContext || object->context == context);
    }));
}

RendererStatistics Device::CountObjects() const {
    RendererStatistics result = counters;
    result.textureObjects = CountLive(ObjectKind::Texture, false);
    result.renderTargets = CountLive(ObjectKind::RenderTarget, false);
    result.depthStencilBuffers = CountLive(ObjectKind::DepthStencilBuffer, false);
    result.renderBuffers = result.depthStencilBuffers;
    result.programs = CountLive(ObjectKind::Program, false);
    result.graphicsObjects = CountLive(ObjectKind::GraphicsObject, false);
    result.stateObjects =
        CountLive(ObjectKind::BlendState, false) + CountLive(ObjectKind::DepthStencilState, false);
    std::set<Surface const*> storages;
    for (auto const& object : objects) {
        if (object->released || object->context != context) continue;
        if (object->kind == ObjectKind::Texture) {
            storages.insert(static_cast<TextureState const&>(*object).surface.get());
        } else if (object->kind == ObjectKind::RenderTarget) {
            auto const& target = static_cast<RecordingTarget const&>(*object);
            if (!target.IsOffscreen()) continue;
            storages.insert(target.GetSurface());
            ++result.frameBuffers;
        }
    }
    result.textures = static_cast<int>(storages.size());
    return result;
}

void Device::EndObject(ObjectState& object) {
    if (object.released) return;
    object.released = true;
    FreeIfUnused(object);
}

void Device::FreeIfUnused(ObjectState const& object) {
    if (!keepsRecords && !object.MustStay()) objects.erase(object.place);
}

void Device::FreeReleased() {
    objects.remove_if([](auto const& object) { return !object->MustStay(); });
}

void Device::ForgetState() {
    active = nullptr;
    currentProgram = nullptr;
    boundTextures.clear();
    host.reset();
    state = {};
}

Operation::Operation(Quiet, ObjectState const& object, char const* name) : mDevice(Device::Get()) {
    mDevice.mutex.lock();
    Check(object, name);
}

void Operation::Check(ObjectState const& object, char const* name) {
    if (object.released) {
        mDevice.Violate(object.GetName() + " " + name + " after its release");
        return;
    }
    // Left over from an earlier context: inert, and no thread is the wrong one.
    if (!mDevice.attached || object.context != mDevice.context) return;
    if (!mDevice.IsRenderThread()) mDevice.CheckThread(object.GetName(), name);
    mUsable = true;
}

Rect ClipBlock(int x, int y, int blockWidth, int blockHeight, int width, int height) {
    // Wide arithmetic: a hostile block must not wrap round into the image.
    auto const clip = [](long long low, long long extent, int limit) {
        long long const begin = std::max(low, 0LL);
        long long const end = std::min(low + extent, static_cast<long long>(limit));
        return std::pair<int, int>(static_cast<int>(std::min(begin, end)), static_cast<int>(end));
    };
    if (blockWidth < 1 || blockHeight < 1) return {};
    auto const [left, right] = clip(x, blockWidth, width);
    auto const [top, bottom] = clip(y, blockHeight, height);
    return left < right && top < bottom ? Rect(left, top, right, bottom) : Rect();
}

} // namespace Moka::Testing::detail
