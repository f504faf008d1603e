#include "tests/support/RendererTrace.h"

#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/Caps.h"
#include "moka/renderer/record/DepthStencilBuffer.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/record/RenderTarget.h"
#include "moka/renderer/record/ShaderProgram.h"
#include "moka/renderer/record/TextureObject.h"
#include "moka/renderer/record/TextureStorage.h"
#include "tests/support/TracingDevice.h"

#include <algorithm>
#include <mutex>
#include <set>
#include <sstream>
#include <string_view>
#include <thread>
#include <unordered_map>
#include <utility>

namespace Moka::Testing {

using namespace detail;

namespace {

std::string NameOfKind(ObjectKind kind) {
    static char const* const kNames[] = {"texture", "target",       "buffer",     "program", "graphics",
                                         "blend",   "depthstencil", "rasterizer", "renderer"};
    return kNames[static_cast<int>(kind)];
}

struct TracedObject {
    ObjectKind kind;
    int number;
    int context; // the attachment it was made in; it is inert in any other
    bool released = false;
    std::map<std::string, TracedUniform> values; // of a program, those that were set

    std::string GetName() const { return NameOfKind(kind) + " " + std::to_string(number); }
};

TracedUniform ReadUniform(BindingType type, void const* value) {
    TracedUniform result;
    if (type == BindingTypeBool) {
        result.numbers = {*static_cast<bool const*>(value) ? 1.0f : 0.0f};
    } else if (type == BindingTypeInt || type == BindingTypeTextureUnit) {
        result.numbers = {static_cast<float>(*static_cast<int const*>(value))};
    } else {
        auto const* const floats = static_cast<float const*>(value);
        result.numbers.assign(floats, floats + GetValueSize(type) / sizeof(float));
    }
    std::ostringstream text;
    for (float const number : result.numbers) text << (text.tellp() > 0 ? " " : "") << number;
    result.text = result.numbers.empty() ? "ignored" : text.str();
    return result;
}

PipelineState ReadState(RequestedState& state) {
    return {state.GetBlend(), state.GetDepthStencil(), state.IsScissorEnabled(), state.GetScissorRect(),
            state.IsStencilClip()};
}

// What a reset forgets.
struct Notes {
    bool keepsRecords = true;
    std::vector<std::string> calls;
    std::vector<TracedEvent> events;
    std::vector<std::string> violations;
    int creations = 0;
    std::set<int> failingCreations;
    std::set<ObjectKind> failingKinds;
    std::map<ObjectKind, int> lastNumber;
};

// Everything that is known, under one lock: an operation that the renderer calls takes it, the others are for its
// owner.
class TraceObserver final : public RecorderObserver {
public:
    static TraceObserver& Get() {
        static TraceObserver& observer = *new TraceObserver;
        return observer;
    }

    bool MayCreate(ObjectKind kind) override {
        std::lock_guard const lock(mutex);
        bool const fails = notes.failingCreations.erase(++notes.creations) > 0;
        return !fails && notes.failingKinds.count(kind) == 0;
    }

    void OnRequest(RendererRequest const& request) override {
        std::lock_guard const lock(mutex);
        std::string_view const operation = request.operation;
        if (operation == "Create") {
            objects[request.object] = {request.kind, ++notes.lastNumber[request.kind], context, false, {}};
        }
        std::ostringstream arguments;
        if (notes.keepsRecords) {
            for (RequestValue const& value : request.values) Write(value, arguments);
        }
        Note(request.kind, request.object, request.operation, arguments.str());
        if (operation == "GetParameter") ++liveHandles;
        if (operation == "ReleaseParameter") --liveHandles;
        if (operation == "Release") End(request.object);
    }

    void OnValue(void const* program, char const* name, BindingType type, void const* value) override {
        std::lock_guard const lock(mutex);
        TracedUniform const uniform = notes.keepsRecords ? ReadUniform(type, value) : TracedUniform{};
        Note(ObjectKind::kProgram, program, "SetParameter", std::string(name) + " " + uniform.text);
        TracedObject* const object = Find(program);
        if (notes.keepsRecords && object) object->values[name] = uniform;
    }

    void OnVertices(void const* graphics, int stream, void const* data, int count) override {
        char const* const given = data ? "data" : "null";
        OnRequest({ObjectKind::kGraphicsObject, graphics, "SetVertices", {stream, given, count}});
    }

    void OnDraw(DrawRequest const& request) override {
        std::lock_guard const lock(mutex);
        if (!notes.keepsRecords) return;
        auto draw = MakeEvent<TracedDraw>(request.state, GetAttachedRecorder()->GetActive());
        std::ptrdiff_t const floats = std::ptrdiff_t{request.count} * request.floatsPerVertex;
        if (floats > 0) draw.vertices.assign(request.vertices, request.vertices + floats);
        draw.first = request.first;
        draw.count = request.count;
        draw.shader = request.state.GetProgram()->GetLabel();
        void const* const program = FindProgram(request.state);
        if (program) draw.uniforms = objects[program].values;
        notes.events.emplace_back(std::move(draw));
    }

    void OnClear(ClearRequest const& request) override {
        std::lock_guard const lock(mutex);
        if (!notes.keepsRecords) return;
        auto clear = MakeEvent<TracedClear>(request.state, static_cast<RenderTarget const*>(request.target));
        clear.color = request.color;
        notes.events.emplace_back(std::move(clear));
    }

    std::string NameOf(void const* object) const {
        auto const found = objects.find(object);
        return found == objects.end() ? "none" : found->second.GetName();
    }

    // The current one.
    void const* FindProgram(RequestedState const& state) const {
        for (auto const& [address, object] : objects) {
            if (object.kind != ObjectKind::kProgram || object.released) continue;
            auto const* const program = static_cast<IShaderProgram const*>(address);
            if (&static_cast<ShaderProgram const*>(program)->GetState() == state.GetProgram().get()) {
                return address;
            }
        }
        return nullptr;
    }

    void ForgetReleased() {
        for (auto object = objects.begin(); object != objects.end();) {
            object = object->second.released ? objects.erase(object) : std::next(object);
        }
    }

    std::mutex mutex;
    Notes notes;
    std::unordered_map<void const*, TracedObject> objects; // by the address that the caller has
    int liveHandles = 0;
    int context = 0; // counts attachments
    std::thread::id renderThread;

private:
    TracedObject* Find(void const* object) {
        auto const found = objects.find(object);
        return found == objects.end() ? nullptr : &found->second;
    }

    void Write(RequestValue const& value, std::ostringstream& text) const {
        if (text.tellp() > 0) text << ' ';
        if (value.kind == RequestValue::Kind::Integer) text << value.integer;
        if (value.kind == RequestValue::Kind::Number) text << value.number;
        if (value.kind == RequestValue::Kind::Text) text << value.text;
        if (value.kind == RequestValue::Kind::Object) text << NameOf(value.object);
    }

    // Writes the request down and looks whether it may come now.
    void Note(ObjectKind kind, void const* address, std::string_view operation,
              std::string const& arguments) {
        TracedObject const* const object = Find(address);
        std::string const call =
            (object ? object->GetName() : NameOfKind(kind)) + " " + std::string(operation);
        if (notes.keepsRecords) notes.calls.push_back(call + (arguments.empty() ? "" : " " + arguments));
        auto const violate = [&](char const* what) { notes.violations.push_back(call + what); };
        bool const isReleased = address && (!object || object->released);
        // A handle may outlive its program.
        if (isReleased && operation != "ReleaseParameter") return violate(" after its release");
        bool const isAttached = GetAttachedRecorder() != nullptr;
        if (!address && !isAttached) return violate(" without a context");
        bool const isInert = !isAttached || (address && (!object || object->context != context));
        if (!isInert && renderThread != std::this_thread::get_id()) violate(" outside the render thread");
    }

    void End(void const* address) {
        TracedObject* const object = Find(address);
        if (!object || object->released) return;
        if (object->kind == ObjectKind::kDepthStencilBuffer) {
            auto const* const buffer = static_cast<IDepthStencilBuffer const*>(address);
            void const* const target = static_cast<DepthStencilBuffer const*>(buffer)->GetTarget();
            if (target) {
                notes.violations.push_back(object->GetName() + " released while attached to " +
                                           NameOf(target));
            }
        }
        object->released = true;
        if (!notes.keepsRecords) objects.erase(address);
    }

    template <class Event>
    Event MakeEvent(RequestedState& state, RenderTarget const* target) const {
        Event event;
        event.state = ReadState(state);
        event.target = NameOf(target);
        return event;
    }
};

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

void RendererTrace::Reset() {
    RendererFactory::DetachContext();
    SetCaps(TracingDevice::MakeCaps());
    Access const trace;
    trace->ForgetReleased();
    trace->notes = {};
}

std::vector<std::string> RendererTrace::TakeCalls() { return std::exchange(Access()->notes.calls, {}); }
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
    return Access()->NameOf(recorder ? recorder->GetActive() : nullptr);
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
    return std::make_unique<Testing::TracingDevice>(counters);
}

} // namespace Moka::detail
