// GlHostState: the host's GL state beneath ours: it is saved when something of ours first takes its place, and
// restored on request. Frame buffers, viewport, vertex input, and the tests that obstruct drawing.
// Thread: render thread.
#pragma once

#include "moka/renderer/gles/GlState.h"

#include <optional>

namespace Moka::detail {

class GlHostState {
public:
    explicit GlHostState(GlState& state) : mState(state) {}

    // Frame buffers, saving the host's.
    void Bind(GlBoundFrameBuffers const& wanted);
    void BindDraw(GLuint frameBuffer);
    void BindRead(GLuint frameBuffer);
    // With a viewport of this size (none is set for a width of 0), and nothing in the way of drawing.
    void BindTarget(GLuint frameBuffer, GLsizei width, GLsizei height);
    // The tests that obstruct drawing may be changed afterwards.
    void SaveObstacles();
    // Vertex array and buffer may be changed afterwards.
    void SaveVertexInput();
    // The general binding of uniform buffers may be changed afterwards.
    void SaveUniformBuffer();

    // The frame buffer that the host draws into.
    GLuint GetFrameBuffer();

    void RestoreFrameBuffers();
    void RestoreVertexInput();
    // Everything, and no sampler stays bound.
    void RestoreAll();

private:
    GlState& mState;
    // Present while something of ours is in their place.
    std::optional<GlBoundFrameBuffers> mFrameBuffers;
    std::optional<GlBox> mViewport;
    std::optional<unsigned> mObstacles;
    std::optional<GLuint> mVertexArray;
    std::optional<GLuint> mArrayBuffer;
    std::optional<GLuint> mUniformBuffer;
};

} // namespace Moka::detail
