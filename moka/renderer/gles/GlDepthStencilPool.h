// GlDepthStencilPool: the render buffers behind depth-stencil buffers, kept by size when they are given back,
// because clips ask for one and give it back on every draw.
// Thread: render thread.
#pragma once

#include <GLES3/gl3.h>

#include <deque>

namespace Moka::detail {

class GlDebug;
class GlState;
struct GlStatistics;

class GlDepthStencilPool {
public:
    GlDepthStencilPool(GlState& state, GlDebug& debug, GlStatistics& statistics)
        : mState(state), mDebug(debug), mStatistics(statistics) {}

    // A render buffer of 24 bits depth and 8 bits stencil with any contents; 0 (one error line) when the
    // driver has no memory.
    GLuint Take(int width, int height);
    // Not attached to anything any more. The oldest ones go when too many wait.
    void Give(GLuint name, int width, int height);
    void Clear();

private:
    // Enough for a few canvases that clip in turn; each one of screen size holds some ten megabytes.
    static constexpr std::size_t kMaxWaiting = 4;

    struct Entry {
        GLuint name;
        int width;
        int height;
    };

    void DeleteOldest();

    GlState& mState;
    GlDebug& mDebug;
    GlStatistics& mStatistics;
    std::deque<Entry> mWaiting; // oldest first
};

} // namespace Moka::detail
