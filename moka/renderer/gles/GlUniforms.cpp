#include "moka/renderer/gles/GlUniforms.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlTables.h"

#include <algorithm>
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
    mSent = mValues;
}

void GlUniforms::AddUniform(GLuint index, char const* programName) {
    GLchar name[256] = {};
    GLint elements = 0;
    GLenum glType = GL_NONE;
    glGetActiveUniform(mProgram, index, sizeof name, nullptr, &elements, &glType, name);
    BindingType const type = ToBindingType(glType);
    bool const isOneTooMany = type == BindingTypeTextureUnit && GetSamplerCount() == kMaxSamplers;
    if (type == BindingTypeUnknown || elements != 1 || isOneTooMany) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "%s: the uniform %s cannot be set: GL type 0x%04x, %d elements; single bool, "
                            "int, float, vec2, vec4, mat4 and up to %d sampler2D can",
                            programName, name, glType, elements, kMaxSamplers);
        return;
    }
    if (type == BindingTypeTextureUnit) mSamplers.push_back(static_cast<int>(mUniforms.size()));
    mUniforms.push_back({name, glGetUniformLocation(mProgram, name), type, mValues.size()});
    mValues.resize(mValues.size() + detail::GetSize(type));
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

int GlUniforms::GetSamplerUnit(int sampler) const {
    int const index = mSamplers[static_cast<std::size_t>(sampler)];
    GLint unit = 0;
    std::memcpy(&unit, &mValues[mUniforms[static_cast<std::size_t>(index)].offset], sizeof unit);
    return unit;
}

void GlUniforms::Set(int index, void const* value) {
    if (index < 0 || mProgram == 0) return;
    Uniform const& uniform = mUniforms[static_cast<std::size_t>(index)];
    // Callers hand over a bool, of which only one byte is there to be read.
    GLint const flag = uniform.type == BindingTypeBool && *static_cast<bool const*>(value) ? 1 : 0;
    void const* const converted = uniform.type == BindingTypeBool ? &flag : value;
    if (!Store(&mValues[uniform.offset], converted, detail::GetSize(uniform.type))) return;
    listed.isStale = true;
    GlOperation const operation(*mContext);
    // Setting needs the program to be GL's current one; another one's values wait until it is.
    if (!operation || !mContext->IsThrough() || mContext->state.program.Get() != mProgram) return;
    Send(uniform, &mValues[uniform.offset]);
}

bool GlUniforms::HasLostContext() const { return mContext && !mContext->IsAttached(); }

void GlUniforms::MoveTo(std::shared_ptr<GlContext> context, GLuint program) {
    mContext = std::move(context);
    mProgram = program;
    listed = {}; // that was a list of the other context's
    for (Uniform& uniform : mUniforms) {
        uniform.location = glGetUniformLocation(mProgram, uniform.name.c_str());
    }
    std::fill(mSent.begin(), mSent.end(), static_cast<unsigned char>(0));
}

void GlUniforms::MakeCurrent(std::shared_ptr<GlUniforms> const& self) {
    if (!mContext) return;
    GlOperation const operation(*mContext);
    if (!operation) return;
    mContext->current.SetProgram(self);
    if (mContext->IsThrough()) PutInForce(GetValues());
}

void GlUniforms::PutInForce(unsigned char const* values) {
    mContext->state.SetProgram(mProgram);
    if (mSent.empty() || std::memcmp(mSent.data(), values, mSent.size()) == 0) return;
    for (Uniform const& uniform : mUniforms) {
        std::size_t const size = detail::GetSize(uniform.type);
        bool const isSent = std::memcmp(&mSent[uniform.offset], values + uniform.offset, size) == 0;
        if (!isSent) Send(uniform, values + uniform.offset);
    }
}

void GlUniforms::Send(Uniform const& uniform, unsigned char const* value) {
    std::memcpy(&mSent[uniform.offset], value, detail::GetSize(uniform.type));
    // Every value starts at a multiple of four bytes.
    void const* const aligned = &mSent[uniform.offset];
    auto const* const floats = static_cast<GLfloat const*>(aligned);
    switch (uniform.type) {
    case BindingTypeUnknown:
        break;
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        glUniform1iv(uniform.location, 1, static_cast<GLint const*>(aligned));
        break;
    case BindingTypeFloat:
        glUniform1fv(uniform.location, 1, floats);
        break;
    case BindingTypeVector2:
        glUniform2fv(uniform.location, 1, floats);
        break;
    case BindingTypeVector4:
        glUniform4fv(uniform.location, 1, floats);
        break;
    case BindingTypeMatrix4:
        glUniformMatrix4fv(uniform.location, 1, GL_FALSE, floats);
        break;
    }
    ++mContext->statistics.uniformChanges;
}

void GlUniforms::DeleteProgram() {
    if (!mContext) return;
    GlOperation const operation(*mContext);
    if (operation) mContext->LetGo(*this);
    mContext->Drop(GlNameKind::Program, std::exchange(mProgram, 0));
}

} // namespace Moka::detail
