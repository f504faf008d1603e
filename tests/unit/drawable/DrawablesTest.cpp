// Primitives and bitmaps: what the pictures do not show.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/MKBitmapDrawable.h"
#include "moka/graphics/drawable/MKCircleDrawable.h"
#include "moka/graphics/drawable/MKLineDrawable.h"
#include "moka/graphics/drawable/MKRectDrawable.h"
#include "moka/graphics/drawable/MKRoundRectDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "tests/support/Queues.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <functional>
#include <memory>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::SizeIs;

TEST_F(DrawableFixture, EveryDrawAppliesThePaintAndItsOwnStatesAndThinLinesLeaveTheirPoints) {
    MKRectDrawable rect;
    MKRoundRectDrawable roundRect;
    MKCircleDrawable circle;
    MKLineDrawable line;
    MKPaint paint;
    paint.SetColor(0.5f, 0.25f, 0.125f, 0.75f);
    paint.SetTintColor(1, 0, 0.5f, 0.25f);
    paint.SetXFermode(MKPaint::DstIn);
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
    for (TracedDraw const& each : draw()) {
        EXPECT_EQ(Values(each, {"uProjectionMatrix", "uColor", "uTintColor", "uHasTintColor"}),
                  "2 0 0 0 0 3 0 0 0 0 1 0 -1 0.5 0 1 | 0.5 0.25 0.125 0.75 | 1 0 0.5 0.25 | 1");
        EXPECT_TRUE(each.state.blend.IsBlending());
        EXPECT_EQ(each.state.blend.GetColorEquation().destination, BlendingFactor::SrcAlpha); // DstIn
        EXPECT_FALSE(each.state.depthStencil.IsStencil() || each.state.depthStencil.IsDepth());
    }
    paint.ClearTintColor();
    paint.SetXFermode(static_cast<MKPaint::XFermode>(19)); // any other number is source over
    for (TracedDraw const& each : draw()) {
        EXPECT_EQ(Values(each, {"uHasTintColor"}), "0");
        EXPECT_EQ(each.state.blend.GetColorEquation().destination, BlendingFactor::OneMinusSrcAlpha);
    }
    auto const points = std::make_unique<std::vector<PointF>>(4);
    MKPaint thin;
    thin.SetLineWidth(0.9f);
    line.DrawSimpleLinesRT(points.get(), projection, thin); // they stay ours
}

class BitmapDrawableTest : public DrawableFixture {
protected:
    // Alone and in a batch.
    std::vector<TracedDraw> Draw(RectF const& bounds, RectF const& src, MKPaint const& paint) {
        MKBitmapDrawable drawable(&queue);
        IMKBitmapReadable* const readable = bitmap->GetBitmapReadable();
        std::vector<RectF> const dsts = {RectF(0, 0, 5, 5)};
        EXPECT_TRUE(drawable.DrawBitmapRT(readable, bounds, bounds, src, dsts[0], projection, paint));
        EXPECT_TRUE(drawable.DrawBitmapsRT(readable, bounds, bounds, src, &dsts, projection, paint));
        EXPECT_EQ(queue.GetPostedCount(), 0);
        std::vector<TracedDraw> draws = TakeDraws();
        EXPECT_EQ(draws.size(), 2u);
        return draws;
    }

    HandPumpedQueue queue;
    RefPtr<IMKBitmap> bitmap =
        RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 8, 4, nullptr, false, 0, false));
};

// Its left edge is added on the right.
TEST_F(BitmapDrawableTest, ABitmapThatDoesNotLieAtTheOriginIsStretched) {
    for (TracedDraw const& shifted : Draw(RectF(10, 20, 18, 24), RectF(12, 21, 16, 23), MKPaint())) {
        std::vector<float> const& v = shifted.vertices; // of place, coverage and texture coordinates
        EXPECT_THAT(std::vector<float>(v.begin(), v.begin() + 5), ElementsAre(0, 0, 1, 0.25f, 0.25f));
        EXPECT_THAT(std::vector<float>(v.end() - 5, v.end()),
                    ElementsAre(5, 5, 1, (16.0f + 10.0f) / 8.0f, 0.75f));
    }
}

TEST_F(BitmapDrawableTest, TheStencilTestStaysAndOneGpuGetsAProgramThatClampsColours) {
    for (std::string const gpu : {"Mali-T830", "Mali-T830 MP2", "Mali-T83"}) {
        RendererTrace::SetGpuName(gpu.c_str());
        ForceOtherStates();
        for (TracedDraw const& draw : Draw(RectF(0, 0, 8, 4), RectF(2, 1, 6, 3), MKPaint())) {
            EXPECT_EQ(draw.shader, gpu == "Mali-T830" ? "MKBitmapShaderColorClamp" : "MKBitmapShader");
            EXPECT_TRUE(draw.state.depthStencil.IsStencil());
        }
    }
}

} // namespace
} // namespace Moka::Testing
