#include "moka/renderer/gles/GlFrameBuffers.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlDebug.h"
#include "moka/renderer/gles/GlHostState.h"

#include <vector>

namespace Moka::detail {

GLuint GlFrameBuffers::Create(GLuint texture, GLsizei width, GLsizei height) {
    GLuint name = 0;
    Gl::GenFramebuffers(1, &name);
    mHost.BindDraw(name);
    Gl::FramebufferTexture2D(GL_DRAW_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, texture, 0);
    GLenum const status = Gl::CheckFramebufferStatus(GL_DRAW_FRAMEBUFFER);
    if (status == GL_FRAMEBUFFER_COMPLETE) return name;
    ++mState.counters.errors;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "the driver refuses a frame buffer over a texture of %d x %d: status 0x%04x", width,
                        height, status);
    Delete(name);
    return 0;
}

void GlFrameBuffers::Delete(GLuint frameBuffer) {
    mAttached.erase(frameBuffer);
    Gl::DeleteFramebuffers(1, &frameBuffer);
    mState.ForgetFrameBuffer(frameBuffer);
}

GLuint GlFrameBuffers::CreateDepthStencil(GLsizei width, GLsizei height) {
    GLuint name = 0;
    Gl::GenRenderbuffers(1, &name);
    GlOverride<GlRenderBufferAccess> const bound(mState.renderBuffer, name);
    Gl::RenderbufferStorage(GL_RENDERBUFFER, GL_DEPTH24_STENCIL8, width, height);
    if (mDebug.Check("making a depth-stencil buffer")) return name;
    Gl::DeleteRenderbuffers(1, &name);
    return 0;
}

// Detaches the render buffer first: GL keeps a deleted render buffer alive while it is attached.
void GlFrameBuffers::DeleteDepthStencil(GLuint renderBuffer) {
    std::vector<GLuint> holders;
    for (auto const& [frameBuffer, attached] : mAttached) {
        if (attached == renderBuffer) holders.push_back(frameBuffer);
    }
    for (GLuint const holder : holders) Attach(holder, 0);
    Gl::DeleteRenderbuffers(1, &renderBuffer);
}

void GlFrameBuffers::Attach(TargetRef const& target) {
    auto const found = mAttached.find(target.frameBuffer);
    GLuint const attached = found == mAttached.end() ? 0 : found->second;
    if (attached != target.depthStencil) Attach(target.frameBuffer, target.depthStencil);
}

// Binds the frame buffer for reading. If it is bound already this costs nothing; if not, the draw binding
// stays unchanged.
void GlFrameBuffers::Attach(GLuint frameBuffer, GLuint renderBuffer) {
    mHost.BindRead(frameBuffer);
    Gl::FramebufferRenderbuffer(GL_READ_FRAMEBUFFER, GL_DEPTH_STENCIL_ATTACHMENT, GL_RENDERBUFFER,
                                renderBuffer);
    if (renderBuffer == 0) {
        mAttached.erase(frameBuffer);
    } else {
        mAttached[frameBuffer] = renderBuffer;
    }
}

} // namespace Moka::detail
