#include "moka/renderer/gles/GlSamplers.h"

#include "moka/renderer/device/Counters.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlTables.h"

namespace Moka::detail {
namespace {

void SetParameter(GLuint sampler, GLenum parameter, GLenum value) {
    Gl::SamplerParameteri(sampler, parameter, static_cast<GLint>(value));
}

} // namespace

GLuint GlSamplers::Get(Sampling const& sampling) {
    for (Entry const& entry : mEntries) {
        if (entry.sampling == sampling) return entry.name;
    }
    GLuint name = 0;
    Gl::GenSamplers(1, &name);
    SetParameter(name, GL_TEXTURE_MIN_FILTER, ToGlFilter(sampling.minFilter));
    SetParameter(name, GL_TEXTURE_MAG_FILTER, ToGlFilter(sampling.magFilter));
    SetParameter(name, GL_TEXTURE_WRAP_S, ToGlWrap(sampling.wrapS));
    SetParameter(name, GL_TEXTURE_WRAP_T, ToGlWrap(sampling.wrapT));
    mEntries.push_back({sampling, name});
    ++mState.counters.samplers;
    return name;
}

void GlSamplers::Clear() {
    for (Entry const& entry : mEntries) {
        Gl::DeleteSamplers(1, &entry.name);
        mState.ForgetSampler(entry.name);
        --mState.counters.samplers;
    }
    mEntries.clear();
}

} // namespace Moka::detail
