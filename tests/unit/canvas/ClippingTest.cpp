// Clip rectangles: which mechanism, which rectangle or stencil, and what is as before afterwards. Most tests
// look at the state that each draw found.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/canvas/MKCanvasClipping.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <sstream>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

constexpr auto Intersect = IMKCanvasBase::Intersect;
constexpr auto Replace = IMKCanvasBase::Replace;
constexpr auto Union = IMKCanvasBase::Union;
constexpr int kMaxInt = std::numeric_limits<int>::max();
constexpr int kMinInt = std::numeric_limits<int>::min();

char const kWarning[] =
    "!CLIPPING PERFORMANCE WARNING! MKCanvasClipping::EnableClip Stencil Clip. This clipping "
    "mode can cause significant performance penalties";

bool WritesColor(RecordedDraw const& draw) { return draw.state.blend.IsColorWrite(); }

class Clipping : public CanvasFixture {
protected:
    static constexpr int kHeight = 60;

    void SetUp() override {
        CanvasFixture::SetUp();
        Use(NewBitmap(50, kHeight));
    }
    void TearDown() override {
        canvas = {};
        target = {};
        CanvasFixture::TearDown();
    }
    void Use(BitmapPtr const& bitmap) {
        target = bitmap;
        target->SetTag("page");
        canvas = NewCanvas(target);
        queue.RunAll();
        RecordingRenderer::TakeEvents();
        RecordingRenderer::TakeCalls();
    }
    void Clip(int x, int y, int width, int height, IMKCanvasBase::ClipOp op = Intersect) {
        canvas->SetClipRect(x, y, width, height, op);
    }

    // The states that a rectangle over everything finds, by strip.
    std::vector<PipelineState> DrawAndTakeStates() {
        TakeEvents();
        Matrix3<float> const m = canvas->GetMatrix();
        canvas->SetMatrix(Matrix3<float>());
        canvas->DrawRect(0, 0, 50, 1000, &paint);
        canvas->SetMatrix(m);
        std::vector<PipelineState> states;
        for (RecordedDraw const& draw : TakeDraws())
            if (WritesColor(draw)) states.push_back(draw.state);
        return states;
    }
    PipelineState DrawAndTakeState() {
        std::vector<PipelineState> const states = DrawAndTakeStates();
        EXPECT_THAT(states, SizeIs(1));
        return states.empty() ? PipelineState() : states.back();
    }
    // Demands the scissor.
    ScissorRect Scissor() {
        PipelineState const state = DrawAndTakeState();
        EXPECT_TRUE(state.scissorOn);
        EXPECT_FALSE(state.depthStencil.IsStencil());
        return state.scissor;
    }
    bool NeedsStencil() {
        PipelineState const state = DrawAndTakeState();
        EXPECT_NE(state.scissorOn, state.depthStencil.IsStencil());
        EXPECT_EQ(state.stencilClip, state.depthStencil.IsStencil());
        return state.stencilClip;
    }

    // How the stencil came about: "clear V" and "rect|screen comparison reference operation".
    std::vector<std::string> TakeStencilSteps() {
        std::vector<std::string> steps;
        for (RecordedEvent const& event : TakeEvents()) {
            std::ostringstream step;
            if (auto const* clear = std::get_if<RecordedClear>(&event)) {
                EXPECT_TRUE(clear->clearsStencil && !clear->clearsDepth);
                step << "clear " << clear->stencil;
            } else if (auto const& draw = std::get<RecordedDraw>(event); !WritesColor(draw)) {
                auto const& test = draw.state.depthStencil;
                bool const isScreen = ProjectionOf(draw) == NumbersOf(Matrix4<float>());
                step << (isScreen ? "screen " : "rect ") << test.GetComparison() << ' ' << test.GetReference()
                     << ' ' << test.GetPass();
                EXPECT_EQ(draw.count, 6);
                EXPECT_TRUE(test.IsStencil() && !test.IsDepth());
                EXPECT_EQ(test.GetReadMask() & test.GetWriteMask(), 255u);
                EXPECT_FALSE(draw.state.scissorOn || draw.state.stencilClip);
            } else {
                step << "draw";
            }
            steps.push_back(step.str());
        }
        return steps;
    }

    BitmapPtr target;
    CanvasPtr canvas;
};

TEST_F(Clipping, WithoutClipsTheScissorIsOffAndNothingElseIsTouched) {
    {
        OnRenderThread const here;
        RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
    }
    PipelineState const state = DrawAndTakeState();
    EXPECT_FALSE(state.scissorOn || state.depthStencil.IsStencil() || state.stencilClip);
}

TEST_F(Clipping, FractionsTruncateAsWrittenOnTexturesAndOnTheScreen) {
    struct Case {
        Matrix3<float> matrix;
        int x, y, width, height;
        ScissorRect onTexture, onScreen; // first row first, and bottom up
    };
    Case const cases[] = {
        {Matrix3<float>(), 4, 8, 20, 30, {4, 8, 20, 30}, {4, 22, 20, 30}},
        // Top 8.25: bottom is trunc(60 - 38.25) = 21, and 60 - 21 - 30 = 9.
        {Matrix3<float>::translateMatrix(0.75f, 0.25f), 4, 8, 20, 30, {4, 9, 20, 30}, {4, 21, 20, 30}},
        // Widths truncate apart from edges: 1.5 * 5 is 7.
        {Matrix3<float>::scaleMatrix(1.5f, 2.5f), 3, 3, 5, 5, {4, 8, 7, 12}, {4, 40, 7, 12}},
        // Edges left of and above the target truncate towards it.
        {Matrix3<float>::translateMatrix(-4.5f, -8.5f), 4, 8, 20, 30, {0, 0, 20, 30}, {0, 30, 20, 30}},
        {Matrix3<float>::scaleMatrix(-1, 1), 0, 0, 20, 30, {0, 60, 0, 0}, {0, 0, 0, 0}}, // nothing is left
    };
    for (bool onScreen : {false, true}) {
        for (Case const& c : cases) {
            Use(onScreen ? NewScreen(50, kHeight) : NewBitmap(50, kHeight));
            canvas->SetMatrix(c.matrix);
            Clip(c.x, c.y, c.width, c.height);
            EXPECT_EQ(Scissor(), onScreen ? c.onScreen : c.onTexture) << (&c - cases);
        }
    }
}

TEST_F(Clipping, EveryStripHasItsPartOfTheRectangle) {
    Use(NewBitmap(50, kMaxSide + 36));
    Clip(10, 50, 20, 30);
    std::vector<PipelineState> const states = DrawAndTakeStates();
    ASSERT_THAT(states, SizeIs(2));
    EXPECT_EQ(states[0].scissor, (ScissorRect{10, 50, 20, 30}));
    EXPECT_EQ(states[1].scissor, (ScissorRect{10, -14, 20, 30}));
}

TEST_F(Clipping, RectanglesIntersectFromTheLastReplaceOn) {
    Clip(0, 0, 20, 20);
    Clip(10, 5, 40, 40);
    EXPECT_EQ(Scissor(), (ScissorRect{10, 5, 10, 15}));
    Clip(30, 30, 5, 5);
    EXPECT_EQ(Scissor(), (ScissorRect{0, kHeight, 0, 0})) << "disjoint";
    Clip(1, 2, 30, 30, Replace);
    Clip(11, 12, 30, 30);
    EXPECT_EQ(Scissor(), (ScissorRect{11, 12, 20, 20}));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_WARN), IsEmpty());
}

TEST_F(Clipping, TheScissorServesWhereOneRectangleWillDo) {
    canvas->SetMatrix(Matrix3<float>(1, 5, 0, 0, 1, 0, 0, 0, 1)); // element 1 is not looked at
    Clip(0, 0, 20, 20, IMKCanvasBase::Difference);                // nor is the operation of a single one
    EXPECT_FALSE(NeedsStencil());
    Clip(0, 0, 10, 10);
    EXPECT_TRUE(NeedsStencil()) << "of two it is";
    Clip(0, 0, 10, 10, Replace);
    EXPECT_FALSE(NeedsStencil()) << "a last one that replaces";
    Clip(0, 0, 10, 10);
    EXPECT_TRUE(NeedsStencil()) << "but only as the last";
    canvas->Restore(-1);
    Use(NewBitmap(50, kHeight));
    canvas->PreRotate(10);
    Clip(0, 0, 10, 10);
    EXPECT_TRUE(NeedsStencil());
}

TEST_F(Clipping, EachOperationHasItsStencilSteps) {
    struct Case {
        int op;
        std::vector<std::string> steps;
    };
    Case const cases[] = {
        {0, {"rect 7 1 3", "screen 7 1 4"}},
        {2, {"rect 2 0 3"}},
        {3, {"rect 7 1 3", "rect 2 2 1"}},
        {4, {"rect 7 1 1"}},
        {5, {"screen 2 1 3", "rect 7 1 3", "screen 5 1 1"}},
        {6, {}},
    };
    for (Case const& c : cases) {
        Use(NewBitmap(50, kHeight));
        Clip(1, 1, 9, 9, Union);
        Clip(2, 2, 9, 9, static_cast<IMKCanvasBase::ClipOp>(c.op));
        canvas->DrawRect(0, 0, 50, 50, &paint);
        std::vector<std::string> expected{"clear 1", "rect 2 0 3"};
        expected.insert(expected.end(), c.steps.begin(), c.steps.end());
        expected.push_back("draw");
        EXPECT_EQ(TakeStencilSteps(), expected) << c.op;
    }
    Use(NewBitmap(50, kHeight));
    Clip(1, 1, 9, 9, Union);
    Clip(1, 1, 9, 9, Replace);
    Clip(1, 1, 9, 9, Union);
    canvas->DrawRect(0, 0, 50, 50, &paint);
    EXPECT_THAT(TakeStencilSteps(), ElementsAre("clear 0", "clear 0", "rect 7 1 3", "rect 2 0 3", "draw"));
}

TEST_F(Clipping, TheStencilHoldsTheRectanglesUnderTheirMatricesAndEveryPrimitiveObeysIt) {
    Use(NewBitmap(50, kMaxSide + 36));
    canvas->PreRotate(30, 7, 8);
    Matrix3<float> const turned = canvas->GetMatrix();
    Clip(3, 4, 20, 30);
    canvas->SetMatrix(Matrix3<float>());
    FakeDrawable drawable;
    auto const source = NewBitmap(4, 4);
    paint.SetStyle(MKPaint::FillAndStroke);
    canvas->DrawRect(1, 70, 9, 80, &paint);
    canvas->DrawRoundRect(1, 70, 9, 80, 2, 2, &paint);
    canvas->DrawCircle(9, 80, 5, &paint);
    canvas->DrawLine(1, 70, 9, 80, &paint);
    canvas->DrawSimpleLines({{1, 70}, {9, 80}}, &paint);
    canvas->DrawBitmap(source.Get(), 1, 70, &paint);
    paint.SetXFermode(MKPaint::Darken);
    canvas->DrawBitmap(source.Get(), 1, 70, &paint);
    int colored = 0;
    for (RecordedDraw const& draw : TakeDraws()) {
        EXPECT_EQ(draw.target, "target 3") << "the second strip";
        EXPECT_NE(draw.buffer, "none");
        if (!WritesColor(draw)) {
            if (ProjectionOf(draw) == NumbersOf(Matrix4<float>())) continue;
            auto* const strip = target->GetTextureBitmap()->GetSubBitmap(1);
            EXPECT_EQ(ProjectionOf(draw), NumbersOf(strip->GetProjectionMatrix() * FromMatrix3(turned)));
            EXPECT_EQ(draw.vertices, (Numbers{3, 4, 0, 3, 34, 0, 23, 4, 0, 23, 4, 0, 3, 34, 0, 23, 34, 0}));
            continue;
        }
        ++colored;
        auto const& test = draw.state.depthStencil;
        EXPECT_TRUE(test.IsStencil()) << draw.shader;
        EXPECT_EQ(test.GetComparison(), 2);
        EXPECT_EQ(test.GetReference(), 1);
        EXPECT_EQ(test.GetReadMask(), 255u);
        EXPECT_EQ(test.GetWriteMask(), 0u);
        EXPECT_TRUE(draw.state.stencilClip);
    }
    EXPECT_EQ(colored, 1 + 4 + 2 + 1 + 1 + 1 + 1);
    canvas->Draw(&drawable, &paint); // whose own blending nobody sets: colour writes are on already
    drawable.onDraw = [](Matrix4<float> const&, MKPaint const&) {
        EXPECT_TRUE(RecordingRenderer::GetState().blend.IsColorWrite());
    };
    queue.RunAll();
    EXPECT_EQ(drawable.draws, 2);
}

TEST_F(Clipping, AStencilIsThereForOneDrawAndDrawnAnewForTheNext) {
    Clip(1, 1, 9, 9, Union);
    Clip(1, 1, 9, 9, Union);
    for (int i = 0; i < 2; ++i) canvas->DrawRect(0, 0, 50, 50, &paint);
    queue.RunAll();
    EXPECT_THAT(TakeCalls("AttachDepthStencil"),
                ElementsAre("target 1 AttachDepthStencil buffer 1", "target 1 AttachDepthStencil buffer 2"));
    EXPECT_EQ(RendererFactory::GetStatistics().depthStencilBuffers, 0);
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_WARN),
                ElementsAre(kWarning, "Stencil clipping was activateted for bitmap: page", kWarning,
                            "Stencil clipping was activateted for bitmap: page"));
    EXPECT_EQ(log.Find(kWarning).tag, "mok_log");
    PipelineState const after = RecordingRenderer::GetState();
    EXPECT_FALSE(after.depthStencil.IsStencil() || after.stencilClip);

    canvas->Restore(0); // nothing saved
    canvas->Save(IMKCanvasBase::SaveMatrix);
    canvas->Restore(-1); // resets the clip
    PipelineState const unclipped = DrawAndTakeState();
    EXPECT_FALSE(unclipped.scissorOn || unclipped.depthStencil.IsStencil());
}

TEST_F(Clipping, AfterAClippedDrawTheScissorIsAsBefore) {
    Clip(1, 2, 3, 4);
    for (bool on : {true, false}) {
        {
            OnRenderThread const here;
            RendererFactory::GetRasterizerState()->SetScissorEnabled(on);
            RendererFactory::GetRasterizerState()->SetScissorRect({5, 6, 7, 8});
        }
        EXPECT_EQ(Scissor(), (ScissorRect{1, 2, 3, 4}));
        PipelineState const after = RecordingRenderer::GetState();
        EXPECT_EQ(after.scissorOn, on);
        if (on) {
            EXPECT_EQ(after.scissor, (ScissorRect{5, 6, 7, 8}));
        }
    }
}

// Straight to the clipping, on the render thread.
class ClipCounts : public Clipping {
protected:
    void SetUp() override {
        Clipping::SetUp();
        RecordingRenderer::DeclareRenderThread();
        clipping = std::make_unique<MKCanvasClipping>(target.Get());
    }
    void TearDown() override {
        clipping.reset();
        RecordingRenderer::DeclareNoRenderThread();
        Clipping::TearDown();
    }
    PipelineState Enabled() {
        clipping->EnableClipRT(0);
        PipelineState const state = RecordingRenderer::GetState();
        clipping->DisableClipRT();
        return state;
    }
    std::unique_ptr<MKCanvasClipping> clipping;
};

TEST_F(ClipCounts, MoreThanThereAreAddsEmptyOnesAndFewerDropTheLast) {
    clipping->AddClipRectRT({1, 2, 30, 30, Intersect, {}});
    clipping->AddClipRectRT({5, 5, 5, 5, Intersect, {}});
    clipping->RemoveClipRectRT(1);
    EXPECT_EQ(Enabled().scissor, (ScissorRect{1, 2, 30, 30}));
    clipping->RemoveClipRectRT(3);
    EXPECT_EQ(Enabled().scissor, (ScissorRect{0, kHeight, 0, 0}));
    // An all-zero matrix hides its rectangle from the stencil too; the identity would show (0, 0).
    clipping->AddClipRectRT({1, 1, 9, 9, Union, {}});
    RecordingRenderer::TakeEvents();
    EXPECT_TRUE(Enabled().depthStencil.IsStencil());
    EXPECT_EQ(ProjectionOf(RecordingRenderer::GetDraws()[2])[0], 0.0f);
    clipping->RemoveClipRectRT(0);
    EXPECT_FALSE(Enabled().scissorOn);
}

TEST_F(ClipCounts, WildCountsAndNumbersAreHarmless) {
    for (int count : {kMinInt, -1}) {
        clipping->AddClipRectRT({1, 1, 9, 9, Intersect, {}});
        clipping->RemoveClipRectRT(count);
        EXPECT_FALSE(clipping->HasClips());
    }
    clipping->RemoveClipRectRT(kMaxInt);
    EXPECT_EQ(Enabled().scissor, (ScissorRect{0, kHeight, 0, 0}));
    clipping->RemoveClipRectRT(0);

    // Reaches over everything, and so does its float sum.
    clipping->AddClipRectRT({kMinInt / 2, kMinInt / 2, kMaxInt, kMaxInt, Intersect, {}});
    clipping->AddClipRectRT(
        {kMinInt, kMinInt, kMaxInt, kMaxInt, Intersect, Matrix3<float>::scaleMatrix(4, 4)});
    clipping->AddClipRectRT({2, 3, 10, 10, Intersect, {}});
    EXPECT_EQ(Enabled().scissor, (ScissorRect{0, kHeight, 0, 0})) << "the second ends left of the target";
    clipping->RemoveClipRectRT(1);
    clipping->AddClipRectRT({2, 3, 10, 10, Intersect, {}});
    EXPECT_EQ(Enabled().scissor, (ScissorRect{2, 3, 10, 10}));
    for (float odd : {kNaN, kInfinity, -kInfinity, 3e38f}) {
        for (int i : {0, 3, 4, 6, 7, 8}) {
            Matrix3<float> m;
            m[i] = odd;
            clipping->AddClipRectRT({1, 1, kMaxInt, kMinInt, Union, m});
            Enabled();
            clipping->RemoveClipRectRT(0);
            clipping->AddClipRectRT({1, 1, kMaxInt, kMinInt, Intersect, m});
            Enabled();
            clipping->RemoveClipRectRT(0);
        }
    }
}

TEST_F(ClipCounts, TenThousandClipsWork) {
    for (int i = 0; i < 10000; ++i) clipping->AddClipRectRT({i % 7, 0, 40, 50, Intersect, {}});
    EXPECT_EQ(Enabled().scissor, (ScissorRect{6, 0, 34, 50}));
    clipping->AddClipRectRT({0, 0, 40, 50, Union, {}});
    RecordingRenderer::TakeEvents();
    EXPECT_TRUE(Enabled().depthStencil.IsStencil());
    EXPECT_THAT(RecordingRenderer::GetDraws(), SizeIs(20001));
}

TEST_F(ClipCounts, WhatTheRendererRefusesLeavesDrawingUnclippedNotBroken) {
    for (int creation = 1; creation <= 5; ++creation) {
        clipping.reset();
        RecordingRenderer::FailCreation(creation);
        clipping = std::make_unique<MKCanvasClipping>(target.Get());
        RecordingRenderer::StopFailing();
        clipping->AddClipRectRT({1, 1, 9, 9, Intersect, {}});
        EXPECT_TRUE(Enabled().scissorOn);
        clipping->AddClipRectRT({1, 1, 9, 9, Union, {}});
        EXPECT_FALSE(Enabled().scissorOn);
        EXPECT_TRUE(RecordingRenderer::GetState().blend.IsColorWrite());
    }
}

TEST_F(Clipping, NumbersWithoutANameAddNothing) {
    Clip(0, 0, 10, 10);
    Clip(5, 5, 10, 10, Union);
    canvas->DrawRect(0, 0, 50, 60, &paint);
    std::vector<std::string> const steps = TakeStencilSteps();
    EXPECT_THAT(steps, SizeIs(5));
    Clip(5, 5, 10, 10, static_cast<IMKCanvasBase::ClipOp>(-77));
    canvas->Save(static_cast<IMKCanvasBase::SaveFlag>(77));
    canvas->DrawRect(0, 0, 50, 60, &paint);
    EXPECT_EQ(TakeStencilSteps(), steps);
}

} // namespace
} // namespace Moka::Testing
