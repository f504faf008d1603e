#include "moka/renderer/gles/GlslDeclarations.h"
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

std::string JoinFloats(void const* value, int count) {
    std::ostringstream text;
    auto const* const numbers = static_cast<float const*>(value);
    for (int i = 0; i < count; ++i) text << (i > 0 ? " " : "") << numbers[i];
    return text.str();
}

std::string ToText(BindingType type, void const* value) {
    switch (type) {
    case BindingTypeUnknown:
        return "ignored";
    case BindingTypeBool:
        return Join(*static_cast<bool const*>(value));
    case BindingTypeMatrix4:
        return JoinFloats(value, 16);
    case BindingTypeVector2:
        return JoinFloats(value, 2);
    case BindingTypeVector4:
        return JoinFloats(value, 4);
    case BindingTypeFloat:
        return JoinFloats(value, 1);
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        return Join(*static_cast<int const*>(value));
    }
    return {};
}

class RecordingParameter final : public IParameterBinding {
public:
    RecordingParameter(RecordingProgram& program, std::string name, BindingType type)
        : IParameterBinding(type), mProgram(program), mName(std::move(name)) {
        ++mProgram.liveParameters;
    }

    // No operation of the program, which may have been released before.
    ~RecordingParameter() override {
        Device& device = Device::Get();
        std::lock_guard<std::recursive_mutex> const lock(device.mutex);
        device.Record(mProgram.GetName(), "ReleaseParameter", mName);
        if (device.attached && mProgram.context == device.context) {
            device.CheckThread(mProgram.GetName(), "ReleaseParameter");
        }
        --mProgram.liveParameters;
    }

    void Set(void const* value) override {
        std::string const text = ToText(GetType(), value);
        Operation operation(mProgram, "SetParameter", Join(mName, text));
        if (operation) mProgram.values[mName] = text;
    }

private:
    RecordingProgram& mProgram; // kept until the last of its handles has gone
    std::string const mName;
};

} // namespace

RecordingProgram::RecordingProgram(int number_, int context_, char const* vertexSource,
                                   char const* fragmentSource)
    : ObjectState(kKind, number_, context_) {
    for (char const* source : {vertexSource, fragmentSource}) {
        for (auto const& uniform : Moka::detail::FindGlslDeclarations(source, {"uniform"})) {
            mTypes[uniform.name] = ToBindingType(uniform.type);
        }
    }
}

void RecordingProgram::MakeCurrent() {
    Operation operation(*this, "MakeCurrent");
    if (operation) operation->currentProgram = this;
}

void RecordingProgram::Release() {
    Operation operation(*this, "Release");
    if (released) return;
    released = true;
    if (operation->currentProgram == this) operation->currentProgram = nullptr;
}

IParameterBinding* RecordingProgram::GetParameter(char const* name) {
    auto const found = mTypes.find(name);
    BindingType const type = found == mTypes.end() ? BindingTypeUnknown : found->second;
    Operation operation(*this, "GetParameter", Join(name, static_cast<int>(type)));
    return new RecordingParameter(*this, name, type);
}

} // namespace Moka::Testing::detail
