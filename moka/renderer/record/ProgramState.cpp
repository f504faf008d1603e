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
    // The former context and its device program no longer exist.
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
    for (Handle& handle : mHandles) handle = Resolve(handle.name, mLayout);
    if (mName != 0) ++recorder->counters.programs;
    return mName != 0;
}

// Copies the values set so far to their places in the new layout.
void ProgramState::CopyValues(ProgramLayout const& layout, std::vector<unsigned char>& values) const {
    for (ProgramLayout::Uniform const& old : mLayout.uniforms) {
        ProgramLayout::Uniform const* const now = Find(layout, old.name);
        if (!now || now->type != old.type) continue;
        std::memcpy(&values[now->offset], &mValues[old.offset], old.size);
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
    mHandles.push_back(Resolve(text, mLayout));
    return mHandles.size() - 1;
}

ProgramState::Handle ProgramState::Resolve(std::string const& name, ProgramLayout const& layout) {
    ProgramLayout::Uniform const* const uniform = Find(layout, name);
    return {name, uniform ? uniform->type : BindingTypeUnknown, uniform ? uniform->offset : 0};
}

ProgramLayout::Uniform const* ProgramState::Find(ProgramLayout const& layout, std::string const& name) {
    for (ProgramLayout::Uniform const& uniform : layout.uniforms) {
        if (uniform.name == name) return &uniform;
    }
    return nullptr;
}

BindingType ProgramState::GetType(std::size_t handle) const { return mHandles[handle].type; }

bool ProgramState::Set(std::size_t handle, void const* value) {
    switch (GetType(handle)) {
    case BindingTypeBool:
        return SetAs<BindingTypeBool>(handle, value);
    case BindingTypeMatrix4:
        return SetAs<BindingTypeMatrix4>(handle, value);
    case BindingTypeVector2:
        return SetAs<BindingTypeVector2>(handle, value);
    case BindingTypeVector4:
        return SetAs<BindingTypeVector4>(handle, value);
    case BindingTypeFloat:
        return SetAs<BindingTypeFloat>(handle, value);
    case BindingTypeInt:
        return SetAs<BindingTypeInt>(handle, value);
    case BindingTypeTextureUnit:
        return SetAs<BindingTypeTextureUnit>(handle, value);
    case BindingTypeUnknown:
        break;
    }
    return false;
}

int ProgramState::GetSamplerUnit(std::size_t sampler) const {
    std::int32_t unit = 0;
    std::memcpy(&unit, &mValues[mLayout.uniforms[mLayout.samplers[sampler]].offset], sizeof unit);
    return unit;
}

} // namespace Moka::detail
