#include "tests/support/RendererTrace.h"

#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/Caps.h"
#include "moka/renderer/record/TextureObject.h"
#include "moka/renderer/record/TextureStorage.h"
#include "tests/support/TraceObserver.h"
#include "tests/support/TracingDevice.h"

#include <algorithm>
#include <utility>

namespace Moka::Testing {

namespace {

// The trace for a scope, under its lock.
class Access {
public:
    TraceObserver* operator->() const { return &mTrace; }

private:
    TraceObserver& mTrace = TraceObserver::Get();
    std::lock_guard<std::mutex> const mLock{mTrace.mutex};
};

template <class Event>
std::vector<Event> GetEventsOf() {
    std::vector<Event> result;
    Access const trace;
    for (TracedEvent const& event : trace->notes.events) {
        if (auto const* const found = std::get_if<Event>(&event)) result.push_back(*found);
    }
    return result;
}

void SetCaps(DeviceCaps const& caps) {
    TracingDevice::Caps() = caps;
    RecorderCaps::Get().Set(caps, {});
}

// Before any thread uses the renderer.
[[maybe_unused]] bool const kObserves = (theObserver = &TraceObserver::Get()) != nullptr;

} // namespace

std::string ToString(TracedCall const& call) {
    return call.object + " " + call.operation + (call.arguments.empty() ? "" : " " + call.arguments);
}

void RendererTrace::Reset() {
    RendererFactory::DetachContext();
    SetCaps(TracingDevice::MakeCaps());
    Access const trace;
    trace->ForgetReleased();
    trace->notes = {};
}

std::vector<TracedCall> RendererTrace::GetCalls() { return Access()->notes.calls; }

std::vector<std::string> RendererTrace::TakeCalls() {
    Access const trace;
    std::vector<std::string> lines;
    for (TracedCall const& call : std::exchange(trace->notes.calls, {})) lines.push_back(ToString(call));
    return lines;
}

int RendererTrace::CountCalls(std::string const& operation) {
    std::vector<TracedCall> const calls = GetCalls();
    return static_cast<int>(std::count_if(
        calls.begin(), calls.end(), [&](TracedCall const& call) { return call.operation == operation; }));
}

std::vector<TracedDraw> RendererTrace::GetDraws() { return GetEventsOf<TracedDraw>(); }
std::vector<TracedClear> RendererTrace::GetClears() { return GetEventsOf<TracedClear>(); }
std::vector<TracedEvent> RendererTrace::TakeEvents() { return std::exchange(Access()->notes.events, {}); }

PipelineState RendererTrace::GetState() {
    Recorder* const recorder = GetAttachedRecorder();
    return recorder ? ReadState(*recorder->requested) : PipelineState{};
}

void RendererTrace::KeepRecords(bool keep) {
    Access const trace;
    trace->notes.keepsRecords = keep;
    if (keep) return;
    trace->notes.calls = {};
    trace->notes.events = {};
    trace->ForgetReleased();
}

std::vector<std::string> RendererTrace::GetViolations() { return Access()->notes.violations; }

void RendererTrace::SetMaxTextureSize(int texels) {
    DeviceCaps caps = TracingDevice::Caps();
    caps.maxTextureSize = texels;
    SetCaps(caps);
}

void RendererTrace::SetGpuName(char const* name) {
    DeviceCaps caps = TracingDevice::Caps();
    caps.renderer = name;
    SetCaps(caps);
}

void RendererTrace::FailCreation(int n) {
    Access const trace;
    trace->notes.failingCreations.insert(trace->notes.creations + n);
}

void RendererTrace::FailCreations(ObjectKind kind) { Access()->notes.failingKinds.insert(kind); }

void RendererTrace::StopFailing() {
    Access const trace;
    trace->notes.failingCreations.clear();
    trace->notes.failingKinds.clear();
}

void RendererTrace::DeclareRenderThread() { Access()->renderThread = std::this_thread::get_id(); }
void RendererTrace::DeclareNoRenderThread() { Access()->renderThread = {}; }

std::string RendererTrace::NameOf(void const* object) { return Access()->NameOf(object); }

std::vector<unsigned char> RendererTrace::GetTexels(ITextureObject const* texture) {
    TextureStorage const& storage = *static_cast<TextureObject const*>(texture)->GetStorage();
    Recorder& recorder = *storage.GetRecorder();
    recorder.Flush();
    return static_cast<TracingDevice&>(recorder.GetDevice()).GetTexels(storage.GetName());
}

int RendererTrace::GetParameter(ITextureObject const* texture, int id) {
    Sampling const& sampling = static_cast<TextureObject const*>(texture)->GetSampling();
    int const byId[] = {sampling.wrapS, sampling.wrapT, -1, -1, sampling.minFilter, sampling.magFilter};
    return id >= 0 && id < 6 ? byId[id] : -1;
}

std::string RendererTrace::GetActiveTarget() {
    Recorder const* const recorder = GetAttachedRecorder();
    return NameOf(recorder ? recorder->GetActive() : nullptr);
}

int RendererTrace::CountLiveObjects() {
    Access const trace;
    auto const live = std::count_if(trace->objects.begin(), trace->objects.end(),
                                    [](auto const& object) { return !object.second.released; });
    return static_cast<int>(live) + trace->liveHandles;
}

} // namespace Moka::Testing

namespace Moka::detail {

std::unique_ptr<Device> MakeDevice(RendererProcLoader, Counters& counters) {
    Testing::Access const trace;
    ++trace->context;
    trace->renderThread = std::this_thread::get_id();
    trace->notes.boundTextures.clear();
    return std::make_unique<Testing::TracingDevice>(counters);
}

} // namespace Moka::detail
