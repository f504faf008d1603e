// The caller's side of a canvas: what is copied, sent, kept and counted, and what a refusing queue leaves
// behind.
#include "tests/support/Allocation.h"
#include "tests/unit/canvas/CanvasFixture.h"

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::SizeIs;

class FrontEnd : public CanvasFixture {
protected:
    FrontEnd() { Use(NewBitmap(50, 50)); }
};

TEST_F(FrontEnd, ARequestHasTheMatrixOfItsTimeAndWithoutAPaintANewOne) {
    canvas->PreTranslate(5, 6);
    canvas->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect);
    canvas->DrawRect(RectF(1, 2, 30, 40), nullptr);
    Matrix3<float> const m = canvas->GetMatrix();
    canvas->SetMatrix(Matrix3<float>(0.0f));
    TracedDraw const draw = TakeDraw();
    EXPECT_EQ(ProjectionOf(draw),
              NumbersOf(target->GetBitmapWritable()->GetProjectionMatrix() * FromMatrix3(m)));
    EXPECT_EQ(draw.state.scissor, (ScissorRect{5, 6, 10, 10}));
    EXPECT_THAT(draw.uniforms.at("uColor").numbers, ElementsAre(1, 1, 1, 1));
    EXPECT_EQ(draw.state.blend.GetColorEquation().destination, BlendingFactor::OneMinusSrcAlpha);
    canvas->SetMatrix(m);
    canvas->DrawRoundRect(-90, -90, 90, 90, 5, 0, &paint);
    EXPECT_EQ(TakeDraw().shader, "MKRectShader") << "a radius of 0 makes no corners";
}

// A, M and C save all, the matrix or the clip, U with an unknown flag; > moves by 1, # clips; a digit restores that
// level, - the last one, ~ level -2.
TEST_F(FrontEnd, SavedLevelsHoldMatrixAndClipCountOrThePreviousOnes) {
    struct {
        char const* steps;
        float x;
        bool isClipped;
    } const cases[] = {
        {"-0>", 1, false},          // there is none
        {">A>#MCU>4", 3, true},     // nor this one
        {">A>#MCU>3", 2, true},     // the matrix of level 1, the count of level 2
        {">A>#MCU>3>1", 2, false},  // level 1 had the count of level 0
        {">A>#MCU>3>1~", 1, false}, // any negative level is the last one
        {">#C0", 0, true},          // saving one part alone resets the other
        {"M#-", 0, false},
    };
    for (auto const& [steps, x, isClipped] : cases) {
        Use(NewBitmap(50, 50));
        int levels = 0;
        for (char const* step = steps; *step != 0; ++step) {
            std::size_t const flag = std::string("AMCU").find(*step);
            if (flag != std::string::npos)
                EXPECT_EQ(canvas->Save(static_cast<IMKCanvasBase::SaveFlag>(flag)), levels++) << steps;
            else if (*step == '>')
                canvas->PreTranslate(1, 0);
            else if (*step == '#')
                canvas->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect);
            else
                canvas->Restore(*step == '-' ? -1 : *step == '~' ? -2 : *step - '0');
        }
        EXPECT_EQ(canvas->GetMatrix().getTranslateX(), x) << steps;
        queue.RunAll();
        RendererTrace::TakeEvents();
        canvas->DrawRect(-99, -99, 99, 99, &paint);
        EXPECT_EQ(TakeDraw().state.scissorOn, isClipped) << steps;
    }
}

TEST_F(FrontEnd, ASourceIsHeldUntilDrawnAndWhatCannotBeDrawnIsNotPosted) {
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
    std::vector<TracedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(2));
    EXPECT_THAT(draws[0].vertices, ElementsAre(3, 4, 1, 0, 0, 3, 24, 1, 0, 1, 13, 4, 1, 1, 0, 13, 4, 1, 1, 0,
                                               3, 24, 1, 0, 1, 13, 24, 1, 1, 1));
    EXPECT_EQ(draws[1].count, 12);
    EXPECT_EQ(draws[1].vertices[30 + 1], 30) << "top of the second";
    EXPECT_EQ(draws[1].vertices[30 + 5 + 1], 50) << "its bottom";
}

TEST_F(FrontEnd, RefusedRequestsAreDroppedAndOnlyTheReferencesStay) {
    auto source = NewBitmap(10, 20);
    FakeDrawable drawable;
    queue.RunAll();
    std::vector<PointF> points{{1, 2}, {20, 30}};
    std::vector<RectF> const rects{{1, 2, 3, 4}};
    refuse = true;
    canvas->DrawRect(rects[0], &paint);
    canvas->DrawSimpleLines(points, &paint);
    canvas->Draw(&drawable, &paint);
    canvas->DrawBitmap(source.Get(), rects[0], rects[0], &paint);
    canvas->DrawBitmaps(source.Get(), points, &paint);
    canvas->DrawBitmaps(source.Get(), rects[0], rects, &paint);
    refuse = false;
    EXPECT_EQ(queue.GetPendingCount(), 0);
    EXPECT_EQ(CountOf(source.Get()), 1 + 3);
    EXPECT_EQ(drawable.references, 2);
    for (int i = 0; i < 3; ++i) source->Unref(); // the references of the refused requests
    // A refused clip counts all the same: saved and restored, it comes back as one that hides everything.
    refuse = true;
    canvas->SetClipRect(0, 0, 9, 9, IMKCanvasBase::Intersect);
    refuse = false;
    canvas->SetMatrix(Matrix3<float>());
    canvas->Save(IMKCanvasBase::SaveAll);
    canvas->Restore(0);
    canvas->DrawRect(0, 0, 20, 20, &paint);
    PipelineState const state = TakeDraw().state;
    EXPECT_TRUE(state.scissorOn);
    EXPECT_EQ(state.scissor.width, 0);
}

TEST_F(FrontEnd, ARequestAllocatesNothingButItsTask) {
    canvas->DrawRect(1, 2, 3, 4, &paint); // fills the pool of tasks
    queue.RunAll();
    refuse = true; // what is refused goes back to the pool
    int const before = GetAllocationCount();
    for (int i = 0; i < 1000; ++i) {
        canvas->PreTranslate(1, 0);
        canvas->DrawRect(1, 2, 3, 4, &paint);
        canvas->DrawCircle(1, 2, 3, nullptr);
        canvas->SetClipRect(1, 2, 3, 4, IMKCanvasBase::Union);
    }
    EXPECT_EQ(GetAllocationCount(), before);
    refuse = false;
}

} // namespace
} // namespace Moka::Testing
