// Clip rectangles: which mechanism, which rectangle, and what is as before afterwards. Most tests look at the
// state that each draw found. What a stencil leaves is seen in the pictures.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/canvas/MKCanvasClipping.h"
#include "tests/unit/canvas/CanvasFixture.h"

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

constexpr auto Intersect = IMKCanvasBase::Intersect;
constexpr auto Replace = IMKCanvasBase::Replace;
constexpr auto Union = IMKCanvasBase::Union;

char const kWarning[] =
    "!CLIPPING PERFORMANCE WARNING! MKCanvasClipping::EnableClip Stencil Clip. This clipping "
    "mode can cause significant performance penalties";

class Clipping : public CanvasFixture {
protected:
    static constexpr int kHeight = 60;

    Clipping() { Use(NewBitmap(50, kHeight)); }
    void Clip(int x, int y, int width, int height, IMKCanvasBase::ClipOp op = Intersect) {
        canvas->SetClipRect(x, y, width, height, op);
    }

    // The state that a rectangle over everything finds.
    PipelineState DrawAndTakeState() {
        TakeEvents();
        Matrix3<float> const m = canvas->GetMatrix();
        canvas->SetMatrix(Matrix3<float>());
        canvas->DrawRect(0, 0, 50, 1000, &paint);
        canvas->SetMatrix(m);
        PipelineState found;
        int draws = 0;
        for (TracedDraw const& draw : TakeDraws()) {
            if (!draw.state.blend.IsColorWrite()) continue; // fills the stencil
            found = draw.state;
            ++draws;
        }
        EXPECT_EQ(draws, 1);
        return found;
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
};

TEST_F(Clipping, FractionsTruncateTowardsZeroOnTexturesAndOnTheScreen) {
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

TEST_F(Clipping, ADrawableFindsTheStencilAndColourWritesOn) {
    canvas->PreRotate(30, 7, 8);
    Clip(3, 4, 20, 30);
    FakeDrawable drawable; // whose own blending nobody sets
    drawable.onDraw = [](Matrix4<float> const&, MKPaint const&) {
        PipelineState const state = RendererTrace::GetState();
        EXPECT_TRUE(state.stencilClip && state.blend.IsColorWrite());
        EXPECT_EQ(state.depthStencil.GetWriteMask(), 0u);
    };
    canvas->Draw(&drawable, &paint);
    queue.RunAll();
    EXPECT_EQ(drawable.draws, 1);
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
    PipelineState const after = RendererTrace::GetState();
    EXPECT_FALSE(after.depthStencil.IsStencil() || after.stencilClip);

    canvas->Restore(0); // nothing saved
    canvas->Save(IMKCanvasBase::SaveMatrix);
    canvas->Restore(-1); // resets the clip
    PipelineState const unclipped = DrawAndTakeState();
    EXPECT_FALSE(unclipped.scissorOn || unclipped.depthStencil.IsStencil());
}

TEST_F(Clipping, AClippedDrawLeavesTheScissorAsItWasAndAnUnclippedOneOff) {
    auto const setScissor = [](bool on) {
        OnRenderThread const here;
        RendererFactory::GetRasterizerState()->SetScissorEnabled(on);
        RendererFactory::GetRasterizerState()->SetScissorRect({5, 6, 7, 8});
    };
    setScissor(true);
    PipelineState const unclipped = DrawAndTakeState();
    EXPECT_FALSE(unclipped.scissorOn || unclipped.depthStencil.IsStencil() || unclipped.stencilClip);
    Clip(1, 2, 3, 4);
    for (bool on : {false, true}) {
        setScissor(on);
        EXPECT_EQ(Scissor(), (ScissorRect{1, 2, 3, 4}));
        EXPECT_EQ(RendererTrace::GetState().scissorOn, on);
    }
    EXPECT_EQ(RendererTrace::GetState().scissor, (ScissorRect{5, 6, 7, 8}));
}

// Straight to the clipping, on the render thread.
class ClipCounts : public Clipping {
protected:
    PipelineState Enabled() {
        clipping.EnableClipRT(0);
        PipelineState const state = RendererTrace::GetState();
        clipping.DisableClipRT();
        return state;
    }

    OnRenderThread const here;
    MKCanvasClipping clipping{target.Get()};
};

TEST_F(ClipCounts, MoreThanThereAreAddsEmptyOnesAndFewerDropTheLast) {
    clipping.AddClipRectRT({1, 2, 30, 30, Intersect, {}});
    clipping.AddClipRectRT({5, 5, 5, 5, Intersect, {}});
    clipping.RemoveClipRectRT(1);
    EXPECT_EQ(Enabled().scissor, (ScissorRect{1, 2, 30, 30}));
    clipping.RemoveClipRectRT(3);
    EXPECT_EQ(Enabled().scissor, (ScissorRect{0, kHeight, 0, 0}));
    // An all-zero matrix hides its rectangle from the stencil too; the identity would show (0, 0).
    clipping.AddClipRectRT({1, 1, 9, 9, Union, {}});
    RendererTrace::TakeEvents();
    EXPECT_TRUE(Enabled().depthStencil.IsStencil());
    EXPECT_EQ(ProjectionOf(RendererTrace::GetDraws()[2])[0], 0.0f);
    clipping.RemoveClipRectRT(0);
    EXPECT_FALSE(Enabled().scissorOn);
}

} // namespace
} // namespace Moka::Testing
