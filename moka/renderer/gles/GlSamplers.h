// GlSamplers: one GL sampler object for each sampling state in use, made when first asked for. Texture
// objects with the same state share it, so that changing a parameter back and forth makes nothing new.
// Thread: render thread.
#pragma once

#include <GLES3/gl3.h>

#include <vector>

namespace Moka::detail {

class GlState;
struct GlStatistics;

struct GlSampling {
    GLenum minFilter = GL_LINEAR;
    GLenum magFilter = GL_LINEAR;
    GLenum wrapS = GL_CLAMP_TO_EDGE;
    GLenum wrapT = GL_CLAMP_TO_EDGE;

    friend bool operator==(GlSampling const& a, GlSampling const& b) {
        return a.minFilter == b.minFilter && a.magFilter == b.magFilter && a.wrapS == b.wrapS &&
               a.wrapT == b.wrapT;
    }
};

class GlSamplers {
public:
    GlSamplers(GlState& state, GlStatistics& statistics) : mState(state), mStatistics(statistics) {}

    // Valid until Clear().
    GLuint Get(GlSampling const& sampling);
    void Clear();

private:
    struct Entry {
        GlSampling sampling;
        GLuint name;
    };

    GlState& mState;
    GlStatistics& mStatistics;
    std::vector<Entry> mEntries; // at most one for each of the 36 states, mostly two or three
};

} // namespace Moka::detail
