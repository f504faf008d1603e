// Copies within the GPU: of the render target into a texture, and of a texture into the render target.
#include "tests/pixel/renderer/RendererFixture.h"

#include <dlfcn.h>

// In the driver's place: OpenGL ES makes an error of a copy that has to invent alpha, which Mesa tolerates.
extern "C" [[gnu::visibility("default")]] void glCopyTexSubImage2D(GLenum target, GLint level, GLint toX,
                                                                   GLint toY, GLint x, GLint y, GLsizei width,
                                                                   GLsizei height) {
    GLint alphaBits = 8;
    if (Moka::Testing::GetInteger(GL_READ_FRAMEBUFFER_BINDING) != 0) {
        glGetFramebufferAttachmentParameteriv(GL_READ_FRAMEBUFFER, GL_COLOR_ATTACHMENT0,
                                              GL_FRAMEBUFFER_ATTACHMENT_ALPHA_SIZE, &alphaBits);
    }
    EXPECT_GT(alphaBits, 0) << "a texture copy out of a frame buffer without alpha";
    static auto* const copy =
        reinterpret_cast<decltype(&glCopyTexSubImage2D)>(dlsym(RTLD_NEXT, "glCopyTexSubImage2D"));
    copy(target, level, toX, toY, x, y, width, height);
}

namespace Moka::Testing {
namespace {

// Everything that could come between a texture and the frame buffer, set so that a draw would show nothing.
void ObstructDrawing() {
    glEnable(GL_SCISSOR_TEST);
    glScissor(1, 1, 1, 1);
    glEnable(GL_BLEND);
    glBlendFunc(GL_ZERO, GL_ZERO);
    glEnable(GL_STENCIL_TEST);
    glStencilFunc(GL_NEVER, 0, 0xFF);
    glStencilMask(0x11);
    glColorMask(GL_FALSE, GL_FALSE, GL_FALSE, GL_FALSE);
}

void ExpectStillObstructed() {
    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    EXPECT_TRUE(glIsEnabled(GL_BLEND));
    EXPECT_TRUE(glIsEnabled(GL_STENCIL_TEST));
    EXPECT_EQ(GetColorMask(), (ColorMask{0, 0, 0, 0}));
    EXPECT_EQ(GetInteger(GL_STENCIL_WRITEMASK), 0x11);
}

class TextureCopyTest : public RendererFixture, public ::testing::WithParamInterface<bool> {
protected:
    void SetUp() override {
        RendererFixture::SetUp();
        RendererFactory::SetDeferred(GetParam());
    }
};
INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, TextureCopyTest, ::testing::Bool(), GetDrawMode);

TEST_P(TextureCopyTest, ACopyOfTheTargetHasTheSmallerOfBothSizesAndNoFlip) {
    Picture const image = MakePattern(7, 5);
    auto const [texture, target] = MakeOffscreen(image);
    for (auto const& [width, height] : {std::pair{7, 5}, {4, 3}, {9, 8}, {4, 8}, {9, 2}}) {
        TexturePtr const copy = MakeTexture(MakeImage(width, height, kGreen));
        target->Activate();
        copy->CopyFromRenderTarget();
        target->Deactivate(false, false);
        int const w = std::min(width, 7);
        int const h = std::min(height, 5);
        EXPECT_EQ(Read(*copy), MakeImage(width, height, kGreen).With(0, 0, image.Crop(0, 0, w, h)))
            << width << height;
    }
}

TEST_P(TextureCopyTest, ACopyOfTheTargetIgnoresTheStateAndKeepsTheBindings) {
    Picture const image = MakePattern(6, 6);
    auto const [texture, target] = MakeOffscreen(image);
    TexturePtr const bound = MakeTexture(2, 2);
    TexturePtr const copy = MakeTexture(6, 6);
    ObstructDrawing();
    RendererFactory::InvalidateState();
    target->Activate();
    bound->Bind(0);
    RendererFactory::Commit();
    glActiveTexture(GL_TEXTURE0);
    GLint const frameBuffer = GetInteger(GL_DRAW_FRAMEBUFFER_BINDING);
    GLint const name = GetInteger(GL_TEXTURE_BINDING_2D);
    RendererFactory::InvalidateState();
    copy->CopyFromRenderTarget();
    RendererFactory::Commit();
    EXPECT_EQ(GetInteger(GL_DRAW_FRAMEBUFFER_BINDING), frameBuffer);
    EXPECT_EQ(GetInteger(GL_READ_FRAMEBUFFER_BINDING), frameBuffer);
    EXPECT_EQ(GetInteger(GL_TEXTURE_BINDING_2D), name);
    target->Deactivate(false, false);
    ExpectStillObstructed();
    EXPECT_EQ(Read(*copy), image);
}

TEST_P(TextureCopyTest, ATargetWithoutAlphaIsCopiedWithAlphaOne) {
    HostFrameBuffer const host(5, 4, GL_RGB8);
    host.Fill(Color{10, 20, 30, 40});
    TargetPtr const target(RendererFactory::CreateRenderTargetFromCurrent(5, 4));
    glEnable(GL_SCISSOR_TEST);
    glScissor(0, 0, 1, 1);
    RendererFactory::InvalidateState();
    TexturePtr const copy = MakeTexture(MakeImage(6, 6, kGreen));
    target->Activate();
    copy->CopyFromRenderTarget();
    target->Deactivate(false, false);
    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    Picture const solid = MakeImage(5, 4, Color{10, 20, 30, 255});
    EXPECT_EQ(Read(*copy), MakeImage(6, 6, kGreen).With(0, 0, solid));
}

TEST_P(TextureCopyTest, WithoutAnActiveTargetTheHostsFrameBufferIsTheCurrentOne) {
    HostFrameBuffer const host(4, 3);
    RendererFactory::InvalidateState();
    TexturePtr const texture = MakeTexture(MakePattern(4, 3));
    TexturePtr const copy = MakeTexture(4, 3);
    { // What was active last must not be taken for it.
        auto const [other, last] = MakeOffscreen(MakeImage(4, 3));
        last->Activate();
        last->Deactivate(false, false);
        texture->DrawToCurrent();
        copy->CopyFromRenderTarget();
    }
    RendererFactory::Flush();
    EXPECT_EQ(host.Read(), MakePattern(4, 3));
    RendererFactory::InvalidateState();
    EXPECT_EQ(Read(*copy), MakePattern(4, 3));
}

TEST_P(TextureCopyTest, ATextureDrawsItselfTexelForTexelThroughAnyState) {
    Picture const image = MakePattern(5, 4);
    TexturePtr const source = MakeTexture(image);
    auto const [texture, target] = MakeOffscreen(MakeImage(7, 3, kGreen));
    DepthStencilPtr const buffer = MakeDepthStencil(7, 3);
    target->AttachDepthStencil(buffer.get());
    ObstructDrawing();
    RendererFactory::InvalidateState();
    target->Activate();
    source->DrawToCurrent();
    target->Deactivate(false, false);
    RendererFactory::Flush();
    ExpectStillObstructed();
    EXPECT_EQ(Read(*texture), MakeImage(7, 3, kGreen).With(0, 0, image.Crop(0, 0, 5, 3)));
    EXPECT_EQ(Read(*source), image);
}

TEST_P(TextureCopyTest, ATextureDrawsItselfIntoTheLowerLeftOfTheDefaultFrameBuffer) {
    constexpr int kWidth = kSurfaceWidth;
    constexpr int kHeight = kSurfaceHeight;
    TargetPtr const target(RendererFactory::CreateRenderTargetFromDefault(kWidth, kHeight));
    Clear(*target, kBlue);
    TexturePtr const source = MakeTexture(MakePattern(8, 8));
    target->Activate();
    source->DrawToCurrent();
    TexturePtr const copy = MakeTexture(kWidth, kHeight);
    copy->CopyFromRenderTarget();
    target->Deactivate(false, false);
    Picture const expected = MakeImage(kWidth, kHeight, kBlue).With(0, 0, MakePattern(8, 8));
    EXPECT_EQ(Read(*target, kWidth, kHeight), expected);
    EXPECT_EQ(Read(*copy), expected);
}

TEST_P(TextureCopyTest, ATextureOverTheActiveTargetsStorageCopiesNothing) {
    Picture const image = MakePattern(5, 4);
    auto const [texture, target] = MakeOffscreen(image);
    TexturePtr const view = MakeView(*texture);
    target->Activate();
    for (ITextureObject* each : {texture.get(), view.get()}) {
        each->DrawToCurrent();
        each->CopyFromRenderTarget();
    }
    target->Deactivate(false, false);
    EXPECT_EQ(RendererFactory::GetStatistics().copies, 0u);
    EXPECT_EQ(Read(*texture), image);
}

} // namespace
} // namespace Moka::Testing
