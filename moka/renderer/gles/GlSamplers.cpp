#include "moka/renderer/gles/GlSamplers.h"

#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlStatistics.h"

namespace Moka::detail {
namespace {

void SetParameter(GLuint sampler, GLenum parameter, GLenum value) {
    glSamplerParameteri(sampler, parameter, static_cast<GLint>(value));
}

} // namespace

GLuint GlSamplers::Get(GlSampling const& sampling) {
    for (Entry const& entry : mEntries) {
        if (entry.sampling == sampling) return entry.name;
    }
    GLuint name = 0;
    glGenSamplers(1, &name);
    SetParameter(name, GL_TEXTURE_MIN_FILTER, sampling.minFilter);
    SetParameter(name, GL_TEXTURE_MAG_FILTER, sampling.magFilter);
    SetParameter(name, GL_TEXTURE_WRAP_S, sampling.wrapS);
    SetParameter(name, GL_TEXTURE_WRAP_T, sampling.wrapT);
    mEntries.push_back({sampling, name});
    ++mStatistics.samplers;
    return name;
}

void GlSamplers::Clear() {
    for (Entry const& entry : mEntries) {
        glDeleteSamplers(1, &entry.name);
        mState.ForgetSampler(entry.name);
        --mStatistics.samplers;
    }
    mEntries.clear();
}

} // namespace Moka::detail
