// Blend, depth-stencil and rasterizer state: what is applied is in force in Device::state.
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RecordingDevice.h"

#include <algorithm>

namespace Moka::Testing::detail {
namespace {

int ToNumber(BlendingFactor factor) { return static_cast<int>(factor); }

class RecordingBlendState final : public ObjectState, public IBlendStateObject {
public:
    static constexpr ObjectKind kKind = ObjectKind::BlendState;

    RecordingBlendState(int number_, int context_, BlendStateDescriptor const& descriptor)
        : ObjectState(kKind, number_, context_), mDescriptor(descriptor) {}

    void SetDescriptor(BlendStateDescriptor const& descriptor) override {
        auto const& color = descriptor.GetColorEquation();
        auto const& alpha = descriptor.GetAlphaEquation();
        Operation operation(*this, "SetDescriptor", descriptor.IsBlending(), descriptor.IsColorWrite(),
                            ToNumber(color.source), ToNumber(color.destination), ToNumber(alpha.source),
                            ToNumber(alpha.destination));
        if (operation) mDescriptor = descriptor;
    }

    void Apply() override {
        Operation operation(*this, "Apply");
        if (!operation || operation->state.blend == mDescriptor) return;
        operation->state.blend = mDescriptor;
        ++operation->counters.blendChanges;
    }

    void Release() override {
        Operation operation(*this, "Release");
        operation->EndObject(*this);
    }

private:
    BlendStateDescriptor mDescriptor;
};

// The stencil test of one state with the depth test of another.
DepthStencilStateDescriptor KeepStencil(DepthStencilStateDescriptor const& kept,
                                        DepthStencilStateDescriptor const& applied) {
    DepthStencilStateDescriptor result(applied.IsDepth(), kept.IsStencil());
    result.SetStencilFunction(kept.GetComparison(), kept.GetReference(), kept.GetReadMask(),
                              kept.GetWriteMask());
    result.SetStencilOperation(kept.GetStencilFail(), kept.GetDepthFail(), kept.GetPass());
    return result;
}

class RecordingDepthStencilState final : public ObjectState, public IDepthStencilState {
public:
    static constexpr ObjectKind kKind = ObjectKind::DepthStencilState;

    RecordingDepthStencilState(int number_, int context_, DepthStencilStateDescriptor const& descriptor)
        : ObjectState(kKind, number_, context_), mDescriptor(descriptor) {}

    void SetDescriptor(DepthStencilStateDescriptor const& d) override {
        Operation operation(*this, "SetDescriptor", d.IsDepth(), d.IsStencil(), d.GetComparison(),
                            d.GetReference(), d.GetReadMask(), d.GetWriteMask(), d.GetStencilFail(),
                            d.GetDepthFail(), d.GetPass());
        if (operation) mDescriptor = d;
    }

    void Apply() override {
        Operation operation(*this, "Apply");
        if (!operation) return;
        PipelineState& state = operation->state;
        bool const keepsStencil = state.stencilClip && !mDescriptor.IsStencil();
        DepthStencilStateDescriptor const next =
            keepsStencil ? KeepStencil(state.depthStencil, mDescriptor) : mDescriptor;
        if (state.depthStencil == next) return;
        state.depthStencil = next;
        ++operation->counters.depthStencilChanges;
    }

    void Release() override {
        Operation operation(*this, "Release");
        operation->EndObject(*this);
    }

private:
    DepthStencilStateDescriptor mDescriptor;
};

class RecordingRasterizer final : public IRasterizerState {
public:
    bool IsScissorEnabled() override {
        DeviceAccess const device;
        return Ask("IsScissorEnabled").scissorOn;
    }

    void SetScissorEnabled(bool on) override {
        DeviceAccess const device;
        device->RecordStatic("rasterizer", "SetScissorEnabled", on);
        if (device->state.scissorOn == on) return;
        device->state.scissorOn = on;
        ++device->counters.scissorChanges;
    }

    ScissorRect GetScissorRect() override {
        DeviceAccess const device;
        return Ask("GetScissorRect").scissor;
    }

    void SetScissorRect(ScissorRect const& rect) override {
        DeviceAccess const device;
        device->RecordStatic("rasterizer", "SetScissorRect", rect.x, rect.y, rect.width, rect.height);
        ScissorRect const next = {rect.x, rect.y, std::max(rect.width, 0), std::max(rect.height, 0)};
        if (device->state.scissor == next) return;
        device->state.scissor = next;
        ++device->counters.scissorChanges;
    }

private:
    static PipelineState const& Ask(char const* question) {
        Device& device = Device::Get();
        device.CheckThread("rasterizer", question);
        return device.state;
    }
};

RecordingRasterizer theRasterizer;

} // namespace
} // namespace Moka::Testing::detail

namespace Moka {

using namespace Testing;
using namespace Testing::detail;

IBlendStateObject* RendererFactory::CreateBlendStateObject(BlendStateDescriptor const& descriptor) {
    DeviceAccess const device;
    std::string const arguments = Join(descriptor.IsBlending(), descriptor.IsColorWrite());
    if (!device->MayCreate(ObjectKind::BlendState, "CreateBlendStateObject", arguments)) return nullptr;
    auto* const state = device->Add<RecordingBlendState>(descriptor);
    device->Record(state->GetName(), "Create", arguments);
    return state;
}

IDepthStencilState* RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor const& descriptor) {
    DeviceAccess const device;
    std::string const arguments = Join(descriptor.IsDepth(), descriptor.IsStencil());
    if (!device->MayCreate(ObjectKind::DepthStencilState, "CreateDepthStencilState", arguments)) {
        return nullptr;
    }
    auto* const state = device->Add<RecordingDepthStencilState>(descriptor);
    device->Record(state->GetName(), "Create", arguments);
    return state;
}

IRasterizerState* RendererFactory::GetRasterizerState() { return &theRasterizer; }

void RendererFactory::SetStencilClip(bool on) {
    DeviceAccess const device;
    device->RecordStatic("renderer", "SetStencilClip", on);
    device->state.stencilClip = on;
}

} // namespace Moka
