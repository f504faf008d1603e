#include "moka/renderer/gles/GlTextureStorage.h"

#include "moka/base/Rect.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlPixels.h"
#include "moka/renderer/gles/GlTables.h"

#include <algorithm>
#include <utility>

namespace Moka::detail {

std::shared_ptr<GlTextureStorage> GlTextureStorage::Create(std::shared_ptr<GlContext> context, int width,
                                                           int height, PixelSource const& source) {
    std::shared_ptr<GlTextureStorage> storage(new GlTextureStorage(std::move(context), width, height));
    if (!storage->Allocate()) return nullptr;
    if (!source.pixels) return storage->Clear() ? storage : nullptr;
    std::int64_t const stride =
        std::int64_t{source.rowLength > 0 ? source.rowLength : width} * kBytesPerPixel;
    auto const* const first = static_cast<unsigned char const*>(source.pixels) + source.y * stride +
                              std::ptrdiff_t{source.x} * kBytesPerPixel;
    storage->Upload(Rect(0, 0, width, height), first, stride);
    return storage;
}

GlTextureStorage::GlTextureStorage(std::shared_ptr<GlContext> context, int width, int height)
    : mContext(std::move(context)), mWidth(width), mHeight(height) {}

GlTextureStorage::~GlTextureStorage() {
    mContext->Drop(GlNameKind::FrameBuffer, mIdleFrameBuffer);
    mContext->Drop(GlNameKind::Texture, mName);
}

bool GlTextureStorage::Allocate() {
    glGenTextures(1, &mName);
    ++mContext->statistics.textures;
    GlEditTexture const edit(mContext->state, mName);
    glTexStorage2D(GL_TEXTURE_2D, 1, kGlInternalFormat, mWidth, mHeight);
    // Samplers overrule these; they are for foreign code that samples the texture without one.
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_LINEAR);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_LINEAR);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_S, GL_CLAMP_TO_EDGE);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_T, GL_CLAMP_TO_EDGE);
    return mContext->debug.Check("making a texture");
}

// As a clear of a frame buffer, not as an upload of zeros: no memory to fill and to move, tiled GPUs do it
// without touching the texels, and the frame buffer is needed soon after, because a texture without pixels is
// there to be drawn into.
bool GlTextureStorage::Clear() {
    GLuint const frameBuffer = TakeFrameBuffer();
    if (frameBuffer == 0) return false;
    GlState& state = mContext->state;
    mContext->targets.BindDraw(frameBuffer);
    GlOverride<GlObstaclesAccess> const obstacles(state.obstacles, 0);
    GlOverride<GlScissorTestAccess> const scissor(state.scissorTest, false);
    GlOverride<GlColorMaskAccess> const mask(state.colorMask, kGlAllColors);
    GLfloat const transparent[4] = {};
    glClearBufferfv(GL_COLOR, 0, transparent);
    GiveFrameBuffer(frameBuffer);
    return true;
}

void GlTextureStorage::Upload(Rect const& rect, void const* pixels, std::int64_t stride) {
    GlBlock const block = GlBlock::Clip(rect.left, rect.top, std::int64_t{rect.right} - rect.left,
                                        std::int64_t{rect.bottom} - rect.top, mWidth, mHeight);
    if (block.width == 0) return;
    GlEditTexture const edit(mContext->state, mName);
    UploadPixels(mContext->state, block, pixels, stride);
    mContext->statistics.bytesUploaded += block.GetBytes();
    mContext->debug.Check("uploading pixels");
}

void GlTextureStorage::CopyFrom(GLuint frameBuffer, bool hasAlpha, int width, int height) {
    int const w = std::min(width, mWidth);
    int const h = std::min(height, mHeight);
    FinishDrawing();
    if (hasAlpha) {
        mContext->targets.BindRead(frameBuffer);
        GlEditTexture const edit(mContext->state, mName);
        glCopyTexSubImage2D(GL_TEXTURE_2D, 0, 0, 0, 0, 0, w, h);
    } else {
        // A texture copy cannot invent alpha; a blit reads it as 1.
        GLuint const own = TakeFrameBuffer();
        if (own == 0) return;
        Blit(frameBuffer, own, w, h);
        GiveFrameBuffer(own);
    }
    ++mContext->statistics.copies;
    mContext->debug.Check("copying the render target");
}

void GlTextureStorage::CopyTo(GLuint frameBuffer) {
    GLuint const own = TakeFrameBuffer();
    if (own == 0) return;
    FinishDrawing();
    Blit(own, frameBuffer, mWidth, mHeight);
    GiveFrameBuffer(own);
    ++mContext->statistics.copies;
    mContext->debug.Check("drawing a texture into the frame buffer");
}

void GlTextureStorage::FinishDrawing() {
    if (mContext->workarounds.Needs(GlWorkaround::FinishBeforeCopies)) glFinish();
}

// Of all state, only the scissor test holds for a blit.
void GlTextureStorage::Blit(GLuint from, GLuint to, int width, int height) {
    mContext->targets.Bind({to, from});
    GlOverride<GlScissorTestAccess> const scissor(mContext->state.scissorTest, false);
    glBlitFramebuffer(0, 0, width, height, 0, 0, width, height, GL_COLOR_BUFFER_BIT, GL_NEAREST);
}

GLuint GlTextureStorage::TakeFrameBuffer() {
    return mIdleFrameBuffer != 0 ? std::exchange(mIdleFrameBuffer, 0) : MakeFrameBuffer();
}

void GlTextureStorage::GiveFrameBuffer(GLuint name) {
    mContext->Drop(GlNameKind::FrameBuffer, std::exchange(mIdleFrameBuffer, name));
}

GLuint GlTextureStorage::MakeFrameBuffer() {
    GLuint name = 0;
    glGenFramebuffers(1, &name);
    ++mContext->statistics.frameBuffers;
    mContext->targets.BindDraw(name);
    glFramebufferTexture2D(GL_DRAW_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, mName, 0);
    GLenum const status = glCheckFramebufferStatus(GL_DRAW_FRAMEBUFFER);
    if (status == GL_FRAMEBUFFER_COMPLETE) return name;
    ++mContext->statistics.errors;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "the driver refuses a frame buffer over a texture of %d x %d: status 0x%04x", mWidth,
                        mHeight, status);
    mContext->Drop(GlNameKind::FrameBuffer, name);
    return 0;
}

} // namespace Moka::detail
