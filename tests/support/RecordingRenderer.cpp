#include "tests/support/RecordingRenderer.h"

#include "tests/support/RecordingObjects.h"

#include <algorithm>

namespace Moka::Testing {

using namespace detail;

namespace {

TextureState const& StateOf(ITextureObject const* texture) {
    return static_cast<RecordingTexture const*>(texture)->GetState();
}

} // namespace

std::string ToString(RecordedCall const& call) {
    return call.object + " " + call.operation + (call.arguments.empty() ? "" : " " + call.arguments);
}

void RecordingRenderer::Reset() {
    DeviceAccess const device;
    device->FreeReleased();
    device->attached = false;
    ++device->context; // what is still alive is left behind
    device->deviceMaxTextureSize = kDefaultMaxTextureSize;
    device->gpuName = kDefaultGpuName;
    device->counters = {};
    device->keepsRecords = true;
    device->calls.clear();
    device->events.clear();
    device->violations.clear();
    device->creations = 0;
    device->failingCreations.clear();
    device->failingKinds.clear();
    device->lastNumber.clear();
    device->ForgetState();
}

std::vector<RecordedCall> RecordingRenderer::GetCalls() {
    DeviceAccess const device;
    return device->calls;
}

std::vector<std::string> RecordingRenderer::TakeCalls() {
    DeviceAccess const device;
    std::vector<std::string> lines;
    for (RecordedCall const& call : device->calls) lines.push_back(ToString(call));
    device->calls.clear();
    return lines;
}

int RecordingRenderer::CountCalls(std::string const& operation) {
    DeviceAccess const device;
    return static_cast<int>(
        std::count_if(device->calls.begin(), device->calls.end(),
                      [&](RecordedCall const& call) { return call.operation == operation; }));
}

std::vector<std::string> RecordingRenderer::GetViolations() {
    DeviceAccess const device;
    return device->violations;
}

void RecordingRenderer::SetGpuName(std::string const& name) {
    DeviceAccess const device;
    device->gpuName = name;
}

void RecordingRenderer::SetMaxTextureSize(int texels) {
    DeviceAccess const device;
    device->deviceMaxTextureSize = texels;
}

void RecordingRenderer::FailCreation(int n) {
    DeviceAccess const device;
    device->failingCreations.insert(device->creations + n);
}

void RecordingRenderer::FailCreations(ObjectKind kind) {
    DeviceAccess const device;
    device->failingKinds.insert(kind);
}

void RecordingRenderer::StopFailing() {
    DeviceAccess const device;
    device->failingCreations.clear();
    device->failingKinds.clear();
}

void RecordingRenderer::DeclareRenderThread() {
    DeviceAccess const device;
    device->renderThread = std::this_thread::get_id();
}

void RecordingRenderer::DeclareNoRenderThread() {
    DeviceAccess const device;
    device->renderThread = {};
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
    DeviceAccess const device;
    return StateOf(texture).surface->pixels;
}

int RecordingRenderer::GetParameter(ITextureObject const* texture, int id) {
    DeviceAccess const device;
    auto const& parameters = StateOf(texture).parameters;
    auto const found = parameters.find(id);
    return found == parameters.end() ? -1 : found->second;
}

std::string RecordingRenderer::GetActiveTarget() {
    DeviceAccess const device;
    return NameOf(device->active);
}

std::string RecordingRenderer::GetCurrentProgram() {
    DeviceAccess const device;
    return NameOf(device->currentProgram);
}

std::string RecordingRenderer::GetParameter(IShaderProgram const* program, std::string const& name) {
    DeviceAccess const device;
    auto const& values = static_cast<RecordingProgram const*>(program)->values;
    auto const found = values.find(name);
    return found == values.end() ? std::string() : Join(found->second);
}

std::string RecordingRenderer::GetBoundTexture(int unit) {
    DeviceAccess const device;
    auto const found = device->boundTextures.find(unit);
    return found == device->boundTextures.end() ? "none" : found->second->GetName();
}

int RecordingRenderer::CountLiveObjects() {
    DeviceAccess const device;
    int count = 0;
    for (auto const& object : device->objects) {
        if (!object->released) ++count;
        if (object->kind != ObjectKind::Program) continue;
        count += static_cast<RecordingProgram const&>(*object).liveParameters;
    }
    return count;
}

} // namespace Moka::Testing
