// Vertices, and the draws made of them.
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <iterator>

namespace Moka::Testing::detail {
namespace {

struct VertexRange {
    int first;
    int count;
};

// What of [first, first + count) is there; -1 asks for all that are left. Wide arithmetic: a hostile count
// must not wrap round.
VertexRange ClipRange(int first, int count, int available) {
    long long const from = first;
    long long const to = count == -1 ? available : from + std::max(count, 0);
    auto const begin = std::clamp<long long>(from, 0, available);
    auto const end = std::clamp<long long>(to, begin, available);
    return {static_cast<int>(begin), static_cast<int>(end - begin)};
}

class RecordingGraphics final : public ObjectState, public IGraphicsObject {
public:
    static constexpr ObjectKind kKind = ObjectKind::GraphicsObject;

    RecordingGraphics(int number_, int context_, PrimitiveType primitive, int floatsPerVertex)
        : ObjectState(kKind, number_, context_), mPrimitive(primitive), mFloatsPerVertex(floatsPerVertex) {}

    void SetVertices(int stream, void const* data, int count) override;
    bool Draw(int first, int count, int instances) override;
    void Release() override {
        Operation operation(*this, "Release");
        operation->EndObject(*this);
    }

private:
    RecordedDraw Describe(Device const& device, VertexRange range) const;

    PrimitiveType const mPrimitive;
    int const mFloatsPerVertex;
    std::vector<float> mVertices;
};

void RecordingGraphics::SetVertices(int stream, void const* data, int count) {
    Operation operation(*this, "SetVertices", stream, data ? "data" : "null", count);
    if (!operation) return;
    mVertices.clear();
    if (stream != 0 || count < 0 || (!data && count > 0)) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "IGraphicsObject::SetVertices refuses %d vertices for stream %d", count, stream);
        return;
    }
    if (count == 0) return;
    auto const* const numbers = static_cast<float const*>(data);
    mVertices.assign(numbers, numbers + static_cast<std::ptrdiff_t>(count) * mFloatsPerVertex);
    operation->counters.vertexBytes += mVertices.size() * sizeof(float);
}

bool RecordingGraphics::Draw(int first, int count, int instances) {
    Operation operation(*this, "Draw", first, count, instances);
    if (!operation) return false;
    ++operation->counters.drawRequests;
    if (instances != 1) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "IGraphicsObject::Draw refuses %d instances",
                            instances);
        return false;
    }
    if (!operation->currentProgram) return false;
    int const available = static_cast<int>(mVertices.size()) / mFloatsPerVertex;
    VertexRange const range = ClipRange(first, count, available);
    if (range.count > 0) ++operation->counters.draws;
    Device& device = Device::Get();
    if (device.keepsRecords) device.events.emplace_back(Describe(device, range));
    return true;
}

RecordedDraw RecordingGraphics::Describe(Device const& device, VertexRange range) const {
    RecordedDraw draw;
    draw.state = device.state;
    draw.target = RecordingRenderer::NameOf(device.active);
    draw.buffer = RecordingRenderer::NameOf(device.active ? device.active->GetAttached() : nullptr);
    draw.graphics = GetName();
    draw.primitive = mPrimitive;
    auto const begin = mVertices.begin() + static_cast<std::ptrdiff_t>(range.first) * mFloatsPerVertex;
    draw.vertices.assign(begin, begin + static_cast<std::ptrdiff_t>(range.count) * mFloatsPerVertex);
    draw.floatsPerVertex = mFloatsPerVertex;
    draw.first = range.first;
    draw.count = range.count;
    draw.program = device.currentProgram->GetName();
    draw.shader = device.currentProgram->GetLabel();
    for (auto const& [name, value] : device.currentProgram->values) {
        draw.uniforms[name] = {Join(value), value.GetNumbers()};
    }
    for (auto const& [unit, texture] : device.boundTextures) draw.textures[unit] = texture->GetName();
    return draw;
}

} // namespace
} // namespace Moka::Testing::detail

namespace Moka {

using namespace Testing;
using namespace Testing::detail;

IGraphicsObject* RendererFactory::CreateGraphicsObject(int streams, PrimitiveType primitive,
                                                       VertexDescriptor const* descriptor, int indices,
                                                       int instanceStreams) {
    DeviceAccess const device;
    int const floats = descriptor ? descriptor->GetFloatCount() : 0;
    std::string const arguments = Join(static_cast<int>(primitive), floats);
    if (!device->MayCreate(ObjectKind::GraphicsObject, "CreateGraphicsObject", arguments)) return nullptr;
    if (streams != 1 || indices != 0 || instanceStreams != 0 || floats == 0) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "RendererFactory::CreateGraphicsObject refuses %d streams, %d floats, %d indices, "
            "%d instance streams",
            streams, floats, indices, instanceStreams);
        return nullptr;
    }
    auto* const graphics = device->Add<RecordingGraphics>(primitive, floats);
    device->Record(graphics->GetName(), "Create", arguments);
    return graphics;
}

} // namespace Moka
