// Render targets: who is bound when, what the host finds afterwards, and clears that nothing in the state
// can stop or widen.
#include "tests/pixel/renderer/RendererFixture.h"

#include <functional>
#include <iterator>

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
    auto [texture, target] = MakeOffscreen(MakeImage(9, 8));
    auto const [otherTexture, other] = MakeOffscreen(MakeImage(5, 6));

    target->Activate();
    GLint const ours = GetDrawBinding();
    EXPECT_NE(ours, draw);
    EXPECT_EQ(GetReadBinding(), ours);
    EXPECT_EQ(GetViewport(), (Viewport{0, 0, 9, 8}));
    std::uint64_t const switches = RendererFactory::GetStatistics().frameBufferSwitches;
    target->Activate(); // active already
    Read(*target, 9, 8);
    EXPECT_EQ(RendererFactory::GetStatistics().frameBufferSwitches, switches);
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
    target->Activate();
    target.reset();
    EXPECT_EQ(GetDrawBinding(), draw);
}

TEST_F(RenderTargetTest, OperationsOnOtherTargetsLeaveTheActiveOneActive) {
    auto const [texture, target] = MakeOffscreen(MakeImage(4, 4));
    OffscreenImage const other = MakeOffscreen(MakeImage(4, 4));
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    TexturePtr fresh;
    target->Activate();
    GLint const ours = GetDrawBinding();
    std::function<void()> const operations[] = {
        [&] { Clear(*other.target, kRed); },
        [&] { Read(*other.target, 4, 4); },
        [&] { other.target->AttachDepthStencil(buffer.get()); },
        [&] { other.target->ClearDepthStencil(true, 1, true, 0); },
        [&] { other.target->DetachDepthStencil(); },
        [&] { fresh = MakeTexture(4, 4); },
        [&] { MakeTarget(*fresh).reset(); },
        [&] { fresh->CopyFromRenderTarget(); },
        [&] { fresh->DrawToCurrent(); },
    };
    for (std::size_t i = 0; i < std::size(operations); ++i) {
        operations[i]();
        EXPECT_EQ(GetDrawBinding(), ours) << i;
        EXPECT_EQ(GetReadBinding(), ours) << i;
    }
    EXPECT_EQ(Read(*other.texture), MakeImage(4, 4, kRed));
}

TEST_F(RenderTargetTest, InvertedTrianglesAreDrawnWhateverTheHostCullsAndTheHostGetsItBack) {
    auto const [texture, target] = MakeOffscreen(MakeImage(3, 3));
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
    EXPECT_EQ(Read(*texture), MakeImage(3, 3, kRed));
    for (GLenum obstacle : kObstacles) EXPECT_TRUE(glIsEnabled(obstacle)) << obstacle;
}

TEST_F(RenderTargetTest, ATargetMadeAfterADeletionIsBoundAnew) {
    RendererFactory::SetDeferred(true); // so that the shadow is trusted from call to call
    for (Color color : {kRed, kGreen, kBlue}) {
        // Deactivated but still bound when its frame buffer goes, whose name the next one may get.
        auto const [texture, target] = MakeOffscreen(MakeImage(2, 2));
        target->Activate();
        Clear(*target, color);
        target->Deactivate(false, false);
        EXPECT_EQ(Read(*target, 2, 2), MakeImage(2, 2, color));
    }
}

TEST_F(RenderTargetTest, ClearColorIgnoresTheColourMaskAndObeysTheScissor) {
    auto const [texture, target] = MakeOffscreen(MakeImage(8, 6, kGreen));
    glClearColor(0.25f, 0.5f, 0.75f, 1);
    glColorMask(GL_FALSE, GL_FALSE, GL_FALSE, GL_FALSE);
    glEnable(GL_SCISSOR_TEST);
    glScissor(2, 1, 3, 2);
    glEnable(GL_RASTERIZER_DISCARD);
    Clear(*target, kRed);
    EXPECT_EQ(Read(*texture), MakeImage(8, 6, kGreen).With(2, 1, MakeImage(3, 2, kRed)));

    EXPECT_EQ(GetColorMask(), (ColorMask{0, 0, 0, 0}));
    GLfloat color[4];
    glGetFloatv(GL_COLOR_CLEAR_VALUE, color);
    EXPECT_EQ(color[1], 0.5f);
    EXPECT_TRUE(glIsEnabled(GL_RASTERIZER_DISCARD));

    glDisable(GL_SCISSOR_TEST);
    Clear(*target, Color{1, 2, 3, 4});
    EXPECT_EQ(Read(*texture), MakeImage(8, 6, Color{1, 2, 3, 4}));
}

TEST_F(RenderTargetTest, TheHostsFrameBufferIsCapturedAndNeverDeleted) {
    HostFrameBuffer const host(4, 4);
    HostFrameBuffer const later(4, 4);
    glBindFramebuffer(GL_FRAMEBUFFER, host.GetName());
    auto [texture, target] = MakeOffscreen(MakeImage(4, 4, kClear));
    TargetPtr fromDefault(RendererFactory::CreateRenderTargetFromDefault(4, 4));
    TargetPtr fromCurrent(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    target->Activate(); // beneath it default is still the host's, and current is the target's
    TargetPtr const defaultBeneath(RendererFactory::CreateRenderTargetFromDefault(4, 4));
    TargetPtr const currentBeneath(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    target.reset();
    glBindFramebuffer(GL_FRAMEBUFFER, later.GetName());
    IRenderTarget* const hosts[] = {fromDefault.get(), fromCurrent.get(), defaultBeneath.get()};
    for (int i = 0; i < 3; ++i) {
        Color const color = i == 0 ? kRed : i == 1 ? kBlue : kGreen;
        Clear(*hosts[i], color);
        EXPECT_EQ(host.Read(), MakeImage(4, 4, color)) << i;
    }
    Clear(*currentBeneath, kRed);
    EXPECT_EQ(Read(*texture), MakeImage(4, 4, kRed));
    EXPECT_EQ(Read(*fromDefault, 4, 4), MakeImage(4, 4, kGreen));
    EXPECT_EQ(later.Read(), MakeImage(4, 4));
    fromDefault.reset();
    fromCurrent.reset();
    EXPECT_TRUE(glIsFramebuffer(host.GetName()));
}

TEST_F(RenderTargetTest, DiscardingNamesThePartsByTheKindOfTheFrameBuffer) {
    // The fixture fails on any GL error, which the wrong names would be.
    auto const [texture, target] = MakeOffscreen(MakeImage(4, 4));
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(buffer.get());
    HostFrameBuffer const host(4, 4);
    TargetPtr const hosts(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    TargetPtr const zero(RendererFactory::CreateRenderTargetFromDefault(4, 4));
    for (IRenderTarget* const each : {target.get(), hosts.get(), zero.get()}) {
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
    EXPECT_EQ(Read(*texture), MakeImage(4, 4, kBlue));
}

TEST_F(RenderTargetTest, ADriverErrorIsLoggedCountedAndHarmless) {
    // Incomplete: nothing can be read from it.
    GLuint incomplete = 0;
    glGenFramebuffers(1, &incomplete);
    glBindFramebuffer(GL_FRAMEBUFFER, incomplete);
    TargetPtr const target(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    Picture image = MakeImage(4, 4);
    target->ReadPixels(0, 0, 4, 4, {image.pixels.data(), 4, 0, 0});
    EXPECT_EQ(image, MakeImage(4, 4));
    EXPECT_GE(RendererFactory::GetStatistics().errors, 1u);
    EXPECT_GE(TakeErrors().size(), 1u);
    ForgetDriverErrors();
    glDeleteFramebuffers(1, &incomplete);
}

} // namespace
} // namespace Moka::Testing
