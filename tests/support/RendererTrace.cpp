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
#include <thread>
#include <unordered_map>
#include <utility>

namespace Moka::Testing {

using namespace detail;

namespace {

struct TracedObject {
    ObjectKind kind;
    int number;
    int context; // the attachment it was made in; it is inert in any other
    bool released = false;
    std::map<std::string, TracedUniform> values; // of a program, those that were set

    std::string GetName() const;
};

std::string NameOf(ObjectKind kind) {
    static char const* const kNames[] = {"texture", "target",       "buffer",     "program", "graphics",
                                         "blend",   "depthstencil", "rasterizer", "renderer"};
    return kNames[static_cast<int>(kind)];
}

std::string TracedObject::GetName() const { return NameOf(kind) + " " + std::to_string(number); }

TracedUniform Read(BindingType type, void const* value) {
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

PipelineState Read(RequestedState& state) {
    return {state.GetBlend(), state.GetDepthStencil(), state.IsScissorEnabled(), state.GetScissorRect(),
            state.IsStencilClip()};
}

// Everything the trace knows, under one lock.
class Trace final : public RecorderObserver {
public:
    static Trace& Get() {
        static Trace& trace = *new Trace;
        return trace;
    }

    bool MayCreate(ObjectKind kind) override;
    void OnRequest(RendererRequest const& request) override;
    void OnValue(void const* program, char const* name, BindingType type, void const* value) override;
    void OnVertices(void const* graphics, int stream, void const* data, int count) override;
    void OnDraw(DrawRequest const& draw) override;
    void OnClear(ClearRequest const& clear) override;

    void BeginContext();
    void ForgetReleased();
    std::string NameOf(void const* object) const;
    TracedObject const* FindProgram(ProgramState const* state) const;
    template <class Event>
    std::vector<Event> GetEvents() const;

    std::mutex mutex;
    std::vector<TracedCall> calls;
    std::vector<TracedEvent> events;
    std::vector<std::string> violations;
    bool keepsRecords = true;
    int creations = 0;
    std::set<int> failingCreations;
    std::set<ObjectKind> failingKinds;
    int context = 0; // counts attachments
    std::thread::id renderThread;
    std::unordered_map<void const*, TracedObject> objects; // by the address that the caller has
    std::map<ObjectKind, int> lastNumber;
    std::map<int, void const*> boundTextures;
    int liveHandles = 0;

private:
    TracedObject* Find(void const* object);
    std::string ToText(RequestValue const& value) const;
    // Writes the request down and looks whether it may come now.
    void Note(ObjectKind kind, void const* object, char const* operation, std::string const& arguments);
    void Check(ObjectKind kind, void const* object, std::string const& operation);
    void End(void const* address, TracedObject& object);
    template <class Event>
    Event MakeEvent(RequestedState& state, RenderTarget const* target) const;
};

// The trace for a scope, under its lock.
class Access {
public:
    Trace* operator->() const { return &mTrace; }

private:
    Trace& mTrace = Trace::Get();
    std::lock_guard<std::mutex> const mLock{mTrace.mutex};
};

TracedObject* Trace::Find(void const* object) {
    auto const found = objects.find(object);
    return found == objects.end() ? nullptr : &found->second;
}

std::string Trace::NameOf(void const* object) const {
    auto const found = objects.find(object);
    return found == objects.end() ? "none" : found->second.GetName();
}

std::string Trace::ToText(RequestValue const& value) const {
    std::ostringstream text;
    switch (value.kind) {
    case RequestValue::Kind::Integer:
        text << value.integer;
        break;
    case RequestValue::Kind::Number:
        text << value.number;
        break;
    case RequestValue::Kind::Text:
        text << value.text;
        break;
    case RequestValue::Kind::Object:
        text << NameOf(value.object);
        break;
    }
    return text.str();
}

bool Trace::MayCreate(ObjectKind kind) {
    std::lock_guard const lock(mutex);
    bool const fails = failingCreations.erase(++creations) > 0;
    return !fails && failingKinds.count(kind) == 0;
}

void Trace::OnRequest(RendererRequest const& request) {
    std::lock_guard const lock(mutex);
    std::string const operation = request.operation;
    if (operation == "Create") {
        objects[request.object] = {request.kind, ++lastNumber[request.kind], context, false, {}};
    }
    std::string arguments;
    for (RequestValue const& value : request.values) {
        if (!keepsRecords) break;
        arguments += (arguments.empty() ? "" : " ") + ToText(value);
    }
    Note(request.kind, request.object, request.operation, arguments);
    if (operation == "GetParameter") ++liveHandles;
    if (operation == "ReleaseParameter") --liveHandles;
    if (operation == "Bind")
        boundTextures[static_cast<int>(request.values.begin()->integer)] = request.object;
    TracedObject* const object = Find(request.object);
    if (operation == "Release" && object && !object->released) End(request.object, *object);
}

void Trace::OnValue(void const* program, char const* name, BindingType type, void const* value) {
    std::lock_guard const lock(mutex);
    TracedUniform const uniform = keepsRecords ? Read(type, value) : TracedUniform{};
    Note(ObjectKind::kProgram, program, "SetParameter", std::string(name) + " " + uniform.text);
    TracedObject* const object = Find(program);
    if (keepsRecords && object) object->values[name] = uniform;
}

void Trace::OnVertices(void const* graphics, int stream, void const* data, int count) {
    OnRequest(
        {ObjectKind::kGraphicsObject, graphics, "SetVertices", {stream, data ? "data" : "null", count}});
}

void Trace::Note(ObjectKind kind, void const* object, char const* operation, std::string const& arguments) {
    TracedObject const* const known = Find(object);
    if (keepsRecords) {
        calls.push_back({known ? known->GetName() : Testing::NameOf(kind), operation, arguments});
    }
    Check(kind, object, operation);
}

void Trace::Check(ObjectKind kind, void const* address, std::string const& operation) {
    TracedObject const* const object = Find(address);
    auto const violate = [&](char const* what) {
        violations.push_back((object ? object->GetName() : Testing::NameOf(kind)) + " " + operation + what);
    };
    bool const isReleased = address && (!object || object->released);
    // A handle may outlive its program.
    if (isReleased && operation != "ReleaseParameter") return violate(" after its release");
    bool const isAttached = GetAttachedRecorder() != nullptr;
    if (!address && !isAttached) return violate(" without a context");
    bool const isInert = !isAttached || (address && (!object || object->context != context));
    if (!isInert && renderThread != std::this_thread::get_id()) violate(" outside the render thread");
}

void Trace::End(void const* address, TracedObject& object) {
    if (object.kind == ObjectKind::kDepthStencilBuffer) {
        auto const* const buffer = static_cast<IDepthStencilBuffer const*>(address);
        RenderTarget const* const target = static_cast<DepthStencilBuffer const*>(buffer)->GetTarget();
        if (target) violations.push_back(object.GetName() + " released while attached to " + NameOf(target));
    }
    for (auto bound = boundTextures.begin(); bound != boundTextures.end();) {
        bound = bound->second == address ? boundTextures.erase(bound) : std::next(bound);
    }
    object.released = true;
    if (!keepsRecords) objects.erase(address);
}

TracedObject const* Trace::FindProgram(ProgramState const* state) const {
    for (auto const& [address, object] : objects) {
        if (object.kind != ObjectKind::kProgram || object.released) continue;
        auto const* const program =
            static_cast<ShaderProgram const*>(static_cast<IShaderProgram const*>(address));
        if (&program->GetState() == state) return &object;
    }
    return nullptr;
}

template <class Event>
Event Trace::MakeEvent(RequestedState& state, RenderTarget const* target) const {
    Event event;
    event.state = Read(state);
    event.target = NameOf(target);
    event.buffer = NameOf(target ? target->GetDepthStencil() : nullptr);
    return event;
}

void Trace::OnDraw(DrawRequest const& request) {
    std::lock_guard const lock(mutex);
    if (!keepsRecords) return;
    auto draw = MakeEvent<TracedDraw>(request.state, GetAttachedRecorder()->GetActive());
    draw.graphics = NameOf(request.graphics);
    draw.primitive = request.primitive;
    std::ptrdiff_t const floats = std::ptrdiff_t{request.count} * request.floatsPerVertex;
    if (floats > 0) draw.vertices.assign(request.vertices, request.vertices + floats);
    draw.floatsPerVertex = request.floatsPerVertex;
    draw.first = request.first;
    draw.count = request.count;
    draw.shader = request.state.GetProgram()->GetLabel();
    if (TracedObject const* const program = FindProgram(request.state.GetProgram().get())) {
        draw.program = program->GetName();
        draw.uniforms = program->values;
    }
    for (auto const& [unit, texture] : boundTextures) draw.textures[unit] = NameOf(texture);
    events.emplace_back(std::move(draw));
}

void Trace::OnClear(ClearRequest const& request) {
    std::lock_guard const lock(mutex);
    if (!keepsRecords) return;
    auto clear = MakeEvent<TracedClear>(request.state, static_cast<RenderTarget const*>(request.target));
    clear.clearsColor = request.clearsColor;
    clear.color = request.color;
    clear.clearsDepth = request.clearsDepth;
    clear.depth = request.depth;
    clear.clearsStencil = request.clearsStencil;
    clear.stencil = request.stencil;
    events.emplace_back(std::move(clear));
}

void Trace::BeginContext() {
    std::lock_guard const lock(mutex);
    ++context;
    renderThread = std::this_thread::get_id();
    boundTextures.clear();
}

void Trace::ForgetReleased() {
    for (auto object = objects.begin(); object != objects.end();) {
        object = object->second.released ? objects.erase(object) : std::next(object);
    }
}

template <class Event>
std::vector<Event> Trace::GetEvents() const {
    std::vector<Event> result;
    for (TracedEvent const& event : events) {
        if (auto const* const found = std::get_if<Event>(&event)) result.push_back(*found);
    }
    return result;
}

// Before any thread uses the renderer.
[[maybe_unused]] bool const kObserves = (theObserver = &Trace::Get()) != nullptr;

void PutCapsIntoEffect() { RecorderCaps::Get().Set(TracingDevice::Caps(), {}); }

} // namespace

std::string ToString(TracedCall const& call) {
    return call.object + " " + call.operation + (call.arguments.empty() ? "" : " " + call.arguments);
}

void RendererTrace::Reset() {
    RendererFactory::DetachContext();
    TracingDevice::Caps() = TracingDevice::MakeCaps();
    PutCapsIntoEffect();
    Access const trace;
    trace->ForgetReleased();
    trace->keepsRecords = true;
    trace->calls.clear();
    trace->events.clear();
    trace->violations.clear();
    trace->creations = 0;
    trace->failingCreations.clear();
    trace->failingKinds.clear();
    trace->lastNumber.clear();
    trace->boundTextures.clear();
}

std::vector<TracedCall> RendererTrace::GetCalls() { return Access()->calls; }

std::vector<std::string> RendererTrace::TakeCalls() {
    Access const trace;
    std::vector<std::string> lines;
    for (TracedCall const& call : trace->calls) lines.push_back(ToString(call));
    trace->calls.clear();
    return lines;
}

int RendererTrace::CountCalls(std::string const& operation) {
    std::vector<TracedCall> const calls = GetCalls();
    return static_cast<int>(std::count_if(
        calls.begin(), calls.end(), [&](TracedCall const& call) { return call.operation == operation; }));
}

std::vector<TracedDraw> RendererTrace::GetDraws() { return Access()->GetEvents<TracedDraw>(); }

std::vector<TracedClear> RendererTrace::GetClears() { return Access()->GetEvents<TracedClear>(); }

std::vector<TracedEvent> RendererTrace::GetEvents() { return Access()->events; }

std::vector<TracedEvent> RendererTrace::TakeEvents() { return std::exchange(Access()->events, {}); }

PipelineState RendererTrace::GetState() {
    Recorder* const recorder = GetAttachedRecorder();
    return recorder ? Read(*recorder->requested) : PipelineState{};
}

void RendererTrace::KeepRecords(bool keep) {
    Access const trace;
    trace->keepsRecords = keep;
    if (keep) return;
    trace->calls = {};
    trace->events = {};
    trace->ForgetReleased();
}

std::vector<std::string> RendererTrace::GetViolations() { return Access()->violations; }

void RendererTrace::SetMaxTextureSize(int texels) {
    TracingDevice::Caps().maxTextureSize = texels;
    PutCapsIntoEffect();
}

void RendererTrace::SetGpuName(char const* name) {
    TracingDevice::Caps().renderer = name;
    PutCapsIntoEffect();
}

void RendererTrace::FailCreation(int n) {
    Access const trace;
    trace->failingCreations.insert(trace->creations + n);
}

void RendererTrace::FailCreations(ObjectKind kind) { Access()->failingKinds.insert(kind); }

void RendererTrace::StopFailing() {
    Access const trace;
    trace->failingCreations.clear();
    trace->failingKinds.clear();
}

void RendererTrace::DeclareRenderThread() { Access()->renderThread = std::this_thread::get_id(); }

void RendererTrace::DeclareNoRenderThread() { Access()->renderThread = {}; }

std::string RendererTrace::NameOf(void const* object) { return Access()->NameOf(object); }

std::vector<unsigned char> RendererTrace::GetTexels(ITextureObject const* texture) {
    TextureStorage const& storage = *static_cast<TextureObject const*>(texture)->GetStorage();
    Recorder& recorder = *storage.GetRecorder();
    if (!recorder.IsAttached()) return {};
    recorder.Flush();
    return static_cast<TracingDevice&>(recorder.GetDevice()).GetTexels(storage.GetName());
}

int RendererTrace::GetParameter(ITextureObject const* texture, int id) {
    Sampling const& sampling = static_cast<TextureObject const*>(texture)->GetSampling();
    switch (id) {
    case TextureParamWrappingS:
        return sampling.wrapS;
    case TextureParamWrappingT:
        return sampling.wrapT;
    case TextureParamFilteringMin:
        return sampling.minFilter;
    case TextureParamFilteringMag:
        return sampling.magFilter;
    default:
        return -1;
    }
}

std::string RendererTrace::GetActiveTarget() {
    Recorder const* const recorder = GetAttachedRecorder();
    return NameOf(recorder ? recorder->GetActive() : nullptr);
}

std::string RendererTrace::GetCurrentProgram() {
    Recorder const* const recorder = GetAttachedRecorder();
    Access const trace;
    TracedObject const* const program =
        recorder ? trace->FindProgram(recorder->requested->GetProgram().get()) : nullptr;
    return program ? program->GetName() : "none";
}

std::string RendererTrace::GetBoundTexture(int unit) {
    Access const trace;
    auto const found = trace->boundTextures.find(unit);
    return found == trace->boundTextures.end() ? "none" : trace->NameOf(found->second);
}

std::string RendererTrace::GetParameter(IShaderProgram const* program, std::string const& name) {
    Access const trace;
    auto const& values = trace->objects.at(program).values;
    auto const found = values.find(name);
    return found == values.end() ? std::string() : found->second.text;
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
    Testing::Trace::Get().BeginContext();
    return std::make_unique<Testing::TracingDevice>(counters);
}

} // namespace Moka::detail
