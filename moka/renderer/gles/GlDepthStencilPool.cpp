#include "moka/renderer/gles/GlDepthStencilPool.h"

#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlState.h"
#include "moka/renderer/gles/GlStatistics.h"

#include <algorithm>

namespace Moka::detail {

GLuint GlDepthStencilPool::Take(int width, int height) {
    auto const found = std::find_if(mWaiting.rbegin(), mWaiting.rend(), [=](Entry const& entry) {
        return entry.width == width && entry.height == height;
    });
    if (found != mWaiting.rend()) {
        GLuint const name = found->name;
        mWaiting.erase(std::next(found).base());
        --mStatistics.pooledRenderBuffers;
        ++mStatistics.renderBuffers;
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
    ++mStatistics.renderBuffers;
    return name;
}

void GlDepthStencilPool::Give(GLuint name, int width, int height) {
    --mStatistics.renderBuffers;
    ++mStatistics.pooledRenderBuffers;
    mWaiting.push_back({name, width, height});
    if (mWaiting.size() > kMaxWaiting) DeleteOldest();
}

void GlDepthStencilPool::Clear() {
    while (!mWaiting.empty()) DeleteOldest();
}

void GlDepthStencilPool::DeleteOldest() {
    glDeleteRenderbuffers(1, &mWaiting.front().name);
    mWaiting.pop_front();
    --mStatistics.pooledRenderBuffers;
}

} // namespace Moka::detail
