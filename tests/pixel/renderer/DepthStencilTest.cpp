// Depth-stencil buffers: attaching, clearing against every mask, and the pool behind them.
#include "tests/pixel/renderer/RendererFixture.h"

namespace Moka::Testing {
namespace {

class DepthStencilTest : public RendererFixture {
protected:
    // Draws red where the stencil of the target has the value; the rest stays as it is.
    static void PaintWhereStencilIs(IRenderTarget& target, int value) {
        RawQuad const quad("color = vec4(1, 0, 0, 1);");
        target.Activate();
        glEnable(GL_STENCIL_TEST);
        glStencilFunc(GL_EQUAL, value, 0xFF);
        glStencilOp(GL_KEEP, GL_KEEP, GL_KEEP);
        quad.Draw();
        glDisable(GL_STENCIL_TEST);
        target.Deactivate(false, false);
    }

    static GLint GetAttachment(IRenderTarget& target) {
        target.Activate();
        GLint name = 0;
        glGetFramebufferAttachmentParameteriv(GL_DRAW_FRAMEBUFFER, GL_STENCIL_ATTACHMENT,
                                              GL_FRAMEBUFFER_ATTACHMENT_OBJECT_NAME, &name);
        target.Deactivate(false, false);
        return name;
    }
};

TEST_F(DepthStencilTest, ClearingTheStencilIgnoresTheWriteMasksAndKeepsThem) {
    TexturePtr const texture = MakeTexture(Image(6, 4, kGreen));
    TargetPtr const target = MakeTarget(*texture);
    DepthStencilPtr const buffer = MakeDepthStencil(6, 4);
    target->AttachDepthStencil(buffer.get());
    glStencilMaskSeparate(GL_FRONT, 0);
    glStencilMaskSeparate(GL_BACK, 0x0F);
    glDepthMask(GL_FALSE);
    target->ClearDepthStencil(true, 0.5f, true, 0xA5);
    EXPECT_EQ(GetInteger(GL_STENCIL_WRITEMASK), 0);
    EXPECT_EQ(GetInteger(GL_STENCIL_BACK_WRITEMASK), 0x0F);
    EXPECT_EQ(GetInteger(GL_DEPTH_WRITEMASK), GL_FALSE);
    PaintWhereStencilIs(*target, 0xA5);
    EXPECT_EQ(Read(*texture), Image(6, 4, kRed));

    // Each part alone leaves the other as it is.
    target->ClearDepthStencil(true, 1.0f, false, 7);
    target->ClearColor(0, 1, 0, 1);
    PaintWhereStencilIs(*target, 0xA5);
    EXPECT_EQ(Read(*texture), Image(6, 4, kRed));
    target->ClearDepthStencil(false, 1.0f, true, 7);
    target->ClearColor(0, 1, 0, 1);
    PaintWhereStencilIs(*target, 7);
    EXPECT_EQ(Read(*texture), Image(6, 4, kRed));
    target->DetachDepthStencil();
}

TEST_F(DepthStencilTest, ClearingWithoutABufferDoesNothing) {
    HostFrameBuffer const host(4, 4);
    TargetPtr const hosts(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    hosts->ClearDepthStencil(true, 1, true, 1);
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    target->ClearDepthStencil(true, 1, true, 1);
    EXPECT_EQ(RendererFactory::GetStatistics().clears, 0u);
    target->DetachDepthStencil();
}

TEST_F(DepthStencilTest, AttachingReplacesAndReleasingDetaches) {
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    DepthStencilPtr first = MakeDepthStencil(4, 4);
    DepthStencilPtr second = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(first.get());
    GLint const name = GetAttachment(*target);
    EXPECT_NE(name, 0);
    target->AttachDepthStencil(second.get());
    EXPECT_NE(GetAttachment(*target), name);
    first.reset(); // replaced: not attached any more, the second one stays
    EXPECT_NE(GetAttachment(*target), 0);
    second.reset();
    EXPECT_EQ(GetAttachment(*target), 0);
}

TEST_F(DepthStencilTest, ABufferMovesWhenItIsAttachedElsewhere) {
    TexturePtr const texture = MakeTexture(4, 4);
    TexturePtr const otherTexture = MakeTexture(4, 4);
    TargetPtr target = MakeTarget(*texture);
    TargetPtr const other = MakeTarget(*otherTexture);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(buffer.get());
    other->AttachDepthStencil(buffer.get());
    EXPECT_EQ(GetAttachment(*target), 0);
    EXPECT_NE(GetAttachment(*other), 0);
    target.reset();
    EXPECT_NE(GetAttachment(*other), 0);
}

TEST_F(DepthStencilTest, ATargetReleasedWithABufferLeavesTheNextTargetOfTheTextureWithoutOne) {
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr target = MakeTarget(*texture);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(buffer.get());
    target.reset();
    target = MakeTarget(*texture);
    EXPECT_EQ(GetAttachment(*target), 0);
}

TEST_F(DepthStencilTest, WhatDoesNotFitIsRefusedWithALine) {
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    HostFrameBuffer const host(4, 4);
    TargetPtr const hosts(RendererFactory::CreateRenderTargetFromCurrent(4, 4));
    DepthStencilPtr const small = MakeDepthStencil(4, 3);
    DepthStencilPtr const fitting = MakeDepthStencil(4, 4);
    target->AttachDepthStencil(small.get());
    EXPECT_EQ(GetAttachment(*target), 0);
    hosts->AttachDepthStencil(fitting.get());
    EXPECT_EQ(GetAttachment(*hosts), 0);
    EXPECT_FALSE(RendererFactory::CreateDepthStencilBuffer(0, 4));
    EXPECT_EQ(TakeErrors().size(), 3u);
}

TEST_F(DepthStencilTest, AClipThatComesBackFindsTheSameRenderBuffer) {
    TexturePtr const texture = MakeTexture(4, 4);
    TargetPtr const target = MakeTarget(*texture);
    GLint first = 0;
    for (int i = 0; i < 3; ++i) {
        DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
        EXPECT_EQ(RendererFactory::GetStatistics().renderBuffers, 1);
        EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, 0);
        target->AttachDepthStencil(buffer.get());
        if (i == 0) first = GetAttachment(*target);
        EXPECT_EQ(GetAttachment(*target), first);
        target->DetachDepthStencil();
    }
    DepthStencilPtr const otherSize = MakeDepthStencil(5, 4);
    EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, 1);
}

TEST_F(DepthStencilTest, ThePoolHoldsOnlyTheLastFew) {
    std::vector<DepthStencilPtr> buffers;
    for (int i = 1; i <= 20; ++i) buffers.push_back(MakeDepthStencil(i, 4));
    buffers.clear();
    int const waiting = RendererFactory::GetStatistics().pooledRenderBuffers;
    EXPECT_GE(waiting, 1);
    EXPECT_LE(waiting, 8);
    DepthStencilPtr const last = MakeDepthStencil(20, 4);
    EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, waiting - 1);
}

TEST_F(DepthStencilTest, TheRenderBufferThatTheHostHasBoundStaysBound) {
    HostFrameBuffer const host(4, 4);
    GLint const bound = GetInteger(GL_RENDERBUFFER_BINDING);
    EXPECT_NE(bound, 0);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    EXPECT_EQ(GetInteger(GL_RENDERBUFFER_BINDING), bound);
}

} // namespace
} // namespace Moka::Testing
