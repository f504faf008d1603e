// Render targets: who is bound when, what the host finds afterwards, and clears that nothing in the state
// can stop or widen.
#include "tests/pixel/renderer/RendererFixture.h"

namespace Moka::Testing {
namespace {

class RenderTargetTest : public RendererFixture {
protected:
    static GLint GetDrawBinding() { return GetInteger(GL_DRAW_FRAMEBUFFER_BINDING); }
    static GLint GetReadBinding() { return GetInteger(GL_READ_FRAMEBUFFER_BINDING); }
};

using Viewport = std::vector<GLint>;

TEST_F(RenderTargetTest, TheHostFindsItsFrameBuffersAndViewportAgainAfterAnyNesting) {
    HostFrameBuffer const reading(4, 4);
    HostFrameBuffer const drawing(4, 4);
    auto const draw = static_cast<GLint>(drawing.GetName());
    auto const read = static_cast<GLint>(reading.GetName());
    glBindFramebuffer(GL_READ_FRAMEBUFFER, reading.GetName());
    glViewport(3, 5, 7, 11);
    TexturePtr const texture = MakeTexture(9, 8);
    TexturePtr const otherTexture = MakeTexture(5, 6);
    TargetPtr const target = MakeTarget(*texture);
    TargetPtr const other = MakeTarget(*otherTexture);

    target->Activate();
    GLint const ours = GetDrawBinding();
    EXPECT_NE(ours, draw);
    EXPECT_EQ(GetReadBinding(), ours);
    EXPECT_EQ(GetViewport(), (Viewport{0, 0, 9, 8}));
    target->Activate();
    other->Activate();
    EXPECT_NE(GetDrawBinding(), ours);
    EXPECT_EQ(GetViewport(), (Viewport{0, 0, 5, 6}));
    target->Deactivate(false, false); // not the active one: nothing happens
    EXPECT_EQ(GetViewport(), (Viewport{0, 0, 5, 6}));
    target->Activate();
    EXPECT_EQ(GetDrawBinding(), ours);
    for (int i = 0; i < 3; ++i) {
        target->Deactivate(false, false);
        EXPECT_EQ(GetDrawBinding(), draw);
        EXPECT_EQ(GetReadBinding(), read);
        EXPECT_EQ(GetViewport(), (Viewport{3, 5, 7, 11}));
    }
}

TEST_F(RenderTargetTest, ActivatingTheActiveTargetCallsNothing) {
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    target->Activate();
    std::uint64_t const switches = RendererFactory::GetStatistics().frameBufferSwitches;
    for (int i = 0; i < 5; ++i) target->Activate();
    Clear(*target, kRed);
    Read(*target, 4, 4);
    EXPECT_EQ(RendererFactory::GetStatistics().frameBufferSwitches, switches);
}

TEST_F(RenderTargetTest, OperationsOnOtherTargetsLeaveTheActiveOneActive) {
    TexturePtr const texture = MakeTexture(4, 4);
    TexturePtr const otherTexture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    TargetPtr const other = MakeTarget(*otherTexture);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    target->Activate();
    GLint const ours = GetDrawBinding();
    auto const expectStillOurs = [&](char const* after) {
        EXPECT_EQ(GetDrawBinding(), ours) << after;
        EXPECT_EQ(GetReadBinding(), ours) << after;
    };
    Clear(*other, kRed);
    expectStillOurs("clear");
    Read(*other, 4, 4);
    expectStillOurs("read");
    other->AttachDepthStencil(buffer.get());
    expectStillOurs("attach");
    other->ClearDepthStencil(true, 1, true, 0);
    expectStillOurs("clear depth and stencil");
    other->DetachDepthStencil();
    expectStillOurs("detach");
    TexturePtr const fresh = MakeTexture(4, 4);
    expectStillOurs("new texture");
    MakeTarget(*fresh).reset();
    expectStillOurs("target made and released");
    fresh->CopyFromRenderTarget();
    fresh->DrawToCurrent();
    expectStillOurs("copies");
    EXPECT_EQ(Read(*otherTexture), Image(4, 4, kRed));
}

TEST_F(RenderTargetTest, ReleasingTheActiveTargetGivesTheHostItsFrameBufferBack) {
    HostFrameBuffer const host(4, 4);
    TexturePtr const texture = MakeTexture(2, 2);
    TargetPtr target = MakeTarget(*texture);
    target->Activate();
    target.reset();
    EXPECT_EQ(GetDrawBinding(), static_cast<GLint>(host.GetName()));
}

TEST_F(RenderTargetTest, ActivationLeavesScissorStencilBlendAndMasksAlone) {
    glEnable(GL_SCISSOR_TEST);
    glEnable(GL_STENCIL_TEST);
    glEnable(GL_BLEND);
    glColorMask(GL_FALSE, GL_TRUE, GL_TRUE, GL_FALSE);
    glStencilMask(0x11);
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    auto const expectUnchanged = [] {
        EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
        EXPECT_TRUE(glIsEnabled(GL_STENCIL_TEST));
        EXPECT_TRUE(glIsEnabled(GL_BLEND));
        GLboolean mask[4];
        glGetBooleanv(GL_COLOR_WRITEMASK, mask);
        EXPECT_TRUE(!mask[0] && mask[1] && mask[2] && !mask[3]);
        EXPECT_EQ(GetInteger(GL_STENCIL_WRITEMASK), 0x11);
    };
    target->Activate();
    expectUnchanged();
    target->Deactivate(false, false);
    expectUnchanged();
}

TEST_F(RenderTargetTest, InvertedTrianglesAreDrawnWhateverTheHostCullsAndTheHostGetsItBack) {
    TexturePtr const texture = MakeTexture(3, 3);
    TargetPtr const target = MakeTarget(*texture);
    RawQuad const quad("color = vec4(1, 0, 0, 1);");
    glCullFace(GL_FRONT_AND_BACK);
    glDepthFunc(GL_NEVER);
    constexpr GLenum kObstacles[] = {GL_CULL_FACE, GL_DEPTH_TEST, GL_RASTERIZER_DISCARD};
    for (GLenum obstacle : kObstacles) glEnable(obstacle);
    DepthStencilPtr const buffer = MakeDepthStencil(3, 3);
    target->AttachDepthStencil(buffer.get());
    target->Activate();
    quad.Draw();
    target->Deactivate(false, false);
    EXPECT_EQ(Read(*texture), Image(3, 3, kRed));
    for (GLenum obstacle : kObstacles) EXPECT_TRUE(glIsEnabled(obstacle)) << obstacle;
}

TEST_F(RenderTargetTest, ATargetMadeAfterADeletionIsBoundAnew) {
    RendererFactory::SetDeferred(true); // so that the shadow is trusted from call to call
    for (Pixel color : {kRed, kGreen, kBlue}) {
        // Deactivated but still bound when its frame buffer goes, whose name the next one may get.
        TexturePtr const texture = MakeTexture(Image(2, 2));
        TargetPtr const target = MakeTarget(*texture);
        target->Activate();
        Clear(*target, color);
        target->Deactivate(false, false);
        EXPECT_EQ(Read(*target, 2, 2), Image(2, 2, color));
    }
}

TEST_F(RenderTargetTest, ClearColorIgnoresTheColourMaskAndObeysTheScissor) {
    TexturePtr const texture = MakeTexture(Image(8, 6, kGreen));
    TargetPtr const target = MakeTarget(*texture);
    glClearColor(0.25f, 0.5f, 0.75f, 1);
    glColorMask(GL_FALSE, GL_FALSE, GL_FALSE, GL_FALSE);
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 1, 3, 2);
    glEnable(GL_RASTERIZER_DISCARD);
    Clear(*target, kRed);
    EXPECT_EQ(Read(*texture), Image(8, 6, kGreen).With(2, 1, Image(3, 2, kRed), 0, 0, 3, 2));

    GLboolean mask[4];
    glGetBooleanv(GL_COLOR_WRITEMASK, mask);
    EXPECT_FALSE(mask[0] || mask[1] || mask[2] || mask[3]);
    GLfloat color[4];
    glGetFloatv(GL_COLOR_CLEAR_VALUE, color);
    EXPECT_EQ(color[1], 0.5f);
    EXPECT_TRUE(glIsEnabled(GL_RASTERIZER_DISCARD));

    glDisable(GL_SCISSOR_TEST);
    Clear(*target, Pixel{1, 2, 3, 4});
    EXPECT_EQ(Read(*texture), Image(8, 6, Pixel{1, 2, 3, 4}));
}

TEST_F(RenderTargetTest, TheHostsFrameBufferIsCapturedAndNeverDeleted) {
    HostFrameBuffer const host(6, 4);
    HostFrameBuffer const later(6, 4);
    glBindFramebuffer(GL_FRAMEBUFFER, host.GetName());
    TargetPtr fromDefault(RendererFactory::CreateRenderTargetFromDefault(6, 4));
    TargetPtr fromCurrent(RendererFactory::CreateRenderTargetFromCurrent(6, 4));
    glBindFramebuffer(GL_FRAMEBUFFER, later.GetName());
    Clear(*fromDefault, kRed);
    EXPECT_EQ(host.Read(), Image(6, 4, kRed));
    Clear(*fromCurrent, kBlue);
    EXPECT_EQ(host.Read(), Image(6, 4, kBlue));
    EXPECT_EQ(Read(*fromDefault, 6, 4), Image(6, 4, kBlue));
    EXPECT_EQ(later.Read(), Image(6, 4));
    fromDefault.reset();
    fromCurrent.reset();
    EXPECT_TRUE(glIsFramebuffer(host.GetName()));
}

TEST_F(RenderTargetTest, BeneathAnActiveTargetDefaultIsTheHostsAndCurrentIsTheTargets) {
    HostFrameBuffer const host(4, 4);
    TexturePtr texture = MakeTexture(4, 4);
    TargetPtr target = MakeTarget(*texture);
    target->Activate();
    TargetPtr const fromDefault(RendererFactory::CreateRenderTargetFromDefault(4, 4));
    TargetPtr const fromCurrent(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    target.reset();
    Clear(*fromDefault, kRed);
    Clear(*fromCurrent, kGreen);
    EXPECT_EQ(host.Read(), Image(4, 4, kRed));
    EXPECT_EQ(Read(*texture), Image(4, 4, kGreen));
}

TEST_F(RenderTargetTest, TheDefaultFrameBufferIsBottomUpAndReadWithoutAFlip) {
    constexpr int kWidth = kSurfaceWidth;
    constexpr int kHeight = kSurfaceHeight;
    TargetPtr const target(RendererFactory::CreateRenderTargetFromDefault(kWidth, kHeight));
    Clear(*target, kGreen);
    glEnable(GL_SCISSOR_TEST);
    glScissor(0, 0, kWidth, 8);
    Clear(*target, kRed);
    glDisable(GL_SCISSOR_TEST);
    Image const expected = Image(kWidth, kHeight, kGreen).With(0, 0, Image(kWidth, 8, kRed), 0, 0, kWidth, 8);
    EXPECT_EQ(Read(*target, kWidth, kHeight), expected);
    EXPECT_EQ(GetDrawBinding(), 0);
}

TEST_F(RenderTargetTest, DiscardingNamesThePartsByTheKindOfTheFrameBuffer) {
    // The fixture fails on any GL error, which the wrong names would be.
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(buffer.get());
    HostFrameBuffer const host(4, 4);
    TargetPtr const hosts(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    TargetPtr const zero(RendererFactory::CreateRenderTargetFromDefault(4, 4));
    std::vector<IRenderTarget*> targets{target.get(), hosts.get()};
    targets.push_back(zero.get());
    for (IRenderTarget* each : targets) {
        for (int flags = 0; flags < 4; ++flags) {
            each->Activate();
            each->Deactivate(flags & 1, flags & 2);
            EXPECT_EQ(GetDrawBinding(), 0);
        }
    }
    // Only the depth and stencil were dropped the last but one time.
    Clear(*target, kBlue);
    target->Activate();
    target->Deactivate(false, true);
    EXPECT_EQ(Read(*texture), Image(4, 4, kBlue));
}

TEST_F(RenderTargetTest, ADriverErrorIsLoggedCountedAndHarmless) {
    // Incomplete: nothing can be read from it.
    GLuint incomplete = 0;
    glGenFramebuffers(1, &incomplete);
    glBindFramebuffer(GL_FRAMEBUFFER, incomplete);
    TargetPtr const target(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    Image image(4, 4);
    target->ReadPixels(0, 0, 4, 4, {image.pixels.data(), 4, 0, 0});
    EXPECT_EQ(image, Image(4, 4));
    EXPECT_GE(RendererFactory::GetStatistics().errors, 1u);
    EXPECT_GE(TakeErrors().size(), 1u);
    ForgetDriverErrors();
    glDeleteFramebuffers(1, &incomplete);
}

} // namespace
} // namespace Moka::Testing
