// Render targets: the host's frame buffers, what may be discarded, copies without alpha, and depth-stencil buffers.
#include "tests/pixel/renderer/RendererFixture.h"

#include <dlfcn.h>

namespace {

// The driver's own function, which the one of the same name here hides.
template <class Function>
Function* FindDrivers(Function*, char const* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

int textureCopies = 0;

} // namespace

// New memory may hold anything, which llvmpipe's never does.
extern "C" [[gnu::visibility("default")]] void glTexImage2D(GLenum target, GLint level, GLint internalFormat,
                                                            GLsizei width, GLsizei height, GLint border,
                                                            GLenum format, GLenum type, void const* pixels) {
    static auto* const make = FindDrivers(&glTexImage2D, "glTexImage2D");
    std::vector<unsigned char> const dirt(pixels ? 0 : static_cast<std::size_t>(width * height) * 4, 0x5A);
    make(target, level, internalFormat, width, height, border, format, type, pixels ? pixels : dirt.data());
}

extern "C" [[gnu::visibility("default")]] void glCopyTexSubImage2D(GLenum target, GLint level, GLint toX,
                                                                   GLint toY, GLint x, GLint y, GLsizei width,
                                                                   GLsizei height) {
    static auto* const copy = FindDrivers(&glCopyTexSubImage2D, "glCopyTexSubImage2D");
    ++textureCopies;
    copy(target, level, toX, toY, x, y, width, height);
}

namespace Moka::Testing {
namespace {

using RenderTargetTest = RendererFixture;

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
            EXPECT_EQ(GetInteger(GL_DRAW_FRAMEBUFFER_BINDING), 0);
        }
    }
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
    EXPECT_GE(Count().errors, 1u);
    EXPECT_GE(TakeErrors().size(), 1u);
    ForgetDriverErrors();
    glDeleteFramebuffers(1, &incomplete);
}

// By a blit: OpenGL ES makes an error of a texture copy that has to invent alpha, which Mesa tolerates.
TEST_F(RenderTargetTest, ATargetWithoutAlphaIsCopiedWithAlphaOne) {
    HostFrameBuffer const host(5, 4, GL_RGB8, Color{10, 20, 30, 40});
    TargetPtr const target(RendererFactory::CreateRenderTargetFromCurrent(5, 4));
    glEnable(GL_SCISSOR_TEST);
    glScissor(0, 0, 1, 1);
    RendererFactory::InvalidateState();
    TexturePtr const copy = MakeTexture(MakeImage(6, 6, kGreen));
    target->Activate();
    int const before = textureCopies;
    copy->CopyFromRenderTarget();
    target->Deactivate(false, false);
    EXPECT_EQ(textureCopies, before);
    EXPECT_TRUE(glIsEnabled(GL_SCISSOR_TEST));
    Picture const solid = MakeImage(5, 4, Color{10, 20, 30, 255});
    EXPECT_EQ(Read(*copy), MakeImage(6, 6, kGreen).With(0, 0, solid));
}

TEST_F(RenderTargetTest, WhatDoesNotFitIsRefusedWithALine) {
    OffscreenImage const image = MakeOffscreen(MakeImage(4, 4));
    HostFrameBuffer const host(4, 4);
    TargetPtr const hosts(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    GLint const bound = GetInteger(GL_RENDERBUFFER_BINDING);
    EXPECT_NE(bound, 0);
    DepthStencilPtr const small = MakeDepthStencil(4, 3);
    DepthStencilPtr const fitting = MakeDepthStencil(4, 4);
    EXPECT_EQ(GetInteger(GL_RENDERBUFFER_BINDING), bound); // the host's, still
    image.target->AttachDepthStencil(small.get());
    hosts->AttachDepthStencil(fitting.get());
    for (IRenderTarget* const each : {image.target.get(), hosts.get()})
        each->ClearDepthStencil(true, 1, true, 1);
    EXPECT_EQ(Count().clears, 0u);
    EXPECT_FALSE(RendererFactory::CreateDepthStencilBuffer(0, 4));
    EXPECT_EQ(TakeErrors().size(), 3u);
}

TEST_F(RenderTargetTest, ABufferThatGoesIsKeptForTheNextOfItsSizeAndOnlyTheLastFewAre) {
    auto const countKept = [] { return Count().pooledRenderBuffers; };
    MakeDepthStencil(4, 4);
    EXPECT_EQ(countKept(), 1);
    DepthStencilPtr const other = MakeDepthStencil(4, 3);
    EXPECT_EQ(countKept(), 1);
    DepthStencilPtr const same = MakeDepthStencil(4, 4);
    EXPECT_EQ(countKept(), 0);
    for (int i = 5; i <= 25; ++i) MakeDepthStencil(i, 4);
    EXPECT_LE(countKept(), 8);
}

} // namespace
} // namespace Moka::Testing
