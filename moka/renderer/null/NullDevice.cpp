#include "moka/renderer/null/NullDevice.h"

#include "moka/renderer/device/GlslDeclarations.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <string_view>
#include <utility>

namespace Moka::detail {
namespace {

// Converts as GL does: clamps and rounds to nearest. NaN becomes 0.
unsigned char ToByte(float value) {
    if (!(value > 0)) return 0;
    return static_cast<unsigned char>(std::lround(std::min(value, 1.0f) * 255.0f));
}

BindingType ToBindingType(std::string_view type) {
    static constexpr std::pair<std::string_view, BindingType> kTypes[] = {
        {"bool", BindingTypeBool},
        {"mat4", BindingTypeMatrix4},
        {"vec2", BindingTypeVector2},
        {"vec4", BindingTypeVector4},
        {"float", BindingTypeFloat},
        {"int", BindingTypeInt},
        {"sampler2D", BindingTypeTextureUnit}};
    for (auto const& [name, value] : kTypes) {
        if (name == type) return value;
    }
    return BindingTypeUnknown;
}

void AddUniforms(char const* source, ProgramLayout* layout) {
    for (GlslDeclaration const& uniform : FindGlslDeclarations(source, {"uniform"})) {
        bool const isKnown = std::any_of(layout->uniforms.begin(), layout->uniforms.end(),
                                         [&](auto const& known) { return known.name == uniform.name; });
        BindingType const type = ToBindingType(uniform.type);
        if (isKnown || type == BindingTypeUnknown || !layout->HasRoomFor(type)) continue;
        layout->Add(uniform.name.c_str(), type);
    }
}

} // namespace

void NullImage::Resize(int w, int h) {
    NullImage larger;
    larger.width = w;
    larger.height = h;
    larger.pixels.resize(static_cast<std::size_t>(w) * static_cast<std::size_t>(h) * kBytesPerPixel);
    std::size_t const rowBytes = static_cast<std::size_t>(std::min(w, width)) * kBytesPerPixel;
    for (int y = 0; y < std::min(h, height) && rowBytes > 0; ++y) {
        std::memcpy(larger.At(0, y), At(0, y), rowBytes);
    }
    *this = std::move(larger);
}

unsigned char* NullImage::At(int x, int y) {
    std::size_t const pixel =
        static_cast<std::size_t>(y) * static_cast<std::size_t>(width) + static_cast<std::size_t>(x);
    return pixels.data() + pixel * kBytesPerPixel;
}

void NullImage::Fill(ScissorRect const& rect, std::array<float, 4> const& color) {
    PixelBlock const inside = PixelBlock::Clip(rect.x, rect.y, rect.width, rect.height, width, height);
    unsigned char const bytes[] = {ToByte(color[0]), ToByte(color[1]), ToByte(color[2]), ToByte(color[3])};
    for (int y = inside.y; y < inside.y + inside.height; ++y) {
        for (int x = inside.x; x < inside.x + inside.width; ++x) std::memcpy(At(x, y), bytes, sizeof bytes);
    }
}

DeviceCaps NullDevice::GetCaps() const {
    DeviceCaps caps;
    caps.maxTextureSize = 8192;
    caps.samplingUnits = 16;
    caps.vendor = "Moka";
    caps.renderer = "Null";
    caps.version = "OpenGL ES 3.0 without a driver";
    return caps;
}

DeviceName NullDevice::CreateTexture(int width, int height) {
    mTextures[++mLastName].Resize(width, height);
    return mLastName;
}

void NullDevice::DeleteTexture(DeviceName texture) { mTextures.erase(texture); }

void NullDevice::Upload(DeviceName texture, PixelBlock const& block, void const* pixels,
                        std::int64_t stride) {
    auto const* row = static_cast<unsigned char const*>(pixels) + block.skippedRows * stride +
                      block.skippedPixels * kBytesPerPixel;
    for (int y = 0; y < block.height; ++y, row += stride) {
        std::memcpy(mTextures[texture].At(block.x, block.y + y), row,
                    static_cast<std::size_t>(block.width) * kBytesPerPixel);
    }
}

void NullDevice::ReadPixels(TargetRef const& target, PixelBlock const& block, void* pixels, int rowLength) {
    NullImage& image = GetImage(target);
    std::ptrdiff_t const stride = std::ptrdiff_t{rowLength} * kBytesPerPixel;
    auto* row = static_cast<unsigned char*>(pixels) + block.skippedRows * stride +
                block.skippedPixels * kBytesPerPixel;
    for (int y = 0; y < block.height; ++y, row += stride) {
        std::memcpy(row, image.At(block.x, block.y + y),
                    static_cast<std::size_t>(block.width) * kBytesPerPixel);
    }
}

DeviceName NullDevice::CreateFrameBuffer(DeviceName, int, int) { return ++mLastName; }

void NullDevice::DeleteFrameBuffer(DeviceName) {}

DeviceName NullDevice::CreateDepthStencil(int, int) { return ++mLastName; }

void NullDevice::DeleteDepthStencil(DeviceName) {}

DeviceName NullDevice::CreateProgram(char const* vertexSource, char const* fragmentSource, char const*,
                                     ProgramLayout* layout) {
    AddUniforms(vertexSource, layout);
    AddUniforms(fragmentSource, layout);
    layout->draws = true;
    return ++mLastName;
}

void NullDevice::DeleteProgram(DeviceName) {}

int NullDevice::AddVertexFormat(VertexDescriptor const& descriptor) {
    auto const found = std::find(mFormats.begin(), mFormats.end(), descriptor);
    auto const index = static_cast<int>(found - mFormats.begin());
    if (found == mFormats.end()) mFormats.push_back(descriptor);
    return index;
}

void NullDevice::Submit(DrawList const& list) {
    for (Command const& command : list.commands) {
        std::visit([this](auto const& one) { Execute(one); }, command);
    }
    mCounters.vertexBytes += list.vertices.size() * sizeof(float);
}

void NullDevice::Commit(StateCommit const& commit) {
    if (commit.scissorTest) mScissor.on = *commit.scissorTest;
    if (commit.scissorRect) mScissor.rect = *commit.scissorRect;
}

NullImage& NullDevice::GetImage(TargetRef const& target) {
    if (target.texture != 0) return mTextures[target.texture];
    if (target.width > mHost.width || target.height > mHost.height) {
        mHost.Resize(std::max(target.width, mHost.width), std::max(target.height, mHost.height));
    }
    return mHost;
}

void NullDevice::Execute(Run const&) { ++mCounters.draws; }

void NullDevice::Execute(ColorClear const& clear) {
    TargetRef const& target = clear.target;
    ScissorRect const all{0, 0, target.width, target.height};
    GetImage(target).Fill(clear.scissor.on ? clear.scissor.rect : all, clear.color);
    ++mCounters.clears;
}

void NullDevice::Execute(DepthStencilClear const&) { ++mCounters.clears; }

// New textures are already zero.
void NullDevice::Execute(TextureClear const&) {}

void NullDevice::Execute(Discard const&) {}

void NullDevice::Execute(TargetCopy const& copy) { Copy(copy.from, copy.to, copy.width, copy.height); }

void NullDevice::Execute(TextureDraw const& draw) {
    Copy(draw.from, draw.to, draw.from.width, draw.from.height);
}

// Nothing samples the levels, so they are not generated.
void NullDevice::Execute(MipmapUpdate const&) { ++mCounters.mipmapUpdates; }

void NullDevice::Copy(TargetRef const& from, TargetRef const& to, int width, int height) {
    NullImage& source = GetImage(from);
    NullImage& destination = GetImage(to);
    int const w = std::min({width, source.width, destination.width});
    int const h = std::min({height, source.height, destination.height});
    for (int y = 0; y < h && w > 0; ++y) {
        std::memmove(destination.At(0, y), source.At(0, y), static_cast<std::size_t>(w) * kBytesPerPixel);
    }
    ++mCounters.copies;
}

} // namespace Moka::detail
