// GlSamplers: one GL sampler object for each sampling state, created at its first use. Textures with equal
// states share it, so changing a parameter back and forth creates nothing.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <vector>

namespace Moka::detail {

class GlState;

class GlSamplers {
public:
    explicit GlSamplers(GlState& state) : mState(state) {}

    // Valid until Clear().
    GLuint Get(Sampling const& sampling);
    void Clear();

private:
    struct Entry {
        Sampling sampling;
        GLuint name;
    };

    GlState& mState;
    std::vector<Entry> mEntries; // few: filters and wraps have 54 combinations
};

} // namespace Moka::detail
