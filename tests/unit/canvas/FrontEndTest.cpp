// The caller's side of a canvas: what is copied, sent, kept and counted, and what a refusing queue leaves
// behind.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/canvas/MKCanvas.h"
#include "tests/unit/base/Allocation.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <utility>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

using FrontEnd = CanvasFixture;

TEST_F(FrontEnd, ARequestTakesItsOwnCopiesOfEverything) {
    auto const target = NewBitmap(50, 50);
    auto const canvas = NewCanvas(target);
    RectF rect(1, 2, 30, 40);
    std::vector<PointF> points{{1, 1}, {9, 9}};
    canvas->PreTranslate(5, 6);
    Matrix3<float> const m = canvas->GetMatrix();
    paint.SetColor(0.5f, 0, 0, 1);
    canvas->DrawRect(rect, &paint);
    canvas->DrawSimpleLines(points, &paint);
    canvas->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect);
    canvas->DrawRect(rect, nullptr);
    rect = RectF();
    points.clear();
    paint.SetColor(0, 0, 0, 0);
    canvas->SetMatrix(Matrix3<float>(0.0f));
    std::vector<RecordedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(3));
    Numbers const mvp = NumbersOf(target->GetBitmapWritable()->GetProjectionMatrix() * FromMatrix3(m));
    for (RecordedDraw const& draw : draws) EXPECT_EQ(ProjectionOf(draw), mvp);
    EXPECT_EQ(draws[0].vertices[0], 1);
    EXPECT_EQ(draws[1].count, 6);
    EXPECT_THAT(draws[0].uniforms.at("uColor").numbers, ElementsAre(0.5f, 0, 0, 1));
    EXPECT_FALSE(draws[1].state.scissorOn);
    EXPECT_EQ(draws[2].state.scissor, (ScissorRect{5, 6, 10, 10})) << "under the matrix of its time";
    EXPECT_THAT(draws[2].uniforms.at("uColor").numbers, ElementsAre(1, 1, 1, 1)) << "a new paint";
    EXPECT_EQ(draws[2].state.blend.GetColorEquation().destination, BlendingFactor::OneMinusSrcAlpha);
}

// Every operation, so that one flavour can be held against the other.
void DrawEverything(IMKCanvas& canvas, IMKBitmap* source, IMKCustomDrawable* drawable) {
    MKPaint paint;
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(3);
    std::vector<PointF> points{{1, 2}, {20, 30}};
    std::vector<RectF> const rects{{1, 2, 3, 4}, {5, 6, 9, 10}};
    canvas.Clear(static_cast<int>(0x80FF0040u));
    canvas.ClearAll(0.1f, 0.2f, 0.3f, 0.4f);
    canvas.PreRotate(10, 5, 6);
    EXPECT_EQ(canvas.Save(IMKCanvasBase::SaveAll), 0);
    canvas.PostScale(1.5f, 0.5f);
    canvas.SetClipRect(1, 2, 30, 40, IMKCanvasBase::Union);
    canvas.Draw(drawable, &paint);
    canvas.DrawLine(1, 2, 30, 40, &paint);
    canvas.DrawLine(points[0], points[1], nullptr);
    canvas.DrawSimpleLine(1, 2, 30, 40, &paint);
    canvas.DrawSimpleLine(points[0], points[1], &paint);
    canvas.DrawSimpleLines(points, &paint);
    canvas.DrawRect(1, 2, 30, 40, &paint);
    canvas.DrawRect(rects[0], &paint);
    canvas.DrawRoundRect(1, 2, 30, 40, 3, 5, &paint);
    canvas.DrawRoundRect(rects[1], 1, 0, &paint);
    canvas.DrawCircle(20, 20, 9, &paint);
    canvas.DrawBitmap(source, 3, 4, &paint);
    canvas.DrawBitmap(source, rects[0], &paint);
    canvas.DrawBitmap(source, rects[0], rects[1], &paint);
    canvas.Restore(0);
    canvas.DrawBitmaps(source, points, &paint);
    canvas.DrawBitmaps(source, rects, &paint);
    canvas.DrawBitmaps(source, rects[0], rects, &paint);
}

std::vector<std::string> Describe(std::vector<RecordedEvent> const& events) {
    std::vector<std::string> lines;
    for (RecordedEvent const& event : events) {
        auto const* const draw = std::get_if<RecordedDraw>(&event);
        if (!draw) {
            auto const& clear = std::get<RecordedClear>(event);
            lines.push_back("clear " + ::testing::PrintToString(clear.color) + std::to_string(clear.stencil) +
                            std::to_string(clear.state.scissorOn));
            continue;
        }
        std::string line = draw->shader + ::testing::PrintToString(draw->vertices) +
                           std::to_string(draw->state.stencilClip) + std::to_string(draw->state.scissorOn);
        for (auto const& [name, value] : draw->uniforms) line += name + "=" + value.text;
        lines.push_back(line);
    }
    return lines;
}

TEST_F(FrontEnd, OnTheRenderThreadTheSameIsDrawnAtOnce) {
    auto const target = NewBitmap(60, kMaxSide + 10);
    auto const source = NewBitmap(20, kMaxSide + 10);
    FakeDrawable drawable;
    auto posted = NewCanvas(target);
    queue.RunAll();
    RecordingRenderer::TakeEvents();
    DrawEverything(*posted.Get(), source.Get(), &drawable);
    std::vector<std::string> const expected = Describe(TakeEvents());
    EXPECT_GT(expected.size(), 50u);
    posted = {};
    queue.RunAll();
    RecordingRenderer::TakeEvents();
    {
        OnRenderThread const here;
        int const before = queue.GetPostedCount();
        auto const direct = CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&queue, target.Get(), 0));
        DrawEverything(*direct.Get(), source.Get(), &drawable);
        EXPECT_EQ(queue.GetPostedCount(), before);
        EXPECT_EQ(Describe(RecordingRenderer::TakeEvents()), expected);
        EXPECT_EQ(direct->GetBitmap(), target.Get());
    }
    EXPECT_EQ(drawable.draws, 4);
    EXPECT_EQ(drawable.references, 1);
    EXPECT_EQ(CountOf(source.Get()), 1);
    EXPECT_EQ(CountOf(target.Get()), 1);
}

TEST_F(FrontEnd, ARoundRectangleNeedsBothRadii) {
    auto const target = NewBitmap(50, 50);
    auto const canvas = NewCanvas(target);
    for (auto const& [rx, ry] : {std::pair(0.0f, 5.0f), {5.0f, 0.0f}, {5.0f, -1.0f}, {kNaN, 5.0f}}) {
        canvas->DrawRoundRect(1, 2, 30, 40, rx, ry, &paint);
        EXPECT_EQ(TakeDraw().shader, "MKRectShader");
    }
    canvas->DrawRoundRect(1, 2, 30, 40, 3, 5, &paint);
    EXPECT_THAT(TakeDraws(), SizeIs(2)) << "body and corners";
}

TEST_F(FrontEnd, SavedLevelsHoldMatrixAndClipCountOrThePreviousOnes) {
    auto const target = NewBitmap(50, 50);
    auto const canvas = NewCanvas(target);
    auto const clip = [&] { canvas->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect); };
    auto const move = [&] { canvas->PreTranslate(1, 0); };
    auto const x = [&] { return canvas->GetMatrix().getTranslateX(); };
    // Whether the clip of a draw right now is on.
    auto const isClipped = [&] {
        queue.RunAll();
        RecordingRenderer::TakeEvents();
        canvas->DrawRect(-99, -99, 99, 99, &paint);
        return TakeDraw().state.scissorOn;
    };
    canvas->Restore(-1);
    canvas->Restore(0);
    move();
    EXPECT_EQ(canvas->Save(IMKCanvasBase::SaveAll), 0);
    move();
    clip();
    EXPECT_EQ(canvas->Save(IMKCanvasBase::SaveMatrix), 1);
    EXPECT_EQ(canvas->Save(IMKCanvasBase::SaveClip), 2);
    EXPECT_EQ(canvas->Save(static_cast<IMKCanvasBase::SaveFlag>(3)), 3);
    move();
    canvas->Restore(4);
    EXPECT_EQ(x(), 3);
    EXPECT_TRUE(isClipped());
    canvas->Restore(3);
    EXPECT_EQ(x(), 2) << "the matrix of level 1, through 2";
    EXPECT_TRUE(isClipped()) << "the count of level 2";
    move();
    canvas->Restore(1);
    EXPECT_EQ(x(), 2);
    EXPECT_FALSE(isClipped()) << "level 1 had the count of level 0";
    canvas->Restore(-1);
    EXPECT_EQ(x(), 1);
    canvas->Restore(-1);
    EXPECT_EQ(x(), 1);

    clip(); // saving one part alone resets the other
    EXPECT_EQ(canvas->Save(IMKCanvasBase::SaveClip), 0);
    canvas->Restore(0);
    EXPECT_TRUE(canvas->GetMatrix().isIdentity());
    EXPECT_TRUE(isClipped());
    canvas->Save(IMKCanvasBase::SaveMatrix);
    clip();
    canvas->Restore(-1);
    EXPECT_FALSE(isClipped());
}

TEST_F(FrontEnd, MatrixTagAndColoursAreLocal) {
    auto const target = NewBitmap(50, 50);
    auto const canvas = NewCanvas(target);
    queue.RunAll();
    canvas->SetMatrix(Matrix3<float>(1, 1, 0, 0, 1, 0, 0, 0, 1));
    canvas->PostTranslate(3, 4);
    EXPECT_EQ(canvas->GetMatrix()[1], 1 + 4.0f) << "as Matrix3's";
    Matrix3<float> expected;
    canvas->SetMatrix(expected);
    Matrix3<float> const other(1, 2, 0, 3, 4, 0, 5, 6, 1);
    auto const both = [&](auto const& change) {
        change(*canvas.Get());
        return canvas->GetMatrix();
    };
    expected.preConcat(other), expected.postConcat(other), expected.preScale(2, 3), expected.postScale(4, 5);
    expected.preRotate(10), expected.preRotate(20, 1, 2), expected.postRotate(30);
    expected.postRotate(40, 3, 4), expected.preTranslate(7, 8), expected.postTranslate(9, 10);
    EXPECT_EQ(both([&](IMKCanvas& c) {
                  c.PreConcat(other), c.PostConcat(other), c.PreScale(2, 3), c.PostScale(4, 5);
                  c.PreRotate(10), c.PreRotate(20, 1, 2), c.PostRotate(30);
                  c.PostRotate(40, 3, 4), c.PreTranslate(7, 8), c.PostTranslate(9, 10);
              }),
              expected);

    canvas->SetTag(std::string(200, 'x').c_str());
    EXPECT_EQ(canvas->GetTag(), std::string(126, 'x'));
    canvas->SetTag("abc");
    EXPECT_EQ(canvas->GetTag(), "abc" + std::string(123, 'x')) << "the tail stays";
    canvas->SetTag(nullptr);
    EXPECT_EQ(queue.GetPendingCount(), 0);
    EXPECT_EQ(canvas->GetMsgQueue(), &queue);
    EXPECT_EQ(canvas->GetBitmap(), target.Get());
}

TEST_F(FrontEnd, TheCanvasHoldsItsTargetTwiceUntilItIsDeletedOnTheRenderThread) {
    auto const target = NewBitmap(50, 50);
    queue.RunAll();
    auto canvas = NewCanvas(target);
    EXPECT_EQ(CountOf(target.Get()), 3);
    canvas->DrawRect(1, 1, 9, 9, &paint);
    canvas->Ref();
    EXPECT_EQ(canvas->Unref(), 1);
    canvas = {};
    EXPECT_EQ(CountOf(target.Get()), 3);
    EXPECT_THAT(TakeDraws(), SizeIs(1)) << "what was posted is still drawn";
    EXPECT_EQ(CountOf(target.Get()), 1);
}

TEST_F(FrontEnd, ASourceIsHeldUntilDrawnAndWhatCannotBeDrawnIsNotPosted) {
    auto const target = NewBitmap(50, 50);
    auto const canvas = NewCanvas(target);
    auto source = NewBitmap(10, 20);
    auto const screen = NewScreen(9, 9);
    queue.RunAll();
    std::vector<PointF> points{{1, 2}, {20, 30}};
    canvas->Draw(nullptr, &paint);
    for (IMKBitmap* bad : {static_cast<IMKBitmap*>(nullptr), screen.Get()}) {
        canvas->DrawBitmap(bad, 1, 2, &paint);
        canvas->DrawBitmap(bad, RectF(1, 2, 3, 4), &paint);
        canvas->DrawBitmap(bad, RectF(), RectF(1, 2, 3, 4), &paint);
        canvas->DrawBitmaps(bad, points, &paint);
        canvas->DrawBitmaps(bad, {RectF(1, 2, 3, 4)}, &paint);
        canvas->DrawBitmaps(bad, RectF(), {RectF(1, 2, 3, 4)}, &paint);
    }
    EXPECT_EQ(queue.GetPendingCount(), 0);
    EXPECT_EQ(CountOf(screen.Get()), 1);

    canvas->DrawBitmap(source.Get(), 3, 4, &paint);
    canvas->DrawBitmaps(source.Get(), points, &paint);
    EXPECT_EQ(CountOf(source.Get()), 3);
    source = {};
    std::vector<RecordedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(2));
    EXPECT_THAT(draws[0].vertices, ElementsAre(3, 4, 1, 0, 0, 3, 24, 1, 0, 1, 13, 4, 1, 1, 0, 13, 4, 1, 1, 0,
                                               3, 24, 1, 0, 1, 13, 24, 1, 1, 1));
    EXPECT_EQ(draws[1].count, 12);
    EXPECT_EQ(draws[1].vertices[30 + 1], 30) << "top of the second";
    EXPECT_EQ(draws[1].vertices[30 + 5 + 1], 50) << "its bottom";
}

TEST_F(FrontEnd, RefusedRequestsAreDroppedAndOnlyTheReferencesStay) {
    auto target = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&picky, 50, 50, nullptr, false, 1, false));
    auto source = NewBitmap(10, 20);
    auto canvas = CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&picky, target.Get(), 1));
    FakeDrawable drawable;
    picky.RunAll();
    queue.RunAll();
    refuse = true;
    DrawEverything(*canvas.Get(), source.Get(), &drawable);
    refuse = false;
    EXPECT_EQ(picky.GetPendingCount(), 0);
    EXPECT_EQ(CountOf(source.Get()), 1 + 6);
    EXPECT_EQ(drawable.references, 2);
    for (int i = 0; i < 6; ++i) source->Unref(); // what refusals leak, by design
    // A refused clip counts all the same: saved and restored, it comes back as one that hides everything.
    refuse = true;
    canvas->SetClipRect(0, 0, 9, 9, IMKCanvasBase::Intersect);
    refuse = false;
    canvas->SetMatrix(Matrix3<float>());
    canvas->Save(IMKCanvasBase::SaveAll);
    canvas->Restore(0);
    canvas->DrawRect(0, 0, 20, 20, &paint);
    RecordingRenderer::TakeEvents();
    picky.RunAll();
    ASSERT_THAT(RecordingRenderer::GetDraws(), SizeIs(1));
    EXPECT_TRUE(RecordingRenderer::GetDraws()[0].state.scissorOn);
    EXPECT_EQ(RecordingRenderer::GetDraws()[0].state.scissor.width, 0);
}

TEST_F(FrontEnd, ARefusedDeletionLeavesTheRenderSideAlive) {
    auto const target = NewBitmap(50, 50);
    bool refuseNow = false;
    int heldThen = 0;
    RefusingQueue some(RefusingQueue::Predicate([&](int, ITask* task) {
        if (!refuseNow) return false;
        heldThen = CountOf(target.Get());
        OnRenderThread const here;
        task->run(); // what it would have leaked, by design
        return true;
    }));
    auto canvas = CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&some, target.Get(), 1));
    queue.RunAll();
    {
        OnRenderThread const here;
        some.RunAll();
    }
    refuseNow = true;
    canvas = {};
    EXPECT_EQ(heldThen, 3);
    EXPECT_EQ(some.GetRefusedCount(), 1);
    EXPECT_EQ(CountOf(target.Get()), 1);
}

TEST_F(FrontEnd, WithoutItsClipOrItsFrameBufferACanvasIsInert) {
    for (int refused = 1; refused <= 3; ++refused) { // texture, frame buffer, clip
        RefusingQueue some({refused});
        some.SetAroundRun([] { RecordingRenderer::DeclareRenderThread(); },
                          [] { RecordingRenderer::DeclareNoRenderThread(); });
        auto target =
            BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&some, 50, 50, nullptr, false, 1, false));
        IMKSubBitmap* const strip = target->GetTextureBitmap()->GetSubBitmap(0);
        auto canvas = CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&some, target.Get(), 1));
        canvas->SetClipRect(0, 0, 9, 9, IMKCanvasBase::Xor);
        canvas->DrawRect(0, 0, 20, 20, &paint);
        canvas->Clear(0);
        canvas->Restore(-1);
        RecordingRenderer::TakeEvents();
        some.RunAll();
        for (RecordedDraw const& draw : RecordingRenderer::GetDraws())
            EXPECT_TRUE(refused < 3 || !draw.state.stencilClip);
        canvas = {};
        some.RunAll();
        EXPECT_EQ(CountOf(target.Get()), 1);
        if (refused < 3) strip->Unref(); // what the refusal leaks, by design
        target = {};
        some.RunAll();
    }
}

TEST_F(FrontEnd, OutOfMemoryDropsRequests) {
    auto const target = NewBitmap(50, 50);
    auto const source = NewBitmap(10, 20);
    CanvasPtr canvas = NewCanvas(target);
    queue.RunAll();
    std::vector<PointF> points{{1, 2}, {20, 30}};
    std::vector<RectF> const rects{{1, 2, 3, 4}};
    {
        FailAllocations failing;
        canvas->DrawSimpleLines(points, &paint);
        canvas->DrawBitmaps(source.Get(), points, &paint);
        canvas->DrawBitmaps(source.Get(), rects, &paint);
    }
    EXPECT_EQ(queue.GetPendingCount(), 0);
    EXPECT_EQ(CountOf(source.Get()), 1);
    IMKCanvas* none = nullptr;
    {
        FailAllocations failing;
        none = MKGraphicsFactory::CreateCanvas(&queue, target.Get(), 1);
    }
    EXPECT_EQ(none, nullptr);
}

// Forgets tasks, or runs them, at no cost.
class Sink final : public IGLMsgQueue {
public:
    bool runs = false;

    bool Post(ITask* task) override {
        if (runs) task->run();
        delete task;
        return true;
    }
    void WaitForTasks() override {}
};

TEST_F(FrontEnd, ARequestAllocatesNothingButItsTask) {
    auto const target = NewBitmap(50, 50);
    Sink sink;
    MKCanvas* const canvas = new MKCanvas(&sink, target.Get());
    paint.SetColor(1, 0, 0, 1);
    canvas->DrawRect(1, 2, 3, 4, &paint); // fills the pool of tasks
    int const before = GetAllocationCount();
    for (int i = 0; i < 1000; ++i) {
        canvas->PreTranslate(1, 0);
        canvas->DrawRect(1, 2, 3, 4, &paint);
        canvas->DrawCircle(1, 2, 3, nullptr);
        canvas->SetClipRect(1, 2, 3, 4, IMKCanvasBase::Union);
    }
    EXPECT_EQ(GetAllocationCount(), before);
    OnRenderThread const here;
    sink.runs = true;
    canvas->Unref();
}

} // namespace
} // namespace Moka::Testing
