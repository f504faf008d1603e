#include "moka/renderer/record/ProgramState.h"

#include "moka/renderer/record/Recorder.h"

#include <cstring>
#include <new>
#include <utility>

namespace Moka::detail {

ProgramState::ProgramState(std::shared_ptr<Recorder> const& recorder, char const* vertexSource,
                           char const* fragmentSource, char const* label)
    : mVertexSource(vertexSource ? vertexSource : ""),
      mFragmentSource(fragmentSource ? fragmentSource : ""),
      mLabel(label ? label : "") {
    if (recorder) BuildIn(recorder);
}

bool ProgramState::BuildIn(std::shared_ptr<Recorder> const& recorder) {
    if (mIsReleased) return false;
    if (mRecorder == recorder) return mName != 0;
    // Its former context is gone, and the device's program with it.
    Device& device = recorder->GetDevice();
    ProgramLayout layout;
    DeviceName const name =
        device.CreateProgram(mVertexSource.c_str(), mFragmentSource.c_str(), mLabel.c_str(), &layout);
    std::vector<unsigned char> values;
    try {
        values.resize(layout.size);
    } catch (std::bad_alloc const&) {
        device.DeleteProgram(name);
        throw;
    }
    CopyValues(layout, values);
    mRecorder = recorder;
    mName = name;
    mLayout = std::move(layout);
    mValues = std::move(values);
    listed = {};
    for (Handle& handle : mHandles) handle.uniform = Find(mLayout, handle.name);
    if (mName != 0) ++recorder->counters.programs;
    return mName != 0;
}

// The values set so far, to where the layout has them.
void ProgramState::CopyValues(ProgramLayout const& layout, std::vector<unsigned char>& values) const {
    for (ProgramLayout::Uniform const& old : mLayout.uniforms) {
        std::size_t const index = Find(layout, old.name);
        if (index == kNoUniform || layout.uniforms[index].type != old.type) continue;
        std::memcpy(&values[layout.uniforms[index].offset], &mValues[old.offset], old.size);
    }
}

void ProgramState::Release() {
    mIsReleased = true;
    DeviceName const name = std::exchange(mName, 0);
    if (mRecorder && name != 0) mRecorder->DropProgram(*this, name);
}

std::size_t ProgramState::AddHandle(char const* name) {
    std::string const text = name ? name : "";
    for (std::size_t i = 0; i < mHandles.size(); ++i) {
        if (mHandles[i].name == text) return i;
    }
    mHandles.push_back({text, Find(mLayout, text)});
    return mHandles.size() - 1;
}

std::size_t ProgramState::Find(ProgramLayout const& layout, std::string const& name) {
    for (std::size_t i = 0; i < layout.uniforms.size(); ++i) {
        if (layout.uniforms[i].name == name) return i;
    }
    return kNoUniform;
}

BindingType ProgramState::GetType(std::size_t handle) const {
    std::size_t const uniform = mHandles[handle].uniform;
    return uniform == kNoUniform ? BindingTypeUnknown : mLayout.uniforms[uniform].type;
}

bool ProgramState::Set(std::size_t handle, void const* value) {
    std::size_t const index = mHandles[handle].uniform;
    if (index == kNoUniform || mIsReleased) return false;
    ProgramLayout::Uniform const& uniform = mLayout.uniforms[index];
    // Callers hand over a bool, of which only one byte is there to be read.
    std::int32_t const flag = uniform.type == BindingTypeBool && *static_cast<bool const*>(value) ? 1 : 0;
    void const* const converted = uniform.type == BindingTypeBool ? &flag : value;
    unsigned char* const kept = &mValues[uniform.offset];
    std::size_t const size = uniform.size;
    if (std::memcmp(kept, converted, size) == 0) return false;
    std::memcpy(kept, converted, size);
    listed.isStale = true;
    return true;
}

int ProgramState::GetSamplerUnit(std::size_t sampler) const {
    std::int32_t unit = 0;
    std::memcpy(&unit, &mValues[mLayout.uniforms[mLayout.samplers[sampler]].offset], sizeof unit);
    return unit;
}

} // namespace Moka::detail
