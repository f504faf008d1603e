// The render side: what is skipped, which strips are drawn, with which matrices, and what is given back.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/MKCanvasImpl.h"
#include "tests/unit/base/Allocation.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <optional>
#include <stdexcept>

namespace Moka::Testing {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class Drawing : public CanvasFixture {
protected:
    // Two strips, the second one 36 rows high; frame buffers "target 1" and "target 2".
    void SetUp() override {
        CanvasFixture::SetUp();
        target = NewBitmap(60, kMaxSide + 36);
        canvas = NewCanvas(target);
        queue.RunAll();
        RecordingRenderer::TakeCalls();
    }
    void TearDown() override {
        canvas = {};
        target = {};
        CanvasFixture::TearDown();
    }

    IMKSubBitmap* Strip(int i) { return target->GetTextureBitmap()->GetSubBitmap(i); }
    Numbers Mvp(int strip, Matrix3<float> const& m) {
        return NumbersOf(Strip(strip)->GetProjectionMatrix() * FromMatrix3(m));
    }
    // Which of the target's strips the draws since the last call went to.
    std::vector<std::string> TakeTargets() {
        std::vector<std::string> targets;
        for (RecordedDraw const& draw : TakeDraws()) targets.push_back(draw.target);
        return targets;
    }

    BitmapPtr target;
    CanvasPtr canvas;
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
}

TEST_F(Drawing, EachStripIsDrawnActiveWithItsOwnProjectionAndGivenBack) {
    Matrix3<float> const m = Matrix3<float>::rotateMatrix(20);
    canvas->SetMatrix(m);
    canvas->DrawRoundRect(5, 5, 60, 90, 4, 6, &paint);
    std::vector<RecordedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(4)) << "body and corners on two strips";
    EXPECT_EQ(ProjectionOf(draws[0]), Mvp(0, m));
    EXPECT_EQ(ProjectionOf(draws[3]), Mvp(1, m));
    EXPECT_EQ(draws[3].target, "target 2");
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "none");
}

TEST_F(Drawing, ShapesWithoutExtentDrawNothingAndMakeNoDrawable) {
    paint.SetLineWidth(0.5f);
    canvas->DrawLine(1, 1, 9, 9, &paint);
    canvas->DrawSimpleLine(1, 1, 9, 9, &paint);
    canvas->DrawSimpleLines({{1, 1}, {9, 9}}, &paint);
    paint.SetLineWidth(1);
    canvas->DrawLine(3, 3, 3, 3, &paint);
    canvas->DrawSimpleLine(3, 3, 3, 3, &paint);
    canvas->DrawSimpleLines({}, &paint);
    canvas->DrawRect(5, 0, 5, 9, &paint);
    canvas->DrawRect(0, 5, 9, 5, &paint);
    canvas->DrawRoundRect(5, 0, 5, 9, 1, 1, &paint);
    for (float radius : {0.0f, -1.0f, kNaN}) canvas->DrawCircle(9, 9, radius, &paint);
    auto const source = NewBitmap(4, 4);
    canvas->DrawBitmap(source.Get(), RectF(5, 0, 5, 9), &paint);
    EXPECT_THAT(TakeDraws(), IsEmpty());
    EXPECT_EQ(RendererFactory::GetStatistics().graphicsObjects, 2) << "the clip's own";
    canvas->DrawLine(1, 1, 9, 9, &paint);
    EXPECT_THAT(TakeDraws(), SizeIs(1));
}

TEST_F(Drawing, NumbersThatAreNoneAndMatricesWithoutInverseAreHarmless) {
    float const odd[] = {kNaN, kInfinity, -kInfinity, 3e38f, 0};
    for (float a : odd) {
        canvas->SetMatrix(Matrix3<float>(a, 0, a, 0, 1, 0, 0, a, 0)); // perspective, singular
        for (float b : odd) {
            canvas->DrawRect(a, 1, 5, b, &paint);
            canvas->DrawLine(a, b, 1, 1, &paint);
            canvas->DrawSimpleLines({{a, b}, {b, a}}, &paint);
            canvas->DrawRoundRect(a, b, 9, 9, b, b, &paint);
            canvas->DrawCircle(a, b, b, &paint);
            canvas->DrawBitmap(target.Get(), RectF(a, b, b, a), RectF(b, a, a, b), &paint);
            canvas->DrawBitmaps(target.Get(), {RectF(a, b, 9, 9), RectF(0, 0, b, b)}, &paint);
        }
    }
    queue.RunAll();
    RecordingRenderer::TakeEvents();
    canvas->SetMatrix(Matrix3<float>());
    canvas->DrawRect(1, 1, 9, 9, &paint);
    EXPECT_EQ(ProjectionOf(TakeDraw()), Mvp(0, Matrix3<float>()));
}

TEST_F(Drawing, SimpleLinesReachEveryStripAndLogTheirDrawableOnce) {
    std::string const line = "void Moka::MKCanvasImpl::DrawSimpleLinesRT(vector<Moka::PointF> *, "
                             "Moka::Matrix3f, Moka::MKPaint) MKLineDrawable Created";
    for (int i = 0; i < 2; ++i) canvas->DrawSimpleLines({{1, 1}, {9, 90}, {9, 9}, {20, 9}}, &paint);
    std::vector<RecordedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(4));
    EXPECT_EQ(draws[0].vertices, draws[1].vertices);
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, line), 1);
    EXPECT_EQ(log.Find(line).tag, "mok_log");
    EXPECT_EQ(log.Find(line).format, "%s MKLineDrawable Created");

    auto const other = NewCanvas(target); // the other operations make it silently
    other->DrawLine(1, 1, 9, 9, &paint);
    other->DrawSimpleLines({{1, 1}, {9, 9}}, &paint);
    queue.RunAll();
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, line), 1);
}

TEST_F(Drawing, ATallBitmapIsDrawnInClampedPieces) {
    auto const source = NewBitmap(10, kMaxSide + 16);
    queue.RunAll();
    std::string const first =
        RecordingRenderer::NameOf(source->GetTextureBitmap()->GetSubBitmap(0)->GetTexture());
    std::string const second =
        RecordingRenderer::NameOf(source->GetTextureBitmap()->GetSubBitmap(1)->GetTexture());
    canvas->DrawBitmap(source.Get(), RectF(0, 32, 10, 80), RectF(0, 0, 20, 96), &paint);
    std::vector<RecordedDraw> const draws = TakeDraws();
    // Source rows 32 to 64 go to 0 to 64, which is strip 0; rows 64 to 80 to 64 to 96, strip 1.
    ASSERT_THAT(draws, SizeIs(2));
    EXPECT_EQ(draws[0].target, "target 1");
    EXPECT_EQ(draws[0].textures.at(0), first);
    EXPECT_EQ(draws[0].vertices[1], 0);
    EXPECT_EQ(draws[0].vertices[4], 0.5f) << "v of row 32 of the first strip";
    EXPECT_EQ(draws[1].target, "target 2");
    EXPECT_EQ(draws[1].textures.at(0), second);
    EXPECT_EQ(draws[1].vertices[1], 64);
    EXPECT_EQ(draws[1].vertices[4], 0);
    EXPECT_EQ(draws[1].vertices[5 + 1], 96) << "the lower left corner";

    paint.SetTileMode(MKPaint::Default, MKPaint::Mirror); // one that tiles is drawn whole, with strip 0
    canvas->DrawBitmap(source.Get(), RectF(0, 32, 10, 80), RectF(0, 0, 20, 96), &paint);
    std::vector<RecordedDraw> const whole = TakeDraws();
    ASSERT_THAT(whole, SizeIs(2));
    EXPECT_EQ(whole[1].textures.at(0), first);
    EXPECT_EQ(whole[1].vertices[4], 0.4f) << "row 32 of 80";
    EXPECT_EQ(RecordingRenderer::GetParameter(source->GetTextureBitmap()->GetSubBitmap(0)->GetTexture(),
                                              TextureParamWrappingT),
              TextureWrapMirroredRepeat);
}

TEST_F(Drawing, ABatchDrawsWhatIsVisibleAtOnceIntoTheFirstStrip) {
    auto const source = NewBitmap(10, 10);
    std::vector<RectF> const dsts{{-20, 0, -10, 9}, {1, 2, 3, 4}, {0, 70, 9, 80}, {90, 0, 99, 9}};
    canvas->DrawBitmaps(source.Get(), RectF(0, 0, 5, 5), dsts, &paint);
    RecordedDraw const draw = TakeDraw();
    EXPECT_EQ(draw.target, "target 1");
    EXPECT_EQ(draw.count, 12) << "the second and the third";
    EXPECT_EQ(draw.vertices[0], 1);
    EXPECT_EQ(draw.vertices[6 * 5 + 1], 70);

    canvas->DrawBitmaps(source.Get(), RectF(20, 20, 30, 30), dsts, &paint); // beside the source
    canvas->DrawBitmaps(source.Get(), {dsts[0], dsts[3]}, &paint);          // beside the target
    canvas->DrawBitmaps(source.Get(), std::vector<RectF>(), &paint);
    EXPECT_THAT(TakeDraws(), IsEmpty());
    EXPECT_EQ(CountOf(source.Get()), 1);
}

TEST_F(Drawing, AScreenBitmapIsNeitherSourceNorCutIntoStrips) {
    auto const screen = NewScreen(100, 100);
    canvas->DrawBitmap(screen.Get(), 0, 0, &paint);
    EXPECT_THAT(TakeDraws(), IsEmpty());
    EXPECT_EQ(CountOf(screen.Get()), 1);

    auto const onScreen = NewCanvas(screen);
    onScreen->DrawRect(10, 10, 20, 90, &paint);
    EXPECT_EQ(ProjectionOf(TakeDraw()), NumbersOf(screen->GetBitmapWritable()->GetProjectionMatrix()));
    onScreen->DrawRect(10, 101, 20, 110, &paint);
    EXPECT_THAT(TakeDraws(), IsEmpty());
}

TEST_F(Drawing, ACustomDrawableIsDrawnOnEveryStripAsFrameBufferMinusOne) {
    FakeDrawable drawable;
    std::vector<std::string> targets;
    std::vector<Numbers> projections;
    drawable.onDraw = [&](Matrix4<float> const& projection, MKPaint const&) {
        targets.push_back(RecordingRenderer::GetActiveTarget());
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
    RecordingRenderer::DeclareNoRenderThread();
    EXPECT_EQ(drawable.references, 1);
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "none");
    EXPECT_FALSE(RecordingRenderer::GetState().scissorOn);
}

// Makes every first draw of a canvas throw: when the drawable's vertices are refused, memory runs out for the
// rest of its making.
class FailingConstruction {
public:
    FailingConstruction() {
        RecordingRenderer::FailCreations(ObjectKind::GraphicsObject);
        mPrevious = SetLogSink([this](LogLine const&) {
            if (!mOutOfMemory) mOutOfMemory.emplace();
        });
    }
    ~FailingConstruction() {
        mOutOfMemory.reset();
        SetLogSink(mPrevious);
        RecordingRenderer::StopFailing();
    }
    template <class Action>
    bool Throws(Action const& action) {
        bool thrown = false;
        try {
            action();
        } catch (std::bad_alloc const&) {
            thrown = true;
        }
        mOutOfMemory.reset();
        return thrown;
    }

private:
    LogSink mPrevious;
    std::optional<FailAllocations> mOutOfMemory;
};

TEST_F(Drawing, ADrawableWhoseConstructionThrowsIsTriedAgainAndNothingIsKept) {
    auto const source = NewBitmap(4, 4);
    queue.RunAll();
    std::function<void()> const requests[] = {
        [&] { canvas->DrawRect(1, 1, 9, 9, &paint); },
        [&] { canvas->DrawLine(1, 1, 9, 9, &paint); },
        [&] {
            canvas->DrawSimpleLines({{1, 1}, {9, 9}}, &paint);
        },
        [&] { canvas->DrawRoundRect(1, 1, 9, 9, 2, 2, &paint); },
        [&] { canvas->DrawCircle(9, 9, 3, &paint); },
        [&] { canvas->DrawBitmap(source.Get(), 0, 0, &paint); },
        [&] { canvas->DrawBitmaps(source.Get(), {RectF(1, 1, 5, 5)}, &paint); },
    };
    for (auto const& request : requests) {
        canvas = NewCanvas(target);
        canvas->SetClipRect(0, 0, 50, 50, IMKCanvasBase::Intersect);
        queue.RunAll();
        RecordingRenderer::TakeCalls();
        {
            FailingConstruction failing;
            request();
            EXPECT_TRUE(failing.Throws([&] { queue.RunAll(); }));
            RecordingRenderer::DeclareNoRenderThread();
        }
        EXPECT_EQ(RecordingRenderer::CountCalls("Activate"), 0);
        EXPECT_EQ(CountOf(source.Get()), 1);
        request();
        EXPECT_THAT(TakeDraws(), ::testing::Not(IsEmpty()));
        EXPECT_EQ(CountOf(source.Get()), 1);
    }
}

TEST_F(Drawing, ClearingObeysTheClipStripByStripAndClearingAllDoesNot) {
    canvas->SetClipRect(10, 50, 20, 30, IMKCanvasBase::Intersect);
    queue.RunAll();
    RecordingRenderer::TakeEvents();
    canvas->Clear(0.25f, 0.5f, 0.75f, 1);
    queue.RunAll();
    std::vector<RecordedClear> clears = RecordingRenderer::GetClears();
    ASSERT_THAT(clears, SizeIs(2));
    EXPECT_EQ(clears[0].color, (std::array<float, 4>{0.25f, 0.5f, 0.75f, 1}));
    EXPECT_EQ(clears[0].state.scissor, (ScissorRect{10, 50, 20, 30}));
    EXPECT_EQ(clears[1].state.scissor, (ScissorRect{10, -14, 20, 30}));
    EXPECT_TRUE(clears[0].state.scissorOn && clears[1].state.scissorOn);
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "none");

    {
        OnRenderThread const here;
        RendererFactory::GetRasterizerState()->SetScissorEnabled(true);
        RendererFactory::GetRasterizerState()->SetScissorRect({1, 2, 3, 4});
    }
    RecordingRenderer::TakeEvents();
    canvas->ClearAll(static_cast<int>(0xFF000000u));
    queue.RunAll();
    clears = RecordingRenderer::GetClears();
    ASSERT_THAT(clears, SizeIs(2));
    EXPECT_FALSE(clears[0].state.scissorOn || clears[1].state.scissorOn);
    EXPECT_FALSE(RecordingRenderer::GetState().scissorOn) << "stays off";
    EXPECT_EQ(RecordingRenderer::GetState().scissor, (ScissorRect{1, 2, 3, 4}));
}

} // namespace
} // namespace Moka::Testing
