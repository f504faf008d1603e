#include "moka/renderer/gles/GlUniforms.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlTables.h"

#include <cstring>
#include <utility>

namespace Moka::detail {
namespace {

std::size_t GetSize(BindingType type) {
    switch (type) {
    case BindingTypeUnknown:
        return 0;
    case BindingTypeMatrix4:
        return 16 * sizeof(GLfloat);
    case BindingTypeVector2:
        return 2 * sizeof(GLfloat);
    case BindingTypeVector4:
        return 4 * sizeof(GLfloat);
    case BindingTypeFloat:
        return sizeof(GLfloat);
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        return sizeof(GLint);
    }
    return 0;
}

// Whether the kept value, of size bytes, changes.
bool Store(unsigned char* kept, void const* value, std::size_t size) {
    if (std::memcmp(kept, value, size) == 0) return false;
    std::memcpy(kept, value, size);
    return true;
}

} // namespace

GlUniforms::GlUniforms(std::shared_ptr<GlContext> context, GLuint program, char const* name)
    : mContext(std::move(context)), mProgram(program) {
    if (mProgram == 0) return;
    GLint count = 0;
    glGetProgramiv(mProgram, GL_ACTIVE_UNIFORMS, &count);
    mUniforms.reserve(static_cast<std::size_t>(count));
    for (GLint i = 0; i < count; ++i) AddUniform(static_cast<GLuint>(i), name);
}

void GlUniforms::AddUniform(GLuint index, char const* programName) {
    GLchar name[256] = {};
    GLint elements = 0;
    GLenum glType = GL_NONE;
    glGetActiveUniform(mProgram, index, sizeof name, nullptr, &elements, &glType, name);
    BindingType const type = ToBindingType(glType);
    if (type == BindingTypeUnknown || elements != 1) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s: the uniform %s cannot be set: GL type 0x%04x, %d elements; single bool, "
                            "int, float, vec2, vec4, mat4 and sampler2D can",
                            programName, name, glType, elements);
        return;
    }
    mUniforms.push_back({name, glGetUniformLocation(mProgram, name), type});
}

int GlUniforms::Find(char const* name) const {
    for (std::size_t i = 0; name && i < mUniforms.size(); ++i) {
        if (mUniforms[i].name == name) return static_cast<int>(i);
    }
    return -1;
}

BindingType GlUniforms::GetType(int index) const {
    return index < 0 ? BindingTypeUnknown : mUniforms[static_cast<std::size_t>(index)].type;
}

void GlUniforms::Set(int index, void const* value) {
    if (index < 0 || mProgram == 0) return;
    Uniform& uniform = mUniforms[static_cast<std::size_t>(index)];
    // Callers hand over a bool, of which only one byte is there to be read.
    GLint const flag = uniform.type == BindingTypeBool && *static_cast<bool const*>(value) ? 1 : 0;
    void const* const converted = uniform.type == BindingTypeBool ? &flag : value;
    if (!Store(uniform.value, converted, GetSize(uniform.type))) return;
    uniform.isSent = false;
    GlOperation const operation(*mContext);
    if (!operation) return;
    if (mContext->state.program.Get() == mProgram) {
        Send(uniform);
    } else {
        mHasWaiting = true;
    }
}

void GlUniforms::MakeCurrent() {
    if (!mContext) return;
    GlOperation const operation(*mContext);
    if (!operation) return;
    mContext->state.program.Set(mProgram);
    if (mHasWaiting) SendWaiting();
}

void GlUniforms::SendWaiting() {
    for (Uniform& uniform : mUniforms) {
        if (!uniform.isSent) Send(uniform);
    }
    mHasWaiting = false;
}

void GlUniforms::Send(Uniform& uniform) {
    auto const* const floats = reinterpret_cast<GLfloat const*>(uniform.value);
    GLint const location = uniform.location;
    switch (uniform.type) {
    case BindingTypeUnknown:
        break;
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        glUniform1iv(location, 1, reinterpret_cast<GLint const*>(uniform.value));
        break;
    case BindingTypeFloat:
        glUniform1fv(location, 1, floats);
        break;
    case BindingTypeVector2:
        glUniform2fv(location, 1, floats);
        break;
    case BindingTypeVector4:
        glUniform4fv(location, 1, floats);
        break;
    case BindingTypeMatrix4:
        glUniformMatrix4fv(location, 1, GL_FALSE, floats);
        break;
    }
    uniform.isSent = true;
}

void GlUniforms::DeleteProgram() {
    if (!mContext) return;
    GlOperation const operation(*mContext);
    mContext->Drop(GlNameKind::Program, std::exchange(mProgram, 0));
}

} // namespace Moka::detail
