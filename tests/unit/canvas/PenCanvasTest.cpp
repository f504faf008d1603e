// The pen canvas: the matrix and the clip that it gives to foreign drawing, and what is left of it without a
// texture bitmap.
#include "moka/base/log/AndroidLog.h"
#include "tests/unit/canvas/CanvasFixture.h"

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class PenCanvas : public CanvasFixture {
protected:
    // The state between the two clip operations, and what the renderer was told around it.
    PipelineState Clipped(IMKPenCanvas& canvas, int frameBuffer) {
        queue.RunAll();
        OnRenderThread const here;
        RecordingRenderer::TakeCalls();
        canvas.EnableClipRT(frameBuffer);
        PipelineState const state = RecordingRenderer::GetState();
        enabling = RecordingRenderer::TakeCalls();
        canvas.DisableClipRT();
        disabling = RecordingRenderer::TakeCalls();
        return state;
    }

    std::vector<std::string> enabling;
    std::vector<std::string> disabling;
};

TEST_F(PenCanvas, TheCanvasMatrixIsTheTargetsProjectionOfTheModel) {
    auto const target = NewBitmap(50, 60);
    auto const canvas = NewPenCanvas(target);
    Matrix4<float> const projection = target->GetBitmapWritable()->GetProjectionMatrix();
    EXPECT_EQ(NumbersOf(canvas->GetCanvasMatrix()), NumbersOf(projection));
    canvas->PreRotate(30, 4, 5);
    EXPECT_EQ(canvas->GetModelMatrix(), canvas->GetMatrix());
    EXPECT_EQ(NumbersOf(canvas->GetCanvasMatrix()), NumbersOf(projection * FromMatrix3(canvas->GetMatrix())));
}

TEST_F(PenCanvas, TheClipIsThatOfTheWholeBitmapWhateverTheIndexAndReachesGl) {
    auto const target = NewBitmap(50, kMaxSide + 10);
    auto const canvas = NewPenCanvas(target);
    EXPECT_FALSE(Clipped(*canvas.Get(), 0).scissorOn);
    canvas->SetClipRect(1, 2, 20, 70, IMKCanvasBase::Intersect);
    for (int index : {-1, 1, 3}) {
        PipelineState const state = Clipped(*canvas.Get(), index);
        EXPECT_TRUE(state.scissorOn);
        EXPECT_EQ(state.scissor, (ScissorRect{1, 2, 20, 70}));
        EXPECT_EQ(enabling.front(), "target 1 Activate");
        EXPECT_EQ(enabling.back(), "renderer Commit");
        EXPECT_EQ(disabling.back(), "renderer InvalidateState");
    }
    canvas->PreRotate(10);
    canvas->SetClipRect(1, 2, 20, 70, IMKCanvasBase::Intersect);
    PipelineState const state = Clipped(*canvas.Get(), 0);
    EXPECT_TRUE(state.stencilClip && state.blend.IsColorWrite());
    EXPECT_EQ(enabling.back(), "renderer Commit");
    EXPECT_EQ(disabling.front(), "renderer SetStencilClip 0");
    for (std::string const& call : enabling)
        EXPECT_EQ(call.find("AttachDepthStencil"), std::string::npos) << "no strip's own";
}

TEST_F(PenCanvas, ItClearsWithinItsClipAndGivesTheTargetBack) {
    auto const target = NewBitmap(50, 60);
    auto canvas = NewPenCanvas(target);
    canvas->Save(IMKCanvasBase::SaveAll);
    canvas->SetClipRect(1, 2, 20, 30, IMKCanvasBase::Intersect);
    canvas->Clear(static_cast<int>(0xFFFF0000u));
    canvas->ClearAll(0, 0, 1, 1);
    canvas->Restore(0);
    canvas->Clear(0, 1, 0, 1);
    canvas = {};
    queue.RunAll();
    std::vector<RecordedClear> const clears = RecordingRenderer::GetClears();
    ASSERT_THAT(clears, SizeIs(3));
    EXPECT_EQ(clears[0].color, (std::array<float, 4>{1, 0, 0, 1}));
    EXPECT_EQ(clears[0].state.scissor, (ScissorRect{1, 2, 20, 30}));
    EXPECT_FALSE(clears[1].state.scissorOn || clears[2].state.scissorOn);
    EXPECT_EQ(CountOf(target.Get()), 1);
}

TEST_F(PenCanvas, OnAScreenBitmapOnlyItsLocalStateWorks) {
    auto const screen = NewScreen(50, 60);
    queue.RunAll();
    for (int useQueue : {1, 0}) {
        OnRenderThread const here;
        log.Clear();
        int const before = queue.GetPostedCount();
        auto const canvas =
            PenCanvasPtr::Adopt(MKGraphicsFactory::CreatePenCanvas(&queue, screen.Get(), useQueue));
        ASSERT_TRUE(canvas);
        std::string const text =
            std::string(useQueue ? "MKPenCanvas" : "MKPenCanvasRT") + ", PenCanvas can't set ScreenBitmap";
        EXPECT_THAT(log.GetTexts(), ElementsAre(text));
        EXPECT_EQ(log.Find(text).priority, ANDROID_LOG_ERROR);
        EXPECT_EQ(log.Find(text).tag, "mok_log");
        EXPECT_EQ(log.Find(text).format, "%s, PenCanvas can't set ScreenBitmap");

        EXPECT_EQ(canvas->Save(IMKCanvasBase::SaveAll), 0);
        canvas->PreRotate(10);
        canvas->SetClipRect(1, 2, 3, 4, IMKCanvasBase::Intersect);
        canvas->Clear(0);
        canvas->ClearAll(0);
        canvas->EnableClipRT(0);
        canvas->DisableClipRT();
        EXPECT_EQ(NumbersOf(canvas->GetCanvasMatrix()), NumbersOf(FromMatrix3(canvas->GetMatrix())));
        canvas->Restore(0);
        EXPECT_TRUE(canvas->GetMatrix().isIdentity());
        EXPECT_EQ(canvas->GetBitmap(), nullptr);
        EXPECT_EQ(canvas->GetMsgQueue(), &queue);
        EXPECT_EQ(queue.GetPostedCount(), before);
        EXPECT_EQ(CountOf(screen.Get()), 1);
    }
}

TEST_F(PenCanvas, OnTheRenderThreadNothingIsPosted) {
    auto const target = NewBitmap(50, 60);
    queue.RunAll();
    OnRenderThread const here;
    auto canvas = PenCanvasPtr::Adopt(MKGraphicsFactory::CreatePenCanvas(&queue, target.Get(), 0));
    EXPECT_EQ(CountOf(target.Get()), 3);
    canvas->SetClipRect(1, 2, 3, 4, IMKCanvasBase::Intersect);
    RecordingRenderer::TakeEvents();
    canvas->Clear(0);
    EXPECT_THAT(RecordingRenderer::GetClears(), SizeIs(1));
    canvas = {};
    EXPECT_EQ(CountOf(target.Get()), 1);
    EXPECT_EQ(queue.GetPendingCount(), 0);
}

} // namespace
} // namespace Moka::Testing
