// Depth-stencil buffers: attaching, clearing against every mask, and the pool behind them.
#include "tests/pixel/renderer/RendererFixture.h"

namespace Moka::Testing {
namespace {

class DepthStencilTest : public RendererFixture {
protected:
    // Whether the stencil of all of the target has the value.
    static bool IsStencil(OffscreenImage const& image, int value) {
        Clear(*image.target, kGreen);
        RawQuad const quad("color = vec4(1, 0, 0, 1);");
        image.target->Activate();
        glEnable(GL_STENCIL_TEST);
        glStencilFunc(GL_EQUAL, value, 0xFF);
        glStencilOp(GL_KEEP, GL_KEEP, GL_KEEP);
        quad.Draw();
        glDisable(GL_STENCIL_TEST);
        image.target->Deactivate(false, false);
        return Read(*image.texture) == MakeImage(4, 4, kRed);
    }

    static GLint GetAttachment(OffscreenImage const& image) {
        image.target->Activate();
        GLint name = 0;
        glGetFramebufferAttachmentParameteriv(GL_DRAW_FRAMEBUFFER, GL_STENCIL_ATTACHMENT,
                                              GL_FRAMEBUFFER_ATTACHMENT_OBJECT_NAME, &name);
        image.target->Deactivate(false, false);
        return name;
    }
};

TEST_F(DepthStencilTest, ClearingIgnoresTheWriteMasksAndKeepsThem) {
    OffscreenImage const image = MakeOffscreen(MakeImage(4, 4, kGreen));
    image.target->ClearDepthStencil(true, 1, true, 1); // there is none yet
    EXPECT_EQ(RendererFactory::GetStatistics().clears, 0u);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    image.target->AttachDepthStencil(buffer.get());
    glStencilMaskSeparate(GL_FRONT, 0);
    glStencilMaskSeparate(GL_BACK, 0x0F);
    glDepthMask(GL_FALSE);
    image.target->ClearDepthStencil(true, 0.5f, true, 0xA5);
    EXPECT_EQ(GetInteger(GL_STENCIL_WRITEMASK), 0);
    EXPECT_EQ(GetInteger(GL_STENCIL_BACK_WRITEMASK), 0x0F);
    EXPECT_EQ(GetInteger(GL_DEPTH_WRITEMASK), GL_FALSE);
    EXPECT_TRUE(IsStencil(image, 0xA5));

    // Each part alone leaves the other as it is.
    image.target->ClearDepthStencil(true, 1.0f, false, 7);
    EXPECT_TRUE(IsStencil(image, 0xA5));
    image.target->ClearDepthStencil(false, 1.0f, true, 7);
    EXPECT_TRUE(IsStencil(image, 7));
    image.target->DetachDepthStencil();
}

TEST_F(DepthStencilTest, ABufferIsAttachedToTheTargetThatTookItLastUntilEitherGoes) {
    OffscreenImage image = MakeOffscreen(MakeImage(4, 4));
    OffscreenImage const other = MakeOffscreen(MakeImage(4, 4));
    DepthStencilPtr first = MakeDepthStencil(4, 4);
    DepthStencilPtr second = MakeDepthStencil(4, 4);
    image.target->AttachDepthStencil(first.get());
    GLint const name = GetAttachment(image);
    EXPECT_NE(name, 0);
    image.target->AttachDepthStencil(second.get());
    EXPECT_NE(GetAttachment(image), name);
    first.reset(); // replaced: not attached any more, the second one stays
    EXPECT_NE(GetAttachment(image), 0);

    other.target->AttachDepthStencil(second.get());
    EXPECT_EQ(GetAttachment(image), 0);
    image.target->AttachDepthStencil(second.get());
    EXPECT_EQ(GetAttachment(other), 0);
    image.target = {};
    image.target = MakeTarget(*image.texture); // perhaps over the same frame buffer
    EXPECT_EQ(GetAttachment(image), 0);
    image.target->AttachDepthStencil(second.get());
    EXPECT_NE(GetAttachment(image), 0);
    second.reset();
    EXPECT_EQ(GetAttachment(image), 0);
}

TEST_F(DepthStencilTest, AFrameBufferUnderTheNameOfADeletedOneGetsABufferAnew) {
    glBindFramebuffer(GL_FRAMEBUFFER, kLastName);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
    GLint names[2] = {};
    for (GLint& name : names) {
        OffscreenImage const image = MakeOffscreen(MakeImage(4, 4));
        image.target->AttachDepthStencil(buffer.get());
        EXPECT_NE(GetAttachment(image), 0);
        image.target->Activate();
        name = GetInteger(GL_DRAW_FRAMEBUFFER_BINDING);
        image.target->Deactivate(false, false);
    }
    EXPECT_EQ(names[0], names[1]);
    glDeleteFramebuffers(1, &kLastName);
}

TEST_F(DepthStencilTest, WhatDoesNotFitIsRefusedWithALine) {
    OffscreenImage const image = MakeOffscreen(MakeImage(4, 4));
    HostFrameBuffer const host(4, 4);
    OffscreenImage const hosts{nullptr, TargetPtr(RendererFactory::CreateRenderTargetFromCurrent(4, 4))};
    GLint const bound = GetInteger(GL_RENDERBUFFER_BINDING);
    EXPECT_NE(bound, 0);
    DepthStencilPtr const small = MakeDepthStencil(4, 3);
    DepthStencilPtr const fitting = MakeDepthStencil(4, 4);
    EXPECT_EQ(GetInteger(GL_RENDERBUFFER_BINDING), bound); // the host's, still
    image.target->AttachDepthStencil(small.get());
    EXPECT_EQ(GetAttachment(image), 0);
    hosts.target->AttachDepthStencil(fitting.get());
    EXPECT_EQ(GetAttachment(hosts), 0);
    hosts.target->ClearDepthStencil(true, 1, true, 1);
    EXPECT_EQ(RendererFactory::GetStatistics().clears, 0u);
    EXPECT_FALSE(RendererFactory::CreateDepthStencilBuffer(0, 4));
    EXPECT_EQ(TakeErrors().size(), 3u);
}

TEST_F(DepthStencilTest, AClipThatComesBackFindsTheSameRenderBufferAmongTheLastFew) {
    OffscreenImage const image = MakeOffscreen(MakeImage(4, 4));
    GLint first = 0;
    for (int i = 0; i < 3; ++i) {
        DepthStencilPtr const buffer = MakeDepthStencil(4, 4);
        EXPECT_EQ(RendererFactory::GetStatistics().renderBuffers, 1);
        EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, 0);
        image.target->AttachDepthStencil(buffer.get());
        if (i == 0) first = GetAttachment(image);
        EXPECT_EQ(GetAttachment(image), first);
        image.target->DetachDepthStencil();
    }
    std::vector<DepthStencilPtr> others;
    for (int i = 5; i <= 25; ++i) others.push_back(MakeDepthStencil(i % 2 ? i : 4, i % 2 ? 4 : i));
    EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, 1);
    others.clear();
    int const waiting = RendererFactory::GetStatistics().pooledRenderBuffers;
    EXPECT_GE(waiting, 1);
    EXPECT_LE(waiting, 8);
    DepthStencilPtr const last = MakeDepthStencil(25, 4);
    EXPECT_EQ(RendererFactory::GetStatistics().pooledRenderBuffers, waiting - 1);
}

} // namespace
} // namespace Moka::Testing
