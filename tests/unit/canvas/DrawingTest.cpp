// The render side: what is skipped, which strips are drawn, and what is given back.
#include "moka/base/log/AndroidLog.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <gtest/gtest.h>
#include <stdexcept>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class Drawing : public CanvasFixture {
protected:
    // Two strips, the second one 36 rows high; frame buffers "target 1" and "target 2".
    Drawing() { Use(NewBitmap(60, kMaxSide + 36)); }

    Numbers Mvp(int strip, Matrix3<float> const& m) {
        return NumbersOf(StripOf(target, strip)->GetProjectionMatrix() * FromMatrix3(m));
    }
    // Which of the target's strips the draws since the last call went to.
    std::vector<std::string> TakeTargets() {
        std::vector<std::string> targets;
        for (TracedDraw const& draw : TakeDraws()) targets.push_back(draw.target);
        return targets;
    }
};

TEST_F(Drawing, AShapeIsDrawnOnEachStripThatItsMappedCornersTouch) {
    canvas->DrawRect(10, 10, 20, 20, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 1"));
    canvas->DrawRect(10, 64, 20, 70, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 2")) << "ends exactly where the first begins";
    canvas->DrawRect(20, 70, 10, 10, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 1", "target 2")) << "also inverted";
    canvas->DrawRect(-20, 0, -1, 100, &paint);
    canvas->DrawRect(0, 100, 60, 110, &paint);
    EXPECT_THAT(TakeTargets(), IsEmpty());

    canvas->PreRotate(90, 30, 30); // (x, y) comes to (60 - y, x)
    canvas->DrawRect(70, 10, 75, 20, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 2"));
    // Neither width nor fringe count: a line next to a strip is not drawn there, however thick.
    canvas->SetMatrix(Matrix3<float>());
    paint.SetLineWidth(20);
    canvas->DrawLine(0, 63, 80, 63, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 1"));
    canvas->DrawCircle(30, 70, 6.5f, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 1", "target 2"));
    EXPECT_EQ(RendererTrace::GetActiveTarget(), "none") << "given back";
}

TEST_F(Drawing, ShapesWithoutExtentMakeNoDrawable) {
    paint.SetLineWidth(0.5f);
    canvas->DrawLine(1, 1, 9, 9, &paint);
    canvas->DrawSimpleLines({{1, 1}, {9, 9}}, &paint);
    paint.SetLineWidth(1);
    canvas->DrawLine(3, 3, 3, 3, &paint);
    canvas->DrawSimpleLine(3, 3, 3, 3, &paint);
    canvas->DrawSimpleLines({}, &paint);
    canvas->DrawRect(5, 0, 5, 9, &paint);
    canvas->DrawRoundRect(0, 5, 9, 5, 1, 1, &paint);
    for (float radius : {0.0f, -1.0f, kNaN}) canvas->DrawCircle(9, 9, radius, &paint);
    canvas->DrawBitmap(target.Get(), RectF(5, 0, 5, 9), &paint);
    EXPECT_THAT(TakeDraws(), IsEmpty());
    EXPECT_EQ(RendererFactory::GetStatistics().graphicsObjects, 2) << "the clip's own";
}

TEST_F(Drawing, SimpleLinesReachEveryStripAndLogTheirDrawableOnce) {
    std::string const line = "void Moka::MKCanvasImpl::DrawSimpleLinesRT(vector<Moka::PointF> *, "
                             "Moka::Matrix3f, Moka::MKPaint) MKLineDrawable Created";
    for (int i = 0; i < 2; ++i) canvas->DrawSimpleLines({{1, 1}, {9, 90}, {9, 9}, {20, 9}}, &paint);
    EXPECT_THAT(TakeTargets(), ElementsAre("target 1", "target 2", "target 1", "target 2"));
    auto const other = NewCanvas(target); // the other operations make it silently
    other->DrawLine(1, 1, 9, 9, &paint);
    other->DrawSimpleLines({{1, 1}, {9, 9}}, &paint);
    queue.RunAll();
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, line), 1);
    EXPECT_EQ(log.Find(line).tag, "mok_log");
    EXPECT_EQ(log.Find(line).format, "%s MKLineDrawable Created");
}

TEST_F(Drawing, ACustomDrawableIsDrawnOnEveryStripAsFrameBufferMinusOne) {
    FakeDrawable drawable;
    std::vector<std::string> targets;
    std::vector<Numbers> projections;
    drawable.onDraw = [&](Matrix4<float> const& projection, MKPaint const&) {
        targets.push_back(RendererTrace::GetActiveTarget());
        projections.push_back(NumbersOf(projection));
    };
    canvas->PreTranslate(1000, 1000); // nothing is culled
    for (int i = 0; i < 2; ++i) canvas->SetClipRect(0, 0, 50, 50, IMKCanvasBase::Union);
    canvas->Draw(&drawable, &paint);
    EXPECT_EQ(drawable.references, 2);
    queue.RunAll();
    EXPECT_EQ(drawable.references, 1);
    EXPECT_THAT(targets, ElementsAre("target 1", "target 2"));
    EXPECT_THAT(projections, ElementsAre(Mvp(0, canvas->GetMatrix()), Mvp(1, canvas->GetMatrix())));
    EXPECT_EQ(RendererFactory::GetStatistics().depthStencilBuffers, 0);
    EXPECT_THAT(TakeCalls("AttachDepthStencil"), IsEmpty());
}

TEST_F(Drawing, ADrawableThatThrowsLeavesNoTargetClipOrReferenceBehind) {
    FakeDrawable drawable;
    drawable.onDraw = [](Matrix4<float> const&, MKPaint const&) { throw std::runtime_error("mine"); };
    canvas->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect);
    canvas->Draw(&drawable, &paint);
    EXPECT_THROW(queue.RunAll(), std::runtime_error);
    RendererTrace::DeclareNoRenderThread();
    EXPECT_EQ(drawable.references, 1);
    EXPECT_EQ(RendererTrace::GetActiveTarget(), "none");
    EXPECT_FALSE(RendererTrace::GetState().scissorOn);
}

TEST_F(Drawing, ClearingGivesItsTargetBackAndClearingAllLeavesTheScissorOff) {
    canvas->SetClipRect(10, 50, 20, 30, IMKCanvasBase::Intersect);
    canvas->Clear(0.25f, 0.5f, 0.75f, 1);
    queue.RunAll();
    EXPECT_EQ(RendererTrace::GetActiveTarget(), "none");
    std::vector<TracedClear> clears = RendererTrace::GetClears();
    ASSERT_THAT(clears, SizeIs(2));
    EXPECT_EQ(clears[1].state.scissor, (ScissorRect{10, -14, 20, 30}));
    {
        OnRenderThread const here;
        RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
        RendererFactory::GetRasterizerState()->SetScissorRect({1, 2, 3, 4});
    }
    canvas->ClearAll(static_cast<int>(0xFF000000u));
    queue.RunAll();
    clears = RendererTrace::GetClears();
    ASSERT_THAT(clears, SizeIs(4));
    EXPECT_FALSE(clears[2].state.scissorOn || clears[3].state.scissorOn);
    EXPECT_FALSE(RendererTrace::GetState().scissorOn) << "stays off";
    EXPECT_EQ(RendererTrace::GetState().scissor, (ScissorRect{1, 2, 3, 4}));
}

} // namespace
} // namespace Moka::Testing
