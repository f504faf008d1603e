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
    for (int i = 0; i < width * height; ++i) {
        auto const x = static_cast<std::uint8_t>(i % width);
        auto const y = static_cast<std::uint8_t>(i / width);
        image.SetColor(x, y, {x, y, 0x5A, static_cast<std::uint8_t>(7 * x + 13 * y + 1)});
    }
    return image;
}

std::array<float, 4> ToFloats(Color const& color) {
    std::array<float, 4> floats{};
    for (std::size_t i = 0; i < 4; ++i) floats[i] = static_cast<float>(color[i]) / 255;
    return floats;
}

HostFrameBuffer::HostFrameBuffer(int width, int height, GLenum format, Color const& fill)
    : mWidth(width), mHeight(height) {
    glGenRenderbuffers(1, &mColor);
    glBindRenderbuffer(GL_RENDERBUFFER, mColor);
    glRenderbufferStorage(GL_RENDERBUFFER, format, width, height);
    glGenFramebuffers(1, &mName);
    glBindFramebuffer(GL_FRAMEBUFFER, mName);
    glFramebufferRenderbuffer(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_RENDERBUFFER, mColor);
    EXPECT_EQ(glCheckFramebufferStatus(GL_FRAMEBUFFER), GLenum{GL_FRAMEBUFFER_COMPLETE});
    glClearBufferfv(GL_COLOR, 0, ToFloats(fill).data());
}

HostFrameBuffer::~HostFrameBuffer() {
    glDeleteFramebuffers(1, &mName);
    glDeleteRenderbuffers(1, &mColor);
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
    // Holds the display open for the life of the process. A driver is unloaded with its last display, and what
    // it had not freed is then reported as leaked without a stack that tells whose it was. Stored for real, so
    // that the leak checker finds it.
    std::string error;
    [[gnu::used]] static detail::EglContext const* kept = detail::EglContext::Open({}, &error).release();
    StartEgl();
    EXPECT_TRUE(Attach());
}

RendererFixture::~RendererFixture() {
    ExpectNothingLeft(RendererFactory::GetStatistics(), 0, mKnownDriverErrors);
    RendererFactory::DetachContext();
    RendererStatistics const after = RendererFactory::GetStatistics();
    EXPECT_EQ(after.pooledRenderBuffers + after.buffers, 0);
    EXPECT_EQ(glGetError(), GLenum{GL_NO_ERROR});
    EXPECT_EQ(TakeErrors(), std::vector<std::string>{});
    SetLogSink(nullptr);
}

bool RendererFixture::Attach(RendererLimits const& limits) {
    return RendererFactory::AttachContext(limits, eglGetProcAddress);
}

TexturePtr RendererFixture::MakeTexture(int width, int height, PixelSource const& source) {
    TextureDescriptor const descriptor(width, height, 0, 2, 6, 1, false, nullptr);
    return TexturePtr(RendererFactory::CreateTextureObject(descriptor, nullptr, 0, source));
}

TexturePtr RendererFixture::MakeTexture(Picture const& image) {
    return MakeTexture(image.width, image.height, {image.pixels.data(), 0, 0, image.width});
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
    auto const [r, g, b, a] = ToFloats(color);
    target.ClearColor(r, g, b, a);
}

std::vector<std::string> RendererFixture::TakeErrors() { return std::exchange(mErrors, {}); }

void RendererFixture::ForgetDriverErrors() { mKnownDriverErrors = RendererFactory::GetStatistics().errors; }

void RendererFixture::StartEgl() {
    mEgl.reset();
    std::string error;
    mEgl = detail::EglContext::Open({true, kSurfaceWidth, kSurfaceHeight}, &error);
    ASSERT_TRUE(mEgl) << error;
}

GLint GetInteger(GLenum name) {
    GLint value = 0;
    glGetIntegerv(name, &value);
    return value;
}

} // namespace Moka::Testing
