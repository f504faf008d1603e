#include "moka/renderer/device/GlslDeclarations.h"
#include "tests/support/RecordingObjects.h"

#include <algorithm>
#include <utility>

namespace Moka::Testing::detail {
namespace {

BindingType ToBindingType(std::string const& glslType) {
    static std::map<std::string, BindingType> const kTypes = {{"bool", BindingTypeBool},
                                                              {"mat4", BindingTypeMatrix4},
                                                              {"vec2", BindingTypeVector2},
                                                              {"vec4", BindingTypeVector4},
                                                              {"float", BindingTypeFloat},
                                                              {"int", BindingTypeInt},
                                                              {"sampler2D", BindingTypeTextureUnit}};
    auto const found = kTypes.find(glslType);
    return found == kTypes.end() ? BindingTypeUnknown : found->second;
}

// 0 for the types that are not made of floats.
std::size_t CountFloats(BindingType type) {
    switch (type) {
    case BindingTypeMatrix4:
        return 16;
    case BindingTypeVector2:
        return 2;
    case BindingTypeVector4:
        return 4;
    case BindingTypeFloat:
        return 1;
    case BindingTypeUnknown:
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        break;
    }
    return 0;
}

class RecordingParameter final : public IParameterBinding {
public:
    RecordingParameter(RecordingProgram& program, std::string name, BindingType type)
        : IParameterBinding(type), mProgram(program), mName(std::move(name)) {
        ++mProgram.liveParameters;
    }

    // No operation of the program, which may have been released before.
    ~RecordingParameter() override {
        DeviceAccess const device;
        if (device->keepsRecords) device->Record(mProgram.GetName(), "ReleaseParameter", mName);
        if (device->attached && mProgram.context == device->context) {
            device->CheckThread(mProgram.GetName(), "ReleaseParameter");
        }
        --mProgram.liveParameters;
        device->FreeIfUnused(mProgram);
    }

    void Set(void const* value) override {
        UniformValue const next = UniformValue::Read(GetType(), value);
        Operation operation(mProgram, "SetParameter", mName, next);
        if (!operation) return;
        auto const [known, isNew] = mProgram.values.try_emplace(mName, next);
        if (!isNew && known->second == next) return;
        known->second = next;
        if (next.type != BindingTypeUnknown) ++operation->counters.uniformChanges;
    }

private:
    RecordingProgram& mProgram; // kept until the last of its handles has gone
    std::string const mName;
};

} // namespace

UniformValue UniformValue::Read(BindingType type, void const* value) {
    UniformValue result;
    result.type = type;
    if (type == BindingTypeBool) {
        result.integer = *static_cast<bool const*>(value) ? 1 : 0;
    } else if (type == BindingTypeInt || type == BindingTypeTextureUnit) {
        result.integer = *static_cast<int const*>(value);
    } else {
        std::copy_n(static_cast<float const*>(value), CountFloats(type), result.floats.begin());
    }
    return result;
}

std::vector<float> UniformValue::GetNumbers() const {
    if (type == BindingTypeUnknown) return {};
    std::size_t const count = CountFloats(type);
    if (count == 0) return {static_cast<float>(integer)};
    return std::vector<float>(floats.data(), floats.data() + count);
}

std::ostream& operator<<(std::ostream& text, UniformValue const& value) {
    if (value.type == BindingTypeUnknown) return text << "ignored";
    std::size_t const count = CountFloats(value.type);
    if (count == 0) return text << value.integer;
    for (std::size_t i = 0; i < count; ++i) text << (i > 0 ? " " : "") << value.floats[i];
    return text;
}

RecordingProgram::RecordingProgram(int number_, int context_, char const* vertexSource,
                                   char const* fragmentSource, char const* label)
    : ObjectState(kKind, number_, context_), mLabel(label) {
    for (char const* source : {vertexSource, fragmentSource}) {
        for (auto const& uniform : Moka::detail::FindGlslDeclarations(source, {"uniform"})) {
            mTypes[uniform.name] = ToBindingType(uniform.type);
        }
    }
}

void RecordingProgram::MakeCurrent() {
    Operation operation(*this, "MakeCurrent");
    if (!operation || operation->currentProgram == this) return;
    operation->currentProgram = this;
    ++operation->counters.programSwitches;
}

void RecordingProgram::Release() {
    Operation operation(*this, "Release");
    if (operation->currentProgram == this) operation->currentProgram = nullptr;
    operation->EndObject(*this);
}

IParameterBinding* RecordingProgram::GetParameter(char const* name) {
    auto const found = mTypes.find(name);
    BindingType const type = found == mTypes.end() ? BindingTypeUnknown : found->second;
    Operation operation(*this, "GetParameter", name, static_cast<int>(type));
    return new RecordingParameter(*this, name, type);
}

} // namespace Moka::Testing::detail
