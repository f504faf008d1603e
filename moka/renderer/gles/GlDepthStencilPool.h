// GlDepthStencilPool: the render buffers behind depth-stencil buffers, kept by size when they are given back,
// because clips ask for one and give it back on every draw. For the same reason a frame buffer keeps the last
// one attached until it needs another: attaching makes a driver validate the frame buffer anew.
// Thread: render thread.
#pragma once

#include <GLES3/gl3.h>

#include <deque>
#include <vector>

namespace Moka::detail {

class GlDebug;
class GlFrameBuffer;
class GlState;
class GlTargetSwitch;
struct GlTargetUse;

class GlDepthStencilPool {
public:
    GlDepthStencilPool(GlState& state, GlTargetSwitch& targets, GlDebug& debug)
        : mState(state), mTargets(targets), mDebug(debug) {}

    // A render buffer of 24 bits depth and 8 bits stencil with any contents; 0 (one error line) when the
    // driver has no memory.
    GLuint Take(int width, int height);
    // Nobody's any more; a frame buffer may still have it attached.
    void Give(GLuint name, int width, int height);
    // Whether another one given back makes the oldest one go, which no command may name then.
    bool IsFull() const { return mWaiting.size() >= kMaxWaiting; }
    void Clear();

    // Within an operation: the target's frame buffer has just the target's render buffer attached.
    void Attach(GlTargetUse const& target);
    // The frame buffer goes.
    void Forget(GlFrameBuffer const& frameBuffer);

private:
    // Enough for a few canvases that clip in turn; each one of screen size holds some ten megabytes.
    static constexpr std::size_t kMaxWaiting = 4;

    struct Entry {
        GLuint name;
        int width;
        int height;
    };

    void AttachTo(GlFrameBuffer& frameBuffer, GLuint name);
    void DeleteOldest();

    GlState& mState;
    GlTargetSwitch& mTargets;
    GlDebug& mDebug;
    std::deque<Entry> mWaiting;           // oldest first
    std::vector<GlFrameBuffer*> mHolders; // those that have one attached
};

} // namespace Moka::detail
