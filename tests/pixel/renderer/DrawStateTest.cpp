// The states that draws are made under: scissor, blending, stencil, and what is the host's or foreign code's.
#include "tests/pixel/renderer/DrawFixture.h"

namespace Moka::Testing {
namespace {

using DrawStateTest = DrawFixture;

TEST_P(DrawStateTest, TheScissorHoldsForTheDrawsAndClearsItWasSetFor) {
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    target->Activate();
    EXPECT_FALSE(rasterizer->IsScissorEnabled());
    rasterizer->SetScissorRect({1, 2, 3, 4});
    rasterizer->SetScissorEnabled(true);
    Fill(kRed, 0, 0, 8, 8);
    rasterizer->SetScissorRect({5, 0, 2, -1});
    EXPECT_EQ(rasterizer->GetScissorRect(), (ScissorRect{5, 0, 2, 0}));
    Fill(kGreen, 0, 0, 8, 8);
    rasterizer->SetScissorRect({6, 6, 2, 2});
    target->ClearColor(0, 0, 1, 1);
    rasterizer->SetScissorEnabled(false);
    Fill(kGreen, 0, 0, 1, 1);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kRed, 1, 2, 3, 4), kBlue, 6, 6, 2, 2), kGreen, 0, 0, 1, 1));
}

TEST_P(DrawStateTest, AStencilClipHoldsForDrawsAndClearsUntilItIsLifted) {
    DepthStencilPtr const buffer = MakeDepthStencil(kSize, kSize);
    target->AttachDepthStencil(buffer.get());
    target->Activate();
    target->ClearDepthStencil(false, 1, true, 0);
    SetStencil(StencilAlways, 1, StencilIncrementSaturate);
    blend->SetDescriptor(BlendStateDescriptor(false));
    blend->Apply();
    Fill(kRed, 2, 2, 6, 6);
    SetStencil(StencilEqual, 1, StencilKeep);
    RendererFactory::SetStencilClip(true);
    blend->SetDescriptor(BlendStateDescriptor(true));
    blend->Apply();
    StatePtr const plain(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false)));
    plain->Apply(); // as every drawable does
    target->ClearColor(0, 1, 0, 1);
    Fill(kRed, 0, 0, 4, 8);
    RendererFactory::SetStencilClip(false);
    plain->Apply();
    Fill(kBlue, 7, 7, 8, 8);
    target->DetachDepthStencil();
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kGreen, 2, 2, 4, 4), kRed, 2, 2, 2, 4), kBlue, 7, 7, 1, 1));
}

TEST_P(DrawStateTest, EachTargetTestsTheStencilThatItHadThen) {
    TexturePtr const otherTexture = MakeTexture(kSize, kSize);
    TargetPtr const other = MakeTarget(*otherTexture);
    // Given back and taken again: the same render buffer serves both.
    for (IRenderTarget* const one : {target.get(), other.get(), target.get()}) {
        DepthStencilPtr const buffer = MakeDepthStencil(kSize, kSize);
        one->AttachDepthStencil(buffer.get());
        one->Activate();
        one->ClearDepthStencil(false, 1, true, one == target.get() ? 3 : 4);
        SetStencil(StencilEqual, 3, StencilKeep);
        Fill(kRed, 0, 0, 8, 8);
        SetStencil(StencilNotEqual, 3, StencilKeep);
        Fill(kGreen, 0, 0, 4, 8);
        one->Deactivate(false, true);
        one->DetachDepthStencil();
    }
    EXPECT_EQ(Read(), Filled(kRed));
    EXPECT_EQ(RendererFixture::Read(*other, kSize, kSize), With(Filled(kClear), kGreen, 0, 0, 4, 8));
    EXPECT_EQ(Count().renderBuffers, 0);
    EXPECT_EQ(Count().pooledRenderBuffers, 1);
}

TEST_P(DrawStateTest, AfterForeignGlADrawThatSetsNoBlendStateReplaces) {
    target->Activate();
    BlendStateDescriptor adding(true);
    adding.SetColorEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
    adding.SetAlphaEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
    blend->SetDescriptor(adding);
    blend->Apply();
    Fill(kRed, 0, 0, 8, 8);
    RendererFactory::InvalidateState();
    Fill(kBlue, 0, 0, 4, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), With(Filled(kRed), kBlue, 0, 0, 4, 8));
}

TEST_P(DrawStateTest, WithoutAnActiveTargetTheHostsFrameBufferIsDrawnInto) {
    RendererFactory::Flush();
    HostFrameBuffer const host(kSize, kSize);
    glViewport(0, 0, kSize, kSize);
    RendererFactory::InvalidateState();
    Clear(*target, kBlue);
    Fill(kRed, 0, 0, 8, 4);
    RendererFactory::Flush();
    EXPECT_EQ(host.Read().GetColor(1, 1), kRed);
    EXPECT_EQ(Read(), Filled(kBlue));
}

TEST_P(DrawStateTest, TheHostsVertexArrayAndBufferComeBack) {
    GLuint array = 0;
    GLuint buffer = 0;
    glGenVertexArrays(1, &array);
    glGenBuffers(1, &buffer);
    glBindVertexArray(array);
    glBindBuffer(GL_ARRAY_BUFFER, buffer);
    RendererFactory::InvalidateState();
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    target->Deactivate(false, false);
    RendererFactory::Flush();
    EXPECT_EQ(GetInteger(GL_VERTEX_ARRAY_BINDING), static_cast<GLint>(array));
    EXPECT_EQ(GetInteger(GL_ARRAY_BUFFER_BINDING), static_cast<GLint>(buffer));
    EXPECT_EQ(Read(), Filled(kRed));
    glDeleteBuffers(1, &buffer);
    glDeleteVertexArrays(1, &array);
    RendererFactory::InvalidateState();
}

INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, DrawStateTest, ::testing::Bool(), GetDrawMode);

} // namespace
} // namespace Moka::Testing
