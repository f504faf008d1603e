#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"
#include "tests/support/NothingLeft.h"

#include <utility>

namespace Moka::Testing {

Picture MakeImage(int width, int height, Color const& fill) {
    Picture image(width, height);
    for (std::size_t i = 0; i < image.pixels.size(); ++i) image.pixels[i] = fill[i % 4];
    return image;
}

Picture MakePattern(int width, int height) {
    Picture image(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            auto const high = static_cast<std::uint8_t>((x >> 8) * 16 + (y >> 8));
            image.SetColor(x, y,
                           {static_cast<std::uint8_t>(x), static_cast<std::uint8_t>(y), high,
                            static_cast<std::uint8_t>(7 * x + 13 * y + 1)});
        }
    }
    return image;
}

HostFrameBuffer::HostFrameBuffer(int width, int height, GLenum format) : mWidth(width), mHeight(height) {
    glGenRenderbuffers(1, &mColor);
    glBindRenderbuffer(GL_RENDERBUFFER, mColor);
    glRenderbufferStorage(GL_RENDERBUFFER, format, width, height);
    glGenFramebuffers(1, &mName);
    glBindFramebuffer(GL_FRAMEBUFFER, mName);
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_RENDERBUFFER, mColor);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    Fill(kUntouched);
}

HostFrameBuffer::~HostFrameBuffer() {
    glDeleteFramebuffers(1, &mName);
    glDeleteRenderbuffers(1, &mColor);
}

void HostFrameBuffer::Fill(Color color) const {
    glBindFramebuffer(GL_FRAMEBUFFER, mName);
    GLfloat const value[4] = {static_cast<float>(color[0]) / 255, static_cast<float>(color[1]) / 255,
                              static_cast<float>(color[2]) / 255, static_cast<float>(color[3]) / 255};
    glClearBufferfv(GL_COLOR, 0, value);
}

Picture HostFrameBuffer::Read() const {
    Picture image = MakeImage(mWidth, mHeight);
    glBindFramebuffer(GL_FRAMEBUFFER, mName);
    glReadPixels(0, 0, mWidth, mHeight, GL_RGBA, GL_UNSIGNED_BYTE, image.pixels.data());
    return image;
}

RendererFixture::RendererFixture() {
    SetLogSink([this](LogLine const& line) {
        if (line.priority >= ANDROID_LOG_ERROR) mErrors.push_back(line.text);
    });
}

RendererFixture::~RendererFixture() { SetLogSink(nullptr); }

namespace {

// Holds the display open for the life of the process. A driver is unloaded with its last display, and what
// it had not freed is then reported as leaked without a stack that tells whose it was.
void KeepDriverLoaded(std::string* error) {
    // Stored for real, so that the leak checker finds it.
    [[gnu::used]] static detail::EglContext const* kept = detail::EglContext::Open({}, error).release();
}

} // namespace

void RendererFixture::SetUp() {
    std::string error;
    KeepDriverLoaded(&error);
    mEgl = detail::EglContext::Open({true, kSurfaceWidth, kSurfaceHeight}, &error);
    ASSERT_TRUE(mEgl) << error;
    ASSERT_TRUE(Attach());
}

void RendererFixture::TearDown() {
    if (!mEgl) return;
    ExpectNothingLeft(RendererFactory::GetStatistics(), 0, mKnownDriverErrors);
    RendererFactory::DetachContext();
    RendererStatistics const after = RendererFactory::GetStatistics();
    EXPECT_EQ(after.pooledRenderBuffers + after.buffers, 0);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    EXPECT_EQ(TakeErrors(), std::vector<std::string>{});
}

bool RendererFixture::Attach(RendererLimits const& limits) {
    return RendererFactory::AttachContext(limits, eglGetProcAddress);
}

TexturePtr RendererFixture::MakeTexture(int width, int height) {
    TextureDescriptor const descriptor(width, height, 0, 2, 6, 1, false, nullptr);
    return TexturePtr(RendererFactory::CreateTextureObject(descriptor, nullptr, 0, {}));
}

TexturePtr RendererFixture::MakeTexture(Picture const& image) {
    TextureDescriptor const descriptor(image.width, image.height, 0, 2, 6, 1, false, nullptr);
    PixelSource const source{image.pixels.data(), 0, 0, image.width};
    return TexturePtr(RendererFactory::CreateTextureObject(descriptor, nullptr, 0, source));
}

TexturePtr RendererFixture::MakeView(ITextureObject const& model) {
    return TexturePtr(RendererFactory::CreateTextureObject(TextureDescriptor(&model), nullptr, 0, {}));
}

TargetPtr RendererFixture::MakeTarget(ITextureObject& texture) {
    return TargetPtr(RendererFactory::CreateOffscreenRenderTarget(&texture));
}

OffscreenImage RendererFixture::MakeOffscreen(Picture const& image) {
    TexturePtr texture = MakeTexture(image);
    TargetPtr target = MakeTarget(*texture);
    return {std::move(texture), std::move(target)};
}

DepthStencilPtr RendererFixture::MakeDepthStencil(int width, int height) {
    return DepthStencilPtr(RendererFactory::CreateDepthStencilBuffer(width, height));
}

Picture RendererFixture::Read(IRenderTarget& target, int width, int height) {
    Picture image = MakeImage(width, height);
    target.ReadPixels(0, 0, width, height, {image.pixels.data(), width, 0, 0});
    return image;
}

Picture RendererFixture::Read(ITextureObject& texture) {
    return Read(*MakeTarget(texture), texture.GetWidth(), texture.GetHeight());
}

void RendererFixture::Clear(IRenderTarget& target, Color color) {
    target.ClearColor(static_cast<float>(color[0]) / 255, static_cast<float>(color[1]) / 255,
                      static_cast<float>(color[2]) / 255, static_cast<float>(color[3]) / 255);
}

std::vector<std::string> RendererFixture::TakeErrors() { return std::exchange(mErrors, {}); }

void RendererFixture::ForgetDriverErrors() { mKnownDriverErrors = RendererFactory::GetStatistics().errors; }

void RendererFixture::RestartEgl() {
    mEgl.reset();
    std::string error;
    mEgl = detail::EglContext::Open({true, kSurfaceWidth, kSurfaceHeight}, &error);
    ASSERT_TRUE(mEgl) << error;
}

void DrawRawStrip(std::initializer_list<RawAttribute> attributes) {
    glBindBuffer(GL_ARRAY_BUFFER, 0);
    GLuint location = 0;
    for (RawAttribute const& attribute : attributes) {
        glEnableVertexAttribArray(location);
        glVertexAttribPointer(location++, attribute.components, GL_FLOAT, GL_FALSE, 0,
                              attribute.values.data());
    }
    glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
    while (location > 0) glDisableVertexAttribArray(--location);
}

GLint GetInteger(GLenum name) {
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

std::vector<GLint> GetViewport() {
    std::vector<GLint> viewport(4);
    glGetIntegerv(GL_VIEWPORT, viewport.data());
    return viewport;
}

} // namespace Moka::Testing
