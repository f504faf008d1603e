// Draws: what reaches GL, in which order, and how few calls it takes.
#include "tests/pixel/renderer/DrawFixture.h"

#include <EGL/egl.h>
#include <GLES2/gl2ext.h>

namespace Moka::Testing {
namespace {

using DrawTest = DrawFixture;

TEST_P(DrawTest, DrawsKeepTheirOrderAndAdjacentOnesThatShareEverythingAreOneCall) {
    target->Activate();
    target->ClearColor(0, 0, 1, 1);
    blend->Apply();
    stencil->Apply();
    Fill(kRed, 0, 0, 1, 4);
    std::uint64_t const before = Count().draws;
    for (int i = 1; i < 8; ++i) {
        // What is set again to what it is changes nothing.
        target->Activate();
        blend->Apply();
        stencil->Apply();
        Fill(kRed, static_cast<float>(i), 0, static_cast<float>(i + 1), 4);
    }
    Fill(kGreen, 2, 2, 4, 8);
    // The values and vertices of the next one do not reach the ones before.
    Fill(kRed, 3, 3, 4, 4);
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kBlue), kRed, 0, 0, 8, 4), kGreen, 2, 2, 2, 6), kRed, 3, 3, 1, 1));
    EXPECT_EQ(Count().draws, before + 3);
    EXPECT_EQ(Count().drawRequests, 10u);
}

void GL_APIENTRY KeepGroup(GLenum, GLenum type, GLuint, GLenum, GLsizei, GLchar const* text,
                           void const* user) {
    auto* const groups = static_cast<std::vector<std::string>*>(const_cast<void*>(user));
    if (type == GL_DEBUG_TYPE_PUSH_GROUP_KHR) groups->emplace_back(text);
    if (type == GL_DEBUG_TYPE_POP_GROUP_KHR) groups->emplace_back("end");
}

TEST_P(DrawTest, AFlushIsAGroupForGlDebuggers) {
    RendererFactory::SetDeferred(true);
    std::string const number = std::to_string(Count().flushes + 1);
    auto const setCallback =
        reinterpret_cast<PFNGLDEBUGMESSAGECALLBACKKHRPROC>(eglGetProcAddress("glDebugMessageCallbackKHR"));
    std::vector<std::string> groups;
    setCallback(KeepGroup, &groups);
    target->Activate();
    blend->Apply();
    stencil->Apply();
    Fill(kRed, 0, 0, 1, 4);
    Fill(kRed, 1, 0, 2, 4);
    Fill(kGreen, 1, 0, 2, 4);
    RendererFactory::Flush();
    setCallback(nullptr, nullptr);
    EXPECT_EQ(groups, (std::vector<std::string>{"moka flush " + number + ": 3 draws, 1 runs", "end"}));
    target->Deactivate(false, false);
}

TEST_P(DrawTest, CountsAndFirstAreCutToWhatIsThere) {
    target->Activate();
    colored->program->MakeCurrent();
    std::array<float, 4> const red{1, 0, 0, 1};
    colored->parameter->Set(red.data());
    float const two[] = {0, 0, 0, 4, 8, 0, 0, 8, 0, 4, 8, 8, 8, 8};
    quad->SetVertices(0, two, 7);
    EXPECT_TRUE(quad->Draw(3, 3, 1));
    EXPECT_TRUE(quad->Draw(9, -1, 1));
    EXPECT_TRUE(quad->Draw(0, 0, 1));
    EXPECT_EQ(Read().GetColor(1, 1), kClear);
    EXPECT_EQ(Read().GetColor(0, 6), kRed);
    quad->SetVertices(0, nullptr, 0);
    target->ClearColor(0, 0, 0, 0);
    EXPECT_TRUE(quad->Draw(0, -1, 1));
    EXPECT_EQ(Read(), Filled(kClear));

    // What is refused leaves nothing of the old behind.
    quad->SetVertices(0, two, 7);
    quad->SetVertices(1, two, 3);
    EXPECT_TRUE(quad->Draw(0, -1, 1));
    quad->SetVertices(0, nullptr, 3);
    quad->SetVertices(0, two, -1);
    EXPECT_FALSE(quad->Draw(0, -1, 2));
    EXPECT_EQ(TakeErrors().size(), 4u);
    EXPECT_EQ(Read(), Filled(kClear));
    target->Deactivate(false, false);
}

TEST_P(DrawTest, WithoutAProgramThatCompiledNothingIsDrawn) {
    target->Activate();
    SetQuad(0, 0, 8, 8);
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    ProgramPtr const broken(RendererFactory::CreateShaderProgram("misspelt", kColored, "broken"));
    EXPECT_EQ(TakeErrors().size(), 1u);
    ForgetDriverErrors();
    broken->MakeCurrent();
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    Fill(kRed, 0, 0, 8, 8);
    colored.reset(); // while it is in the list
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    EXPECT_EQ(Read(), Filled(kRed));
    target->Deactivate(false, false);
}

TEST_P(DrawTest, TransfersComeBetweenTheDrawsWhereTheyWereAskedFor) {
    TexturePtr const source = MakeTexture(Filled(kRed));
    target->Activate();
    Paint(*source, 0, 0, 4, 4);
    source->Replace(Filled(kGreen).pixels.data(), 0);
    Paint(*source, 4, 0, 8, 4);
    // Into what is drawn to, and out of it.
    texture->Replace(Rect(0, 4, 8, 6), Filled(kBlue).pixels.data(), 0);
    TexturePtr const copy = MakeTexture(kSize, kSize);
    copy->CopyFromRenderTarget();
    Fill(kRed, 0, 6, 8, 8);
    Paint(*copy, 0, 6, 8, 7);
    target->Deactivate(false, false);
    Picture const half =
        With(With(With(Filled(kClear), kRed, 0, 0, 4, 4), kGreen, 4, 0, 4, 4), kBlue, 0, 4, 8, 2);
    EXPECT_EQ(RendererFixture::Read(*copy), half);
    EXPECT_EQ(Read(), With(half, kRed, 0, 7, 8, 1));
}

TEST_P(DrawTest, TexturesThatAreDeletedOrReboundAreStillThereForTheDrawsBefore) {
    target->Activate();
    for (int i = 0; i < 3; ++i) {
        // The GL names of the last one may come back here.
        Color const color = i == 0 ? kRed : i == 1 ? kGreen : kBlue;
        TexturePtr const source = MakeTexture(MakeImage(2, 2, color));
        source->SetParameter(TextureParamWrappingS, i == 1 ? TextureWrapRepeat : TextureWrapClampToEdge);
        Paint(*source, static_cast<float>(i), 0, static_cast<float>(i + 1), 8);
    }
    // One that is bound and gone is not drawn with.
    texture->SetLabel("target");
    target->Deactivate(false, false);
    EXPECT_EQ(Read(),
              With(With(With(Filled(kClear), kRed, 0, 0, 1, 8), kGreen, 1, 0, 1, 8), kBlue, 2, 0, 1, 8));
    RendererFactory::Flush();
    EXPECT_EQ(Count().textures, 1);
}

TEST_P(DrawTest, AFullListIsPlayedAndALaterFrameAsksNothingAndGrowsNothing) {
    constexpr int kDraws = 50000; // several times what a list holds
    auto const drawFrame = [this] {
        target->Activate();
        for (int i = 0; i < kDraws; ++i) {
            auto const x = static_cast<float>(i % kSize);
            Fill(i % 3 == 0 ? kRed : kGreen, x, 0, x + 1, 8);
        }
        target->Deactivate(false, false);
        RendererFactory::Flush();
    };
    drawFrame();
    RendererStatistics const before = Count();
    drawFrame();
    RendererStatistics const after = Count();
    EXPECT_EQ(Read().GetColor((kDraws - 1) % kSize, 3), (kDraws - 1) % 3 == 0 ? kRed : kGreen);
    EXPECT_EQ(after.listBytes, before.listBytes);
    EXPECT_LT(after.listBytes, 8u << 20);
    EXPECT_EQ(after.buffers, before.buffers);
    EXPECT_GT(after.flushes, before.flushes + 1);
    // The host's frame buffer, viewport, vertex input and obstacles, once a frame at most.
    EXPECT_LE(after.queries - before.queries, IsDeferred() ? 0u : 8u);
    EXPECT_EQ(after.frameBufferSwitches - before.frameBufferSwitches, 2u);

    // Few draws fill it as well, when they have many vertices.
    std::vector<float> const many(200000);
    target->Activate();
    for (int i = 0; i < 4; ++i) {
        quad->SetVertices(0, many.data(), 100000);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    EXPECT_GT(Count().flushes, after.flushes);
    target->Deactivate(false, false);
}

TEST_P(DrawTest, WhatOutlivesItsContextDrawsNothing) {
    target->Activate();
    Fill(kRed, 0, 0, 8, 8);
    RendererFactory::DetachContext();
    EXPECT_EQ(Count().buffers, 0);
    EXPECT_FALSE(quad->Draw(0, -1, 1));
    blend->Apply();
    EXPECT_FALSE(RendererFactory::GetRasterizerState()->IsScissorEnabled());
    VertexDescriptor const none;
    EXPECT_FALSE(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &none, 0, 0));
    ASSERT_TRUE(Attach());
    EXPECT_FALSE(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &none, 0, 0));
    EXPECT_EQ(TakeErrors().size(), 2u);
    End();
    Begin();
    target->Activate();
    Fill(kGreen, 0, 0, 8, 8);
    EXPECT_EQ(Read(), Filled(kGreen));
    target->Deactivate(false, false);
}

INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, DrawTest, ::testing::Bool(), GetDrawMode);

} // namespace
} // namespace Moka::Testing
