#include "moka/renderer/gles/GlDepthStencilPool.h"

#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlDrawState.h"
#include "moka/renderer/gles/GlFrameBuffer.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlStatistics.h"
#include "moka/renderer/gles/GlTargetSwitch.h"

#include <algorithm>

namespace Moka::detail {

GLuint GlDepthStencilPool::Take(int width, int height) {
    auto const found = std::find_if(mWaiting.rbegin(), mWaiting.rend(), [=](Entry const& entry) {
        return entry.width == width && entry.height == height;
    });
    if (found != mWaiting.rend()) {
        GLuint const name = found->name;
        mWaiting.erase(std::next(found).base());
        --mState.statistics.pooledRenderBuffers;
        ++mState.statistics.renderBuffers;
        return name;
    }
    GLuint name = 0;
    glGenRenderbuffers(1, &name);
    GlOverride<GlRenderBufferAccess> const bound(mState.renderBuffer, name);
    glRenderbufferStorage(GL_RENDERBUFFER, GL_DEPTH24_STENCIL8, width, height);
    if (!mDebug.Check("making a depth-stencil buffer")) {
        glDeleteRenderbuffers(1, &name);
        return 0;
    }
    ++mState.statistics.renderBuffers;
    return name;
}

void GlDepthStencilPool::Give(GLuint name, int width, int height) {
    --mState.statistics.renderBuffers;
    ++mState.statistics.pooledRenderBuffers;
    mWaiting.push_back({name, width, height});
    if (mWaiting.size() > kMaxWaiting) DeleteOldest();
}

void GlDepthStencilPool::Clear() {
    while (!mWaiting.empty()) DeleteOldest();
}

void GlDepthStencilPool::Attach(GlTargetUse const& target) {
    GlFrameBuffer& frameBuffer = *target.frameBuffer;
    if (frameBuffer.depthStencil == target.depthStencil) return;
    AttachTo(frameBuffer, target.depthStencil);
}

// Through the reading side, which is free when the target is bound and otherwise leaves the drawing side
// alone.
void GlDepthStencilPool::AttachTo(GlFrameBuffer& frameBuffer, GLuint name) {
    mTargets.BindRead(frameBuffer.GetName());
    glFramebufferRenderbuffer(GL_READ_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER, name);
    Forget(frameBuffer);
    frameBuffer.depthStencil = name;
    if (name != 0) mHolders.push_back(&frameBuffer);
}

void GlDepthStencilPool::Forget(GlFrameBuffer const& frameBuffer) {
    mHolders.erase(std::remove(mHolders.begin(), mHolders.end(), &frameBuffer), mHolders.end());
}

// One that stays attached would live on without a name.
void GlDepthStencilPool::DeleteOldest() {
    GLuint const name = mWaiting.front().name;
    mWaiting.pop_front();
    std::vector<GlFrameBuffer*> const holders = mHolders;
    for (GlFrameBuffer* const holder : holders) {
        if (holder->depthStencil == name) AttachTo(*holder, 0);
    }
    glDeleteRenderbuffers(1, &name);
    --mState.statistics.pooledRenderBuffers;
}

} // namespace Moka::detail
