// The pen canvas: the clip that it gives to foreign drawing, and what is left of it without a texture bitmap.
#include "moka/base/log/AndroidLog.h"
#include "tests/unit/canvas/CanvasFixture.h"

namespace Moka::Testing {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::SizeIs;

using PenCanvas = CanvasFixture;

TEST_F(PenCanvas, TheClipIsThatOfTheWholeBitmapWhateverTheIndexAndReachesGl) {
    target = NewBitmap(50, kMaxSide + 10);
    auto const pen = NewPenCanvas(target);
    std::vector<std::string> calls;
    // The state between the two clip operations.
    auto const clipped = [&](int frameBuffer) {
        queue.RunAll();
        OnRenderThread const here;
        RendererTrace::TakeCalls();
        pen->EnableClipRT(frameBuffer);
        PipelineState const state = RendererTrace::GetState();
        calls = RendererTrace::TakeCalls();
        EXPECT_EQ(calls.back(), "renderer Commit");
        pen->DisableClipRT();
        EXPECT_EQ(RendererTrace::TakeCalls().back(), "renderer InvalidateState");
        return state;
    };
    EXPECT_FALSE(clipped(0).scissorOn);
    pen->SetClipRect(1, 2, 20, 70, IMKCanvasBase::Intersect);
    for (int index : {-1, 1, 3}) {
        PipelineState const state = clipped(index);
        EXPECT_TRUE(state.scissorOn);
        EXPECT_EQ(state.scissor, (ScissorRect{1, 2, 20, 70}));
        EXPECT_EQ(calls.front(), "target 1 Activate");
    }
    pen->PreRotate(10);
    pen->SetClipRect(1, 2, 20, 70, IMKCanvasBase::Intersect);
    PipelineState const state = clipped(0);
    EXPECT_TRUE(state.stencilClip && state.blend.IsColorWrite());
    EXPECT_FALSE(RendererTrace::GetState().stencilClip);
    EXPECT_THAT(calls, ::testing::Not(Contains(HasSubstr("AttachDepthStencil")))) << "no strip's own";
}

TEST_F(PenCanvas, OnAScreenBitmapOnlyItsLocalStateWorks) {
    auto const screen = NewScreen(50, 60);
    queue.RunAll();
    for (int useQueue : {1, 0}) {
        OnRenderThread const here;
        log.Clear();
        int const before = queue.GetPostedCount();
        auto const pen =
            PenCanvasPtr::Adopt(MKGraphicsFactory::CreatePenCanvas(&queue, screen.Get(), useQueue));
        ASSERT_TRUE(pen);
        std::string const name = useQueue ? "MKPenCanvas" : "MKPenCanvasRT";
        EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                    ElementsAre(name + ", PenCanvas can't set ScreenBitmap"));
        pen->PreRotate(10);
        pen->SetClipRect(1, 2, 3, 4, IMKCanvasBase::Intersect);
        pen->ClearAll(0);
        pen->EnableClipRT(0);
        pen->DisableClipRT();
        EXPECT_EQ(NumbersOf(pen->GetCanvasMatrix()), NumbersOf(FromMatrix3(pen->GetMatrix())));
        EXPECT_EQ(pen->GetBitmap(), nullptr);
        EXPECT_EQ(queue.GetPostedCount(), before);
        EXPECT_EQ(CountOf(screen.Get()), 1);
    }
}

} // namespace
} // namespace Moka::Testing
