#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace Moka::Testing::detail {
namespace {

// As GL converts: clamped, rounded to the nearest; not a number counts as 0.
unsigned char ToByte(float value) {
    if (!(value > 0)) return 0;
    return static_cast<unsigned char>(std::lround(std::min(value, 1.0f) * 255.0f));
}

void Fill(Surface& surface, Rect const& rect, unsigned char const (&color)[4]) {
    for (int y = rect.top; y < rect.bottom; ++y) {
        for (int x = rect.left; x < rect.right; ++x) std::memcpy(surface.At(x, y), color, 4);
    }
}

} // namespace

void RecordingTarget::Activate() {
    Operation operation(*this, "Activate");
    if (!operation || operation->active == this) return;
    operation->active = this;
    ++operation->counters.frameBufferSwitches;
}

void RecordingTarget::Deactivate(bool discardColor, bool discardDepthStencil) {
    Operation operation(*this, "Deactivate", discardColor, discardDepthStencil);
    if (!operation || operation->active != this) return;
    operation->active = nullptr;
    ++operation->counters.frameBufferSwitches;
    // A driver may leave anything; a loud colour shows who reads it all the same.
    if (discardColor) Fill(*mSurface, Clip({0, 0, mWidth, mHeight}), {0xFF, 0x00, 0xFF, 0xFF});
}

void RecordingTarget::ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) {
    Operation operation(*this, "ReadPixels", x, y, width, height, destination.rowLength, destination.skipRows,
                        destination.skipPixels);
    Rect const inside = Clip({x, y, width, height});
    if (!operation || !destination.pixels || inside == Rect()) return;
    auto const pitch =
        static_cast<std::ptrdiff_t>(destination.rowLength > 0 ? destination.rowLength : width) * 4;
    auto const bytes = static_cast<std::size_t>(inside.right - inside.left) * 4;
    auto* const pixels = static_cast<unsigned char*>(destination.pixels);
    for (int row = inside.top; row < inside.bottom; ++row) {
        std::ptrdiff_t const down = std::ptrdiff_t{row} - y + destination.skipRows;
        std::ptrdiff_t const in = std::ptrdiff_t{inside.left} - x + destination.skipPixels;
        std::memcpy(pixels + down * pitch + in * 4, mSurface->At(inside.left, row), bytes);
        operation->counters.bytesReadBack += bytes;
    }
}

void RecordingTarget::Release() {
    Operation operation(*this, "Release");
    mAttached = nullptr;
    if (operation->active == this) operation->active = nullptr;
    operation->EndObject(*this);
}

Rect RecordingTarget::Clip(ScissorRect const& rect) const {
    return ClipBlock(rect.x, rect.y, rect.width, rect.height, std::min(mWidth, mSurface->width),
                     std::min(mHeight, mSurface->height));
}

RecordedClear RecordingTarget::DescribeClear(PipelineState const& state) const {
    RecordedClear clear;
    clear.state = state;
    clear.target = GetName();
    clear.buffer = RecordingRenderer::NameOf(mAttached);
    return clear;
}

void RecordingTarget::ClearColor(float r, float g, float b, float a) {
    Operation operation(*this, "ClearColor", r, g, b, a);
    if (!operation) return;
    PipelineState const& state = operation->state;
    ScissorRect const rect = state.scissorOn ? state.scissor : ScissorRect{0, 0, mWidth, mHeight};
    Fill(*mSurface, Clip(rect), {ToByte(r), ToByte(g), ToByte(b), ToByte(a)});
    ++operation->counters.clears;
    if (!operation->keepsRecords) return;
    RecordedClear clear = DescribeClear(state);
    clear.clearsColor = true;
    clear.color = {r, g, b, a};
    operation->events.emplace_back(std::move(clear));
}

void RecordingTarget::AttachDepthStencil(IDepthStencilBuffer* buffer) {
    auto* const attached = static_cast<RecordingBuffer*>(buffer);
    Operation operation(*this, "AttachDepthStencil", RecordingRenderer::NameOf(buffer));
    if (!operation) return;
    mAttached = nullptr;
    if (!attached) return;
    if (attached->released) {
        operation->Violate(attached->GetName() + " attached after its release");
    } else if (attached->width != mWidth || attached->height != mHeight) {
        operation->Violate(attached->GetName() + " attached to " + GetName() + " of another size");
    } else {
        mAttached = attached;
    }
}

void RecordingTarget::DetachDepthStencil() {
    if (Operation operation{*this, "DetachDepthStencil", RecordingRenderer::NameOf(mAttached)}) {
        mAttached = nullptr;
    }
}

void RecordingTarget::ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) {
    Operation operation(*this, "ClearDepthStencil", clearDepth, depth, clearStencil, stencil);
    if (!operation) return;
    if (mAttached) ++operation->counters.clears;
    if (!operation->keepsRecords) return;
    RecordedClear clear = DescribeClear(operation->state);
    clear.clearsDepth = clearDepth;
    clear.depth = depth;
    clear.clearsStencil = clearStencil;
    clear.stencil = stencil;
    operation->events.emplace_back(std::move(clear));
}

void RecordingBuffer::Release() {
    Operation operation(*this, "Release");
    if (released) return;
    for (auto const& object : operation->objects) {
        if (object->kind != ObjectKind::RenderTarget) continue;
        auto& target = static_cast<RecordingTarget&>(*object);
        if (target.GetAttached() != this) continue;
        operation->Violate(GetName() + " released while attached to " + target.GetName());
        target.Forget(this);
    }
    operation->EndObject(*this);
}

} // namespace Moka::Testing::detail
