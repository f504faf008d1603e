#include "moka/renderer/gles/GlTargetSwitch.h"

#include "moka/renderer/gles/GlDrawState.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlRenderTarget.h"
#include "moka/renderer/gles/GlStatistics.h"

namespace Moka::detail {
namespace {

// Remembers what the host has, the first time.
template <class Shadow, class Saved>
void Take(Shadow& shadow, Saved& saved) {
    if (!saved) saved = shadow.Get();
}

template <class Shadow, class Saved>
void Return(Shadow& shadow, Saved& saved) {
    if (saved) shadow.Set(*saved);
    saved.reset();
}

} // namespace

void GlTargetSwitch::BindDraw(GLuint frameBuffer) { Bind({frameBuffer, mState.frameBuffers.Get().read}); }

void GlTargetSwitch::BindRead(GLuint frameBuffer) { Bind({mState.frameBuffers.Get().draw, frameBuffer}); }

void GlTargetSwitch::Bind(GlFrameBuffers const& wanted) {
    Take(mState.frameBuffers, mHostFrameBuffers);
    if (mState.frameBuffers.Set(wanted)) ++mState.statistics.frameBufferSwitches;
}

void GlTargetSwitch::BindTarget(GlTargetUse const& target) {
    GLuint const name = target.frameBuffer->GetName();
    Bind({name, name});
    Take(mState.viewport, mHostViewport);
    if (target.width > 0) mState.viewport.Set({0, 0, target.width, target.height});
    Take(mState.obstacles, mHostObstacles);
    mState.obstacles.Set(0);
}

void GlTargetSwitch::TakeVertexInput() {
    Take(mState.vertexArray, mHostVertexArray);
    Take(mState.arrayBuffer, mHostArrayBuffer);
}

GLuint GlTargetSwitch::GetCurrent() { return mActive ? mActive->GetName() : GetHosts(); }

GLuint GlTargetSwitch::GetHosts() {
    return mHostFrameBuffers ? mHostFrameBuffers->draw : mState.frameBuffers.Get().draw;
}

void GlTargetSwitch::GiveBack() {
    GiveBackFrameBuffers();
    Return(mState.viewport, mHostViewport);
    Return(mState.obstacles, mHostObstacles);
    GiveBackVertexInput();
    mState.UnbindSamplers();
}

void GlTargetSwitch::GiveBackFrameBuffers() {
    if (!mHostFrameBuffers) return;
    if (mState.frameBuffers.Set(*mHostFrameBuffers)) ++mState.statistics.frameBufferSwitches;
    mHostFrameBuffers.reset();
}

void GlTargetSwitch::GiveBackVertexInput() {
    Return(mState.vertexArray, mHostVertexArray);
    Return(mState.arrayBuffer, mHostArrayBuffer);
}

} // namespace Moka::detail
