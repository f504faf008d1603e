#include "moka/renderer/gles/GlTargetSwitch.h"

#include "moka/renderer/gles/GlRenderTarget.h"
#include "moka/renderer/gles/GlStatistics.h"

namespace Moka::detail {

void GlTargetSwitch::Activate(GlRenderTarget& target) {
    mActive = &target;
    Settle();
}

void GlTargetSwitch::Deactivate(GlRenderTarget const& target) {
    if (mActive != &target) return;
    mActive = nullptr;
    if (!mDeferred) GiveBack();
}

void GlTargetSwitch::BindDraw(GLuint frameBuffer) { Bind({frameBuffer, mState.frameBuffers.Get().read}); }

void GlTargetSwitch::BindRead(GLuint frameBuffer) { Bind({mState.frameBuffers.Get().draw, frameBuffer}); }

void GlTargetSwitch::Bind(GlFrameBuffers const& wanted) {
    if (!mHostFrameBuffers) mHostFrameBuffers = mState.frameBuffers.Get();
    if (mState.frameBuffers.Set(wanted)) ++mStatistics.frameBufferSwitches;
}

void GlTargetSwitch::Settle() {
    if (mActive) {
        PrepareForDrawing();
    } else if (!mDeferred) {
        GiveBackFrameBuffers();
    }
}

void GlTargetSwitch::PrepareForDrawing() {
    Bind({mActive->GetName(), mActive->GetName()});
    if (!mHostViewport) mHostViewport = mState.viewport.Get();
    mState.viewport.Set({0, 0, mActive->GetWidth(), mActive->GetHeight()});
    if (!mHostObstacles) mHostObstacles = mState.obstacles.Get();
    mState.obstacles.Set(0);
}

GLuint GlTargetSwitch::GetCurrent() { return mActive ? mActive->GetName() : GetHosts(); }

GLuint GlTargetSwitch::GetHosts() {
    return mHostFrameBuffers ? mHostFrameBuffers->draw : mState.frameBuffers.Get().draw;
}

void GlTargetSwitch::GiveBack() {
    GiveBackFrameBuffers();
    if (mHostViewport) mState.viewport.Set(*mHostViewport);
    mHostViewport.reset();
    if (mHostObstacles) mState.obstacles.Set(*mHostObstacles);
    mHostObstacles.reset();
    mState.UnbindSamplers();
}

void GlTargetSwitch::Detach() {
    mActive = nullptr;
    GiveBack();
}

void GlTargetSwitch::GiveBackFrameBuffers() {
    if (!mHostFrameBuffers) return;
    if (mState.frameBuffers.Set(*mHostFrameBuffers)) ++mStatistics.frameBufferSwitches;
    mHostFrameBuffers.reset();
}

} // namespace Moka::detail
