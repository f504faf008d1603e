#include "moka/renderer/gles/GlPrograms.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/device/Counters.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlTables.h"

#include <cstring>
#include <utility>

namespace Moka::detail {

void GlPrograms::Add(GLuint name, GlslStages sources, char const* label, ProgramLayout* layout) {
    Program& program = mPrograms[name];
    program.layout.draws = layout->draws;
    GLint count = 0;
    Gl::GetProgramiv(name, GL_ACTIVE_UNIFORMS, &count);
    for (GLint i = 0; layout->draws && i < count; ++i) {
        AddUniform(name, static_cast<GLuint>(i), label, program);
    }
    program.sent.resize(program.layout.size); // zero, as GL sets uniforms when it links
    *layout = program.layout;
    if (!layout->draws) return;
    program.variants =
        std::make_unique<GlVariants>(mState, mDebug, label, std::move(sources), program.layout);
}

void GlPrograms::AddUniform(GLuint name, GLuint index, char const* label, Program& program) {
    GLchar text[256] = {};
    GLint elements = 0;
    GLenum glType = GL_NONE;
    Gl::GetActiveUniform(name, index, sizeof text, nullptr, &elements, &glType, text);
    BindingType const type = ToBindingType(glType);
    if (type == BindingTypeUnknown || elements != 1 || !program.layout.HasRoomFor(type)) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s: the uniform %s cannot be set: GL type 0x%04x, %d elements; single bool, "
                            "int, float, vec2, vec4, mat4 and up to %d sampler2D can",
                            label, text, glType, elements, kMaxSamplers);
        return;
    }
    program.layout.Add(text, type);
    program.locations.push_back(Gl::GetUniformLocation(name, text));
}

void GlPrograms::Delete(GLuint name) {
    // GL keeps a deleted program alive while it is current.
    if (mState.program.Get() == name) mState.program.Set(0);
    Gl::DeleteProgram(name);
    mPrograms.erase(name);
    mLast = nullptr;
    mLastName = 0;
}

void GlPrograms::Apply(GLuint name, unsigned char const* values) {
    if (mState.program.Set(name)) ++mState.counters.programSwitches;
    Program* const found = Find(name);
    if (!found || found->sent.empty()) return;
    Program& program = *found;
    if (std::memcmp(program.sent.data(), values, program.sent.size()) == 0) return;
    for (std::size_t i = 0; i < program.layout.uniforms.size(); ++i) Send(program, i, values);
}

GlPrograms::Program* GlPrograms::Find(GLuint name) {
    if (mLastName != name) {
        auto const found = mPrograms.find(name);
        mLast = found == mPrograms.end() ? nullptr : &found->second;
        mLastName = name;
    }
    return mLast;
}

GlVariants* GlPrograms::GetVariants(GLuint name) {
    Program const* const program = Find(name);
    return program ? program->variants.get() : nullptr;
}

void GlPrograms::Send(Program& program, std::size_t index, unsigned char const* values) {
    ProgramLayout::Uniform const& uniform = program.layout.uniforms[index];
    unsigned char* const sent = &program.sent[uniform.offset];
    if (std::memcmp(sent, values + uniform.offset, uniform.size) == 0) return;
    std::memcpy(sent, values + uniform.offset, uniform.size);
    // Every value starts at a multiple of four bytes.
    void const* const aligned = sent;
    auto const* const floats = static_cast<GLfloat const*>(aligned);
    GLint const location = program.locations[index];
    switch (uniform.type) {
    case BindingTypeUnknown:
        break;
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        Gl::Uniform1iv(location, 1, static_cast<GLint const*>(aligned));
        break;
    case BindingTypeFloat:
        Gl::Uniform1fv(location, 1, floats);
        break;
    case BindingTypeVector2:
        Gl::Uniform2fv(location, 1, floats);
        break;
    case BindingTypeVector4:
        Gl::Uniform4fv(location, 1, floats);
        break;
    case BindingTypeMatrix4:
        Gl::UniformMatrix4fv(location, 1, GL_FALSE, floats);
        break;
    }
    ++mState.counters.uniformChanges;
}

} // namespace Moka::detail
