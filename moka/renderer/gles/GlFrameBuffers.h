// GlFrameBuffers: frame buffer objects with textures, and the depth-stencil render buffers attached to them.
// A frame buffer keeps its render buffer until a command needs another one, because stencil clips attach one
// on every draw, and drivers validate a frame buffer again after each attachment.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"
#include "moka/renderer/gles/GlFunctions.h"

#include <unordered_map>

namespace Moka::detail {

class GlDebug;
class GlHostState;
class GlState;
struct Counters;

class GlFrameBuffers {
public:
    GlFrameBuffers(GlState& state, GlHostState& host, GlDebug& debug)
        : mState(state), mHost(host), mDebug(debug) {}

    // If the driver cannot create the frame buffer, logs an error and returns 0.
    GLuint Create(GLuint texture, GLsizei width, GLsizei height);
    void Delete(GLuint frameBuffer);
    GLuint CreateDepthStencil(GLsizei width, GLsizei height);
    void DeleteDepthStencil(GLuint renderBuffer);

    // Attaches the target's render buffer, or none, to the target's frame buffer.
    void Attach(TargetRef const& target);

private:
    void Attach(GLuint frameBuffer, GLuint renderBuffer);

    GlState& mState;
    GlHostState& mHost;
    GlDebug& mDebug;
    std::unordered_map<GLuint, GLuint> mAttached; // frame buffer to attached render buffer
};

} // namespace Moka::detail
