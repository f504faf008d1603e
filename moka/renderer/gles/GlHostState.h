// GlHostState: saves each part of the host's GL state before the renderer first changes it, and restores it
// on request. The parts are frame buffers, viewport, vertex array, buffers, and the switches of
// GlObstaclesAccess.
// Thread: render thread.
#pragma once

#include "moka/renderer/gles/GlState.h"

#include <optional>

namespace Moka::detail {

class GlHostState {
public:
    explicit GlHostState(GlState& state) : mState(state) {}

    // Bind frame buffers, and save the host's bindings.
    void Bind(GlBoundFrameBuffers const& wanted);
    void BindDraw(GLuint frameBuffer);
    void BindRead(GLuint frameBuffer);
    // Binds the frame buffer, sets a viewport of this size unless width is 0, and saves the obstacles.
    void BindTarget(GLuint frameBuffer, GLsizei width, GLsizei height);
    // Call these before changing the state: the switches of GlObstaclesAccess, the vertex array and the array
    // buffer, or the general uniform buffer binding.
    void SaveObstacles();
    void SaveVertexInput();
    void SaveUniformBuffer();

    // The frame buffer that the host has bound for drawing.
    GLuint GetFrameBuffer();

    void RestoreFrameBuffers();
    void RestoreVertexInput();
    // Restores all parts and unbinds our samplers.
    void RestoreAll();

private:
    GlState& mState;
    // Each has a value while the renderer has changed that state.
    std::optional<GlBoundFrameBuffers> mFrameBuffers;
    std::optional<GlBox> mViewport;
    std::optional<unsigned> mObstacles;
    std::optional<GLuint> mVertexArray;
    std::optional<GLuint> mArrayBuffer;
    std::optional<GLuint> mUniformBuffer;
};

} // namespace Moka::detail
