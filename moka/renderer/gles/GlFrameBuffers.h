// GlFrameBuffers: frame buffer objects over textures, and the depth-stencil render buffers attached to them.
// A frame buffer keeps its last attachment until a command needs another one, because attaching makes a driver
// validate the frame buffer anew and clips attach on every draw.
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

    // 0, with one error line, when the driver refuses.
    GLuint Create(GLuint texture, GLsizei width, GLsizei height);
    void Delete(GLuint frameBuffer);
    GLuint CreateDepthStencil(GLsizei width, GLsizei height);
    void DeleteDepthStencil(GLuint renderBuffer);

    // The target's frame buffer has the target's render buffer attached, and no other.
    void Attach(TargetRef const& target);

private:
    void Attach(GLuint frameBuffer, GLuint renderBuffer);

    GlState& mState;
    GlHostState& mHost;
    GlDebug& mDebug;
    std::unordered_map<GLuint, GLuint> mAttached; // render buffer by frame buffer, those that have one
};

} // namespace Moka::detail
