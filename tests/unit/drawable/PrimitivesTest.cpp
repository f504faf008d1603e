// Rectangles, round rectangles, circles and lines: what they are drawn with. What they cover is seen in the
// pictures.
#include "moka/graphics/drawable/MKCircleDrawable.h"
#include "moka/graphics/drawable/MKLineDrawable.h"
#include "moka/graphics/drawable/MKRectDrawable.h"
#include "moka/graphics/drawable/MKRoundRectDrawable.h"
#include "tests/support/Allocation.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <functional>
#include <memory>

namespace Moka::Testing {
namespace {

using ::testing::SizeIs;

using PrimitivesTest = DrawableFixture;

TEST_F(PrimitivesTest, ThePointsAreFreedUnlessTheLineIsTooThin) {
    auto const isFreed = [&](MKLineDrawable& drawable, std::size_t count, float width) {
        auto points = std::make_unique<std::vector<PointF>>(count);
        DeleteWatch const watch(points.get());
        MKPaint paint;
        paint.SetLineWidth(width);
        drawable.DrawSimpleLinesRT(points.get(), projection, paint);
        bool const freed = watch.GetPlainDeletes() == 1;
        if (freed) static_cast<void>(points.release());
        return freed;
    };
    MKLineDrawable drawable;
    EXPECT_TRUE(isFreed(drawable, 4, 1));
    EXPECT_FALSE(isFreed(drawable, 4, 0.9f));
    drawable.DrawSimpleLinesRT(nullptr, projection, MKPaint());
    EXPECT_THAT(TakeDraws(), SizeIs(1));
}

TEST_F(PrimitivesTest, EveryDrawAppliesThePaintAndItsOwnStates) {
    MKRectDrawable rect;
    MKRoundRectDrawable roundRect;
    MKCircleDrawable circle;
    MKLineDrawable line;
    MKPaint paint = CommonPaint();
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(2);
    auto const draw = [&] {
        RectF const r(2, 2, 12, 12);
        PointF const from(2, 2);
        PointF const to(12, 12);
        std::function<void()> const requests[] = {
            [&] { rect.DrawRectRT(r, projection, paint); },
            [&] { roundRect.DrawRoundRectRT(r, 3, 3, projection, paint); },
            [&] { circle.DrawCircleRT(from, 3, projection, paint); },
            [&] { line.DrawLineRT(from, to, projection, paint); },
            [&] { line.DrawSimpleLineRT(from, to, projection, paint); },
            [&] {
                line.DrawSimpleLinesRT(new std::vector<PointF>{from, to}, projection, paint);
            },
        };
        for (auto const& request : requests) {
            ForceOtherStates(); // each on states that another one has left
            request();
        }
        std::vector<TracedDraw> draws = TakeDraws();
        EXPECT_THAT(draws, SizeIs(1 + 4 + 2 + 3));
        return draws;
    };
    RendererTrace::TakeCalls();
    std::vector<TracedDraw> const draws = draw();
    EXPECT_EQ(RendererTrace::CountCalls("SetDescriptor"), 1 + 1 + 1 + 3) << "equal ones as well";
    for (TracedDraw const& each : draws) {
        ExpectCommonState(each);
        EXPECT_FALSE(each.state.depthStencil.IsStencil() || each.state.depthStencil.IsDepth());
    }
    paint.ClearTintColor();
    for (TracedDraw const& each : draw()) EXPECT_EQ(Values(each, {"uHasTintColor"}), "0");
    for (int mode : {-1, 19, 1000000}) { // any other number is source over
        paint.SetXFermode(static_cast<MKPaint::XFermode>(mode));
        for (TracedDraw const& each : draw()) {
            EXPECT_EQ(each.state.blend.GetColorEquation().destination, BlendingFactor::OneMinusSrcAlpha);
        }
    }
    paint.SetXFermode(MKPaint::BlendingOff);
    rect.DrawRectRT(RectF(2, 2, 12, 12), projection, paint);
    EXPECT_FALSE(TakeDraw().state.blend.IsBlending());
}

} // namespace
} // namespace Moka::Testing
