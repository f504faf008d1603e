// Draws: what reaches GL, in which order, and how few calls it takes.
#include "tests/pixel/renderer/DrawFixture.h"

#include <EGL/egl.h>
#include <GLES2/gl2ext.h>

namespace Moka::Testing {
namespace {

using DrawTest = DrawFixture;

// llvmpipe draws on the calling thread where there is one processor, and nothing is then ever pending. Read when the
// driver is loaded, which is later.
[[maybe_unused]] int const gThreads = setenv("LP_NUM_THREADS", "2", 0);

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
    colored.program->MakeCurrent();
    std::array<float, 4> const red{1, 0, 0, 1};
    colored.parameter->Set(red.data());
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

TEST_P(DrawTest, AFullListIsSubmittedAndASecondFrameNeitherQueriesNorGrowsAnything) {
    constexpr int kDraws = 50000; // several times what a list holds
    auto const drawFrame = [this] {
        target->Activate();
        for (int i = 0; i < kDraws; ++i) Fill(i % 3 == 0 ? kRed : kGreen, 0, 0, 8, 8);
        target->Deactivate(false, false);
        RendererFactory::Flush();
    };
    drawFrame();
    RendererStatistics const before = Count();
    drawFrame();
    RendererStatistics const after = Count();
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

// The copy of the target flushes the list that the vertices fill.
TEST_P(DrawTest, AnImageIsDrawnOntoItselfWithMoreVerticesThanAListHoldsAndOtherGlEndsItsBlending) {
    BlendStateDescriptor add(true);
    add.SetColorEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
    blend->SetDescriptor(add);
    target->Activate();
    blend->Apply();
    Fill({100, 0, 0, 255}, 0, 0, 8, 8);
    int const unit = 1;
    texture->Bind(unit);
    textured.program->MakeCurrent();
    textured.parameter->Set(&unit);
    std::vector<float> corners{0, 0, 0, 8, 8, 0, 8, 0, 0, 8, 8, 8};
    corners.resize(300000); // the others are a point
    quad->SetVertices(0, corners.data(), 150000);
    EXPECT_TRUE(quad->Draw(0, -1, 1));
    Fill(kGreen, 0, 0, 2, 2);
    RendererFactory::InvalidateState();
    Fill(kGreen, 4, 4, 6, 6);
    EXPECT_EQ(Read(), Filled({200, 0, 0, 255})
                          .With(0, 0, MakeImage(2, 2, {200, 255, 0, 255}))
                          .With(4, 4, MakeImage(2, 2, kGreen)))
        << "the blend state is to be applied again after other GL";
    target->Deactivate(false, false);
    RendererFactory::Flush(); // takes the copy away
}

// The driver's threads may still be sampling the old texels for another target.
TEST_P(DrawTest, AReadBackAndEachKindOfCopyWaitForWhatWasDrawnLast) {
    constexpr int kSide = 64;
    Picture const blue = MakeImage(kSide, kSide, kBlue);
    OffscreenImage const image = MakeOffscreen(blue);
    OffscreenImage const other = MakeOffscreen(blue);
    OffscreenImage const copy = MakeOffscreen(blue);
    std::array<int, 3> wrong{};
    for (std::size_t i = 0; i < 150; ++i) {
        image.target->Activate();
        Fill(kRed, 0, 0, 8, 8);
        other.target->Activate();
        Paint(*image.texture, 0, 0, 8, 8);
        image.target->Activate();
        Fill(kBlue, 0, 0, 8, 8);
        other.target->Activate();
        Fill(kRed, 0, 0, 8, 8);
        std::size_t const kind = i % 3; // a read-back, a texture copy, a blit
        (kind == 1 ? image : copy).target->Activate();
        if (kind == 1) copy.texture->CopyFromRenderTarget();
        if (kind == 2) image.texture->DrawToCurrent();
        if (!(RendererFixture::Read(*(kind == 0 ? image : copy).target, kSide, kSide) == blue)) ++wrong[kind];
    }
    EXPECT_EQ(wrong, (std::array<int, 3>{}));
    copy.target->Deactivate(false, false);
}

INSTANTIATE_TEST_SUITE_P(ImmediateAndDeferred, DrawTest, ::testing::Bool(), GetDrawMode);

} // namespace
} // namespace Moka::Testing
