#include "moka/renderer/record/StateObjects.h"

#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/Recorder.h"

#include <utility>

namespace Moka::detail {
namespace {

constexpr ObjectKind KindOf(BlendStateDescriptor const&) { return ObjectKind::kBlendState; }
constexpr ObjectKind KindOf(DepthStencilStateDescriptor const&) { return ObjectKind::kDepthStencilState; }

void ApplyTo(Recorder& recorder, BlendStateDescriptor const& descriptor) {
    recorder.requested->SetBlend(descriptor);
    recorder.CommitAtOnce([&](StateCommit& commit) { commit.blend = &descriptor; });
}

void ApplyTo(Recorder& recorder, DepthStencilStateDescriptor const& descriptor) {
    recorder.requested->SetDepthStencil(descriptor);
    // Not mDescriptor: while a stencil clip is on, the requested state may differ.
    recorder.CommitAtOnce(
        [&](StateCommit& commit) { commit.depthStencil = &recorder.requested->GetDepthStencil(); });
}

// Begins a request and returns the attached recorder. Returns null if no context is attached.
Recorder* BeginRequest() {
    Recorder* const recorder = GetAttachedRecorder();
    return recorder && recorder->Begin() ? recorder : nullptr;
}

constexpr ObjectKind kRasterizer = ObjectKind::kRasterizer;

} // namespace

template <class Interface, class Descriptor>
StateObject<Interface, Descriptor>::StateObject(std::shared_ptr<Recorder> recorder,
                                                Descriptor const& descriptor)
    : mRecorder(std::move(recorder)), mDescriptor(descriptor) {
    ++mRecorder->counters.stateObjects;
}

template <class Interface, class Descriptor>
StateObject<Interface, Descriptor>::~StateObject() {
    --mRecorder->counters.stateObjects;
}

template <class Interface, class Descriptor>
void StateObject<Interface, Descriptor>::SetDescriptor(Descriptor const& descriptor) {
    if (theObserver) Observe(KindOf(descriptor), this, "SetDescriptor");
    mDescriptor = descriptor;
}

template <class Interface, class Descriptor>
void StateObject<Interface, Descriptor>::Apply() {
    if (theObserver) Observe(KindOf(mDescriptor), this, "Apply");
    if (mRecorder->Begin()) ApplyTo(*mRecorder, mDescriptor);
}

template <class Interface, class Descriptor>
void StateObject<Interface, Descriptor>::Release() {
    Observe(KindOf(mDescriptor), this, "Release");
    delete this;
}

template class StateObject<IBlendStateObject, BlendStateDescriptor>;
template class StateObject<IDepthStencilState, DepthStencilStateDescriptor>;

bool RasterizerState::IsScissorEnabled() {
    Recorder* const recorder = BeginRequest();
    return recorder && recorder->requested->IsScissorEnabled();
}

void RasterizerState::SetScissorEnabled(bool on) {
    if (theObserver) Observe(kRasterizer, nullptr, "SetScissorEnabled", on);
    Recorder* const recorder = BeginRequest();
    if (!recorder) return;
    recorder->requested->SetScissorEnabled(on);
    recorder->CommitAtOnce([&](StateCommit& commit) { commit.scissorTest = &on; });
}

ScissorRect RasterizerState::GetScissorRect() {
    Recorder* const recorder = BeginRequest();
    return recorder ? recorder->requested->GetScissorRect() : ScissorRect{};
}

void RasterizerState::SetScissorRect(ScissorRect const& rect) {
    Observe(kRasterizer, nullptr, "SetScissorRect", rect.x, rect.y, rect.width, rect.height);
    Recorder* const recorder = BeginRequest();
    if (!recorder) return;
    recorder->requested->SetScissorRect(rect);
    recorder->CommitAtOnce(
        [&](StateCommit& commit) { commit.scissorRect = &recorder->requested->GetScissorRect(); });
}

} // namespace Moka::detail
