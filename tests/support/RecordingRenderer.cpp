#include "tests/support/RecordingRenderer.h"

#include "moka/base/Check.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>

namespace Moka::Testing {

using namespace detail;

namespace {

using DeviceLock = std::lock_guard<std::recursive_mutex>;

TextureState const& StateOf(ITextureObject const* texture) {
    return static_cast<RecordingTexture const*>(texture)->GetState();
}

} // namespace

std::string ToString(RecordedCall const& call) {
    return call.object + " " + call.operation + (call.arguments.empty() ? "" : " " + call.arguments);
}

void RecordingRenderer::Reset() {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.FreeReleased();
    device.attached = false;
    ++device.context; // what is still alive is left behind
    device.deviceMaxTextureSize = kDefaultMaxTextureSize;
    device.counters = {};
    device.keepsRecords = true;
    device.calls.clear();
    device.events.clear();
    device.violations.clear();
    device.creations = 0;
    device.failingCreations.clear();
    device.failingKinds.clear();
    device.lastNumber.clear();
    device.ForgetState();
}

std::vector<RecordedCall> RecordingRenderer::GetCalls() {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    return device.calls;
}

std::vector<std::string> RecordingRenderer::TakeCalls() {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    std::vector<std::string> lines;
    for (RecordedCall const& call : device.calls) lines.push_back(ToString(call));
    device.calls.clear();
    return lines;
}

int RecordingRenderer::CountCalls(std::string const& operation) {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    return static_cast<int>(
        std::count_if(device.calls.begin(), device.calls.end(),
                      [&](RecordedCall const& call) { return call.operation == operation; }));
}

std::vector<std::string> RecordingRenderer::GetViolations() {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    return device.violations;
}

void RecordingRenderer::SetMaxTextureSize(int texels) {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.deviceMaxTextureSize = texels;
}

void RecordingRenderer::FailCreation(int n) {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.failingCreations.insert(device.creations + n);
}

void RecordingRenderer::FailCreations(ObjectKind kind) {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.failingKinds.insert(kind);
}

void RecordingRenderer::StopFailing() {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.failingCreations.clear();
    device.failingKinds.clear();
}

void RecordingRenderer::DeclareRenderThread() {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.renderThread = std::this_thread::get_id();
}

void RecordingRenderer::DeclareNoRenderThread() {
    Device& device = Device::Get();
    DeviceLock lock(device.mutex);
    device.renderThread = {};
}

std::string RecordingRenderer::NameOf(ITextureObject const* texture) {
    return texture ? StateOf(texture).GetName() : "none";
}

std::string RecordingRenderer::NameOf(IRenderTarget const* target) {
    return target ? static_cast<RecordingTarget const*>(target)->GetName() : "none";
}

std::string RecordingRenderer::NameOf(IDepthStencilBuffer const* buffer) {
    return buffer ? static_cast<RecordingBuffer const*>(buffer)->GetName() : "none";
}

std::string RecordingRenderer::NameOf(IShaderProgram const* program) {
    return program ? static_cast<RecordingProgram const*>(program)->GetName() : "none";
}

std::vector<unsigned char> RecordingRenderer::GetTexels(ITextureObject const* texture) {
    DeviceLock lock(Device::Get().mutex);
    return StateOf(texture).surface->pixels;
}

void RecordingRenderer::SetTexels(ITextureObject* texture, std::vector<unsigned char> const& pixels) {
    DeviceLock lock(Device::Get().mutex);
    Surface& surface = *StateOf(texture).surface;
    MOKA_CHECK(pixels.size() == surface.pixels.size(), "the pixels are not the texture's size");
    surface.pixels = pixels;
}

std::vector<unsigned char> RecordingRenderer::GetTexels(IRenderTarget const* target) {
    DeviceLock lock(Device::Get().mutex);
    return static_cast<RecordingTarget const*>(target)->GetSurface()->pixels;
}

int RecordingRenderer::GetParameter(ITextureObject const* texture, int id) {
    DeviceLock lock(Device::Get().mutex);
    auto const& parameters = StateOf(texture).parameters;
    auto const found = parameters.find(id);
    return found == parameters.end() ? -1 : found->second;
}

std::string RecordingRenderer::GetActiveTarget() {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    return NameOf(device.active);
}

std::string RecordingRenderer::GetCurrentProgram() {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    return NameOf(device.currentProgram);
}

std::string RecordingRenderer::GetParameter(IShaderProgram const* program, std::string const& name) {
    DeviceLock lock(Device::Get().mutex);
    auto const& values = static_cast<RecordingProgram const*>(program)->values;
    auto const found = values.find(name);
    return found == values.end() ? std::string() : Join(found->second);
}

std::string RecordingRenderer::GetBoundTexture(int unit) {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    auto const found = device.boundTextures.find(unit);
    return found == device.boundTextures.end() ? "none" : found->second->GetName();
}

std::string RecordingRenderer::GetAttachedBuffer(IRenderTarget const* target) {
    DeviceLock lock(Device::Get().mutex);
    return NameOf(static_cast<RecordingTarget const*>(target)->GetAttached());
}

int RecordingRenderer::CountLiveObjects() {
    Device const& device = Device::Get();
    DeviceLock lock(device.mutex);
    int count = 0;
    for (auto const& object : device.objects) {
        if (!object->released) ++count;
        if (object->kind != ObjectKind::Program) continue;
        count += static_cast<RecordingProgram const&>(*object).liveParameters;
    }
    return count;
}

} // namespace Moka::Testing
