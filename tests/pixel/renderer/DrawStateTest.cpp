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

TEST_P(DrawStateTest, EveryFactorBlends) {
    struct Row {
        BlendingFactor source, destination;
        Pixel expected;
    };
    // Source (200, 100, 0, 128) over (100, 200, 50, 64), in bytes.
    Row const rows[] = {
        {BlendingFactor::One, BlendingFactor::Zero, {200, 100, 0, 128}},
        {BlendingFactor::Zero, BlendingFactor::One, {100, 200, 50, 64}},
        {BlendingFactor::Zero, BlendingFactor::SrcColor, {78, 78, 0, 32}},
        {BlendingFactor::SrcAlpha, BlendingFactor::Zero, {100, 50, 0, 64}},
        {BlendingFactor::OneMinusSrcAlpha, BlendingFactor::Zero, {100, 50, 0, 64}},
        {BlendingFactor::Zero, BlendingFactor::DstAlpha, {25, 50, 13, 16}},
        {BlendingFactor::Zero, BlendingFactor::OneMinusDstAlpha, {75, 150, 37, 48}},
        {BlendingFactor::One, BlendingFactor::One, {255, 255, 50, 192}},
    };
    target->Activate();
    int x = 0;
    for (Row const& row : rows) {
        BlendStateDescriptor descriptor(true);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        auto const left = static_cast<float>(x++);
        Fill(Pixel{100, 200, 50, 64}, left, 0, left + 1, 8);
        descriptor.SetColorEquation(BlendingFunction::Add, row.source, row.destination);
        // The lower half blends alpha another way.
        descriptor.SetAlphaEquation(BlendingFunction::Add, row.source, row.destination);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        Fill(Pixel{200, 100, 0, 128}, left, 0, left + 1, 4);
        descriptor.SetAlphaEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::Zero);
        blend->SetDescriptor(descriptor);
        blend->Apply();
        Fill(Pixel{200, 100, 0, 128}, left, 4, left + 1, 8);
    }
    target->Deactivate(false, false);
    Image const image = Read();
    for (x = 0; x < 8; ++x) {
        Pixel const upper = image.At(x, 1);
        Pixel const expected = rows[x].expected;
        EXPECT_NEAR(upper.r, expected.r, 1) << x;
        EXPECT_NEAR(upper.g, expected.g, 1) << x;
        EXPECT_NEAR(upper.b, expected.b, 1) << x;
        EXPECT_NEAR(upper.a, expected.a, 1) << x;
        EXPECT_NEAR(image.At(x, 6).r, expected.r, 1) << x;
        EXPECT_EQ(image.At(x, 6).a, 128) << x;
    }
}

TEST_P(DrawStateTest, BothFlagsOffMaskColourAndClearsDoNotCare) {
    target->Activate();
    blend->SetDescriptor(BlendStateDescriptor(false));
    blend->Apply();
    Fill(kRed, 0, 0, 8, 8);
    EXPECT_EQ(Read(), Filled(kClear));
    target->ClearColor(0, 1, 0, 1);
    Fill(kRed, 0, 0, 8, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), Filled(kGreen));
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

TEST_P(DrawStateTest, WithoutAnActiveTargetTheHostsFrameBufferIsDrawnInto) {
    RendererFactory::Flush();
    HostFrameBuffer const host(kSize, kSize);
    glViewport(0, 0, kSize, kSize);
    RendererFactory::InvalidateState();
    Clear(*target, kBlue);
    Fill(kRed, 0, 0, 8, 4);
    RendererFactory::Flush();
    EXPECT_EQ(host.Read().At(1, 1), kRed);
    EXPECT_EQ(Read(), Filled(kBlue));
}

TEST_P(DrawStateTest, ForeignGlDrawsUnderWhatIsInForceAfterACommit) {
    RawQuad const foreign("color = vec4(0, 1, 0, 1);");
    RendererFactory::InvalidateState();
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    rasterizer->SetScissorRect({0, 0, 4, 8});
    rasterizer->SetScissorEnabled(true);
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    RendererFactory::Commit();
    target->Activate();
    foreign.Draw();
    glViewport(0, 0, 1, 1);
    glDisable(GL_SCISSOR_TEST);
    RendererFactory::InvalidateState();
    rasterizer->SetScissorEnabled(false);
    Fill(kBlue, 7, 0, 8, 8);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(), With(With(Filled(kClear), kGreen, 0, 0, 4, 8), kBlue, 7, 0, 1, 8));
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
