#include "moka/base/log/AndroidLog.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace Moka::Testing::detail {
namespace {

// The first rows and columns that both have, without a flip. Copying an image onto itself changes nothing.
std::size_t CopyCorner(Surface& from, Surface& to) {
    int const width = std::min(from.width, to.width);
    int const height = std::min(from.height, to.height);
    std::size_t const rowBytes = static_cast<std::size_t>(width) * 4;
    for (int y = 0; y < height && width > 0; ++y) std::memmove(to.At(0, y), from.At(0, y), rowBytes);
    return rowBytes * static_cast<std::size_t>(height);
}

// What is drawn into right now: the active target, or else the host's frame buffer.
Surface& CurrentSurface(Device& device) {
    if (device.active) return *device.active->GetSurface();
    if (!device.host) device.host = std::make_shared<Surface>(0, 0);
    return *device.host;
}

} // namespace

TextureState::TextureState(int textureNumber, int textureContext, std::shared_ptr<Surface> image)
    : ObjectState(kKind, textureNumber, textureContext),
      surface(std::move(image)),
      parameters{{TextureParamWrappingS, TextureWrapClampToEdge},
                 {TextureParamWrappingT, TextureWrapClampToEdge},
                 {TextureParamFilteringMin, TextureFilterLinear},
                 {TextureParamFilteringMag, TextureFilterLinear}} {
    ::new (memory) RecordingTexture(*this);
    Device::Get().texturesByAddress[memory] = this;
}

TextureState::~TextureState() { Device::Get().texturesByAddress.erase(memory); }

bool TextureState::SetParameter(int id, int value) {
    bool const wrapping = id == TextureParamWrappingS || id == TextureParamWrappingT;
    bool const filtering = id == TextureParamFilteringMin || id == TextureParamFilteringMag;
    bool const wrapValue =
        value == TextureWrapRepeat || value == TextureWrapClampToEdge || value == TextureWrapMirroredRepeat;
    bool const filterValue = value == TextureFilterNearest || value == TextureFilterLinear;
    if ((wrapping && wrapValue) || (filtering && filterValue)) {
        parameters[id] = value;
        return true;
    }
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "ITextureObject::SetParameter refuses %d for %d", value,
                        id);
    return false;
}

std::size_t TextureState::Upload(Rect const& rect, void const* pixels, std::size_t stride) {
    Rect const inside =
        ClipBlock(rect.left, rect.top, rect.GetWidth(), rect.GetHeight(), surface->width, surface->height);
    if (!pixels || inside == Rect()) return 0;
    auto const rowBytes = static_cast<std::size_t>(inside.right - inside.left) * 4;
    auto const* const first = static_cast<unsigned char const*>(pixels);
    for (int y = inside.top; y < inside.bottom; ++y) {
        auto const row = static_cast<std::size_t>(static_cast<long long>(y) - rect.top);
        auto const column = static_cast<std::size_t>(static_cast<long long>(inside.left) - rect.left);
        std::memcpy(surface->At(inside.left, y), first + row * stride + column * 4, rowBytes);
    }
    return rowBytes * static_cast<std::size_t>(inside.bottom - inside.top);
}

RecordingTexture::~RecordingTexture() {
    Operation operation(mState, "Release");
    if (mState.released) return;
    mState.released = true;
    for (auto bound = operation->boundTextures.begin(); bound != operation->boundTextures.end();) {
        bound = bound->second == &mState ? operation->boundTextures.erase(bound) : std::next(bound);
    }
}

void RecordingTexture::operator delete(void* memory) {
    DeviceAccess const device;
    TextureState& state = *device->texturesByAddress.at(memory);
    ::new (memory) RecordingTexture(state);
    device->FreeIfUnused(state);
}

void RecordingTexture::SetLabel(char const* text) {
    char const* const label = text ? text : "";
    if (Operation operation{mState, "SetLabel", label}) mState.label = label;
}

char const* RecordingTexture::GetLabel() const {
    Operation operation(Operation::kQuiet, mState, "GetLabel");
    return mState.label.c_str();
}

void RecordingTexture::Bind(int unit) {
    if (Operation operation{mState, "Bind", unit}) {
        TextureState const*& bound = operation->boundTextures[unit];
        if (bound != &mState) ++operation->counters.textureSwitches;
        bound = &mState;
    }
}

void RecordingTexture::Replace(void const* pixels, int stride) {
    Operation operation(mState, "Replace", pixels ? "pixels" : "null", stride);
    if (!operation) return;
    Surface const& surface = *mState.surface;
    auto const bytes = static_cast<std::size_t>(stride > 0 ? stride : surface.width * 4);
    operation->counters.bytesUploaded +=
        mState.Upload(Rect(0, 0, surface.width, surface.height), pixels, bytes);
}

void RecordingTexture::Replace(Rect const& rect, void const* pixels, int stride) {
    Operation operation(mState, "Replace", rect.left, rect.top, rect.right, rect.bottom,
                        pixels ? "pixels" : "null", stride);
    if (!operation) return;
    auto const bytes =
        stride > 0 ? static_cast<std::size_t>(stride) : static_cast<std::size_t>(rect.GetWidth()) * 4;
    operation->counters.bytesUploaded += mState.Upload(rect, pixels, bytes);
}

void RecordingTexture::DrawToCurrent() {
    Operation operation(mState, "DrawToCurrent");
    if (!operation) return;
    CopyCorner(*mState.surface, CurrentSurface(Device::Get()));
    ++operation->counters.copies;
}

void RecordingTexture::SetParameter(int id, int value) {
    if (Operation operation{mState, "SetParameter", id, value}) mState.SetParameter(id, value);
}

void RecordingTexture::CopyFromRenderTarget() {
    Operation operation(mState, "CopyFromRenderTarget");
    if (!operation) return;
    CopyCorner(CurrentSurface(Device::Get()), *mState.surface);
    ++operation->counters.copies;
}

int RecordingTexture::GetWidth() const {
    Operation operation(Operation::kQuiet, mState, "GetWidth");
    return mState.surface->width;
}

int RecordingTexture::GetHeight() const {
    Operation operation(Operation::kQuiet, mState, "GetHeight");
    return mState.surface->height;
}

} // namespace Moka::Testing::detail
