#include "moka/renderer/gles/GlHostState.h"

#include "moka/renderer/device/Counters.h"

namespace Moka::detail {
namespace {

template <class Shadow, class Saved>
void Save(Shadow& shadow, Saved& saved) {
    if (!saved) saved = shadow.Get();
}

template <class Shadow, class Saved>
void Restore(Shadow& shadow, Saved& saved) {
    if (saved) shadow.Set(*saved);
    saved.reset();
}

} // namespace

void GlHostState::Bind(GlBoundFrameBuffers const& wanted) {
    Save(mState.frameBuffers, mFrameBuffers);
    if (mState.frameBuffers.Set(wanted)) ++mState.counters.frameBufferSwitches;
}

void GlHostState::BindDraw(GLuint frameBuffer) { Bind({frameBuffer, mState.frameBuffers.Get().read}); }

void GlHostState::BindRead(GLuint frameBuffer) { Bind({mState.frameBuffers.Get().draw, frameBuffer}); }

void GlHostState::BindTarget(GLuint frameBuffer, GLsizei width, GLsizei height) {
    Bind({frameBuffer, frameBuffer});
    Save(mState.viewport, mViewport);
    if (width > 0) mState.viewport.Set({0, 0, width, height});
    SaveObstacles();
    mState.obstacles.Set(0);
}

void GlHostState::SaveObstacles() { Save(mState.obstacles, mObstacles); }

void GlHostState::SaveVertexInput() {
    Save(mState.vertexArray, mVertexArray);
    Save(mState.arrayBuffer, mArrayBuffer);
}

void GlHostState::SaveUniformBuffer() { Save(mState.uniformBuffer, mUniformBuffer); }

GLuint GlHostState::GetFrameBuffer() {
    return mFrameBuffers ? mFrameBuffers->draw : mState.frameBuffers.Get().draw;
}

void GlHostState::RestoreFrameBuffers() {
    if (!mFrameBuffers) return;
    if (mState.frameBuffers.Set(*mFrameBuffers)) ++mState.counters.frameBufferSwitches;
    mFrameBuffers.reset();
}

void GlHostState::RestoreVertexInput() {
    Restore(mState.vertexArray, mVertexArray);
    Restore(mState.arrayBuffer, mArrayBuffer);
    Restore(mState.uniformBuffer, mUniformBuffer);
}

void GlHostState::RestoreAll() {
    RestoreFrameBuffers();
    Restore(mState.viewport, mViewport);
    Restore(mState.obstacles, mObstacles);
    RestoreVertexInput();
    mState.UnbindSamplers();
}

} // namespace Moka::detail
