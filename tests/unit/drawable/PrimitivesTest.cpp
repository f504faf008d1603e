// Rectangles, round rectangles, circles and lines: what their vertices cover, and what they are drawn with.
#include "moka/graphics/drawable/MKCircleDrawable.h"
#include "moka/graphics/drawable/MKLineDrawable.h"
#include "moka/graphics/drawable/MKRectDrawable.h"
#include "moka/graphics/drawable/MKRoundRectDrawable.h"
#include "moka/renderer/IDepthStencilState.h"
#include "tests/unit/base/Allocation.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <memory>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class PrimitivesTest : public DrawableFixture {
protected:
    static MKPaint Paint(MKPaint::Style style, float width, bool antiAliased) {
        MKPaint paint;
        paint.SetStyle(style);
        paint.SetLineWidth(width);
        paint.SetAntiAliasing(antiAliased);
        return paint;
    }

    std::vector<Vertex> DrawRect(MKRectDrawable& drawable, RectF const& rect, MKPaint const& paint) {
        EXPECT_TRUE(drawable.DrawRectRT(rect, projection, paint));
        RecordedDraw const draw = TakeDraw();
        EXPECT_EQ(draw.shader, "MKRectShader");
        EXPECT_EQ(draw.primitive, PrimitiveType::TriangleList);
        EXPECT_EQ(draw.floatsPerVertex, 3);
        return VerticesOf(draw);
    }
};

TEST_F(PrimitivesTest, RectanglesCoverWhatTheirEdgesSay) {
    MKRectDrawable drawable;
    RectF const rect(4.25f, 6, 14, 13.5f);
    auto const draw = [&](MKPaint const& paint) { return DrawRect(drawable, rect, paint); };
    // The smallest distance to an edge's line, positive inside.
    auto const depth = [&](double x, double y) {
        return std::min({x - rect.left, rect.right - x, y - rect.top, rect.bottom - y});
    };

    std::vector<Vertex> const hard = draw(Paint(MKPaint::Fill, 9, false));
    EXPECT_THAT(hard, SizeIs(6));
    ExpectCoverage(hard, 0, 20, [&](double x, double y) { return depth(x, y) > 0 ? 1 : 0; });

    std::vector<Vertex> const soft = draw(Paint(MKPaint::Fill, 9, true));
    EXPECT_THAT(soft, SizeIs(30));
    ExpectCoverage(soft, 0, 20, [&](double x, double y) { return 0.5 + depth(x, y); });

    std::vector<Vertex> const hardStroke = draw(Paint(MKPaint::Stroke, 2.5f, false));
    EXPECT_THAT(hardStroke, SizeIs(24));
    ExpectCoverage(hardStroke, 0, 20,
                   [&](double x, double y) { return std::abs(depth(x, y)) < 1.25 ? 1 : 0; });

    std::vector<Vertex> const softStroke = draw(Paint(MKPaint::Stroke, 2.5f, true));
    EXPECT_THAT(softStroke, SizeIs(72));
    ExpectCoverage(softStroke, 0, 20, [&](double x, double y) { return 1.75 - std::abs(depth(x, y)); });

    // The stroke lies over the fill.
    std::vector<Vertex> both = soft;
    both.insert(both.end(), softStroke.begin(), softStroke.end());
    EXPECT_EQ(draw(Paint(MKPaint::FillAndStroke, 2.5f, true)), both);
}

TEST_F(PrimitivesTest, ThinStrokesAndUnknownStylesHandOverNoVertices) {
    MKRectDrawable drawable;
    RectF const rect(2, 2, 12, 12);
    EXPECT_THAT(DrawRect(drawable, rect, Paint(MKPaint::Stroke, 0.99f, true)), IsEmpty());
    EXPECT_THAT(DrawRect(drawable, rect, Paint(MKPaint::Stroke, kNaN, true)), IsEmpty());
    EXPECT_THAT(DrawRect(drawable, rect, Paint(static_cast<MKPaint::Style>(3), 4, true)), IsEmpty());
    EXPECT_THAT(DrawRect(drawable, rect, Paint(MKPaint::Stroke, 1, true)), SizeIs(72));
    EXPECT_THAT(DrawRect(drawable, rect, Paint(MKPaint::FillAndStroke, 0.99f, false)), SizeIs(6));

    MKRoundRectDrawable round;
    EXPECT_TRUE(round.DrawRoundRectRT(rect, 2, 2, projection, Paint(MKPaint::Stroke, 0.99f, true)));
    EXPECT_THAT(TakeDraws(), IsEmpty());

    // A stroke wider than its rectangle turns the hole inside out; nothing is clamped.
    std::vector<Vertex> const wide = DrawRect(drawable, rect, Paint(MKPaint::Stroke, 24, false));
    EXPECT_THAT(wide, ::testing::IsSupersetOf({Vertex{-10, -10, 1}, Vertex{24, 24, 1}, Vertex{14, 14, 1}}));
}

TEST_F(PrimitivesTest, RoundRectanglesCoverTheirStraightPartsAndHandTheRestToTheCorners) {
    MKRoundRectDrawable drawable;
    RectF const rect(3.25f, 4, 22, 18.5f);
    RectF const straight(3.25f + 4, 4 + 3, 22 - 4, 18.5f - 3);
    auto const depth = [&](double x, double y) {
        bool const horizontal = x > straight.left && x < straight.right;
        bool const vertical = y > straight.top && y < straight.bottom;
        if (horizontal && vertical) return 9.0;
        if (horizontal) return std::min(y - rect.top, rect.bottom - y);
        return vertical ? std::min(x - rect.left, rect.right - x) : -9.0;
    };

    // Drawn anti-aliased whatever the paint says.
    EXPECT_TRUE(drawable.DrawRoundRectRT(rect, 4, 3, projection, Paint(MKPaint::FillAndStroke, 2.5f, false)));
    std::vector<RecordedDraw> const draws = TakeDraws();
    ASSERT_THAT(draws, SizeIs(4));
    EXPECT_EQ(draws[0].shader, "MKRoundRectShader");
    EXPECT_EQ(draws[0].count, 42);
    ExpectCoverage(VerticesOf(draws[0]), 0, 25, [&](double x, double y) { return 0.5 + depth(x, y); });
    EXPECT_EQ(draws[2].shader, "MKRoundRectShader");
    EXPECT_EQ(draws[2].count, 72);
    ExpectCoverage(VerticesOf(draws[2]), 0, 25,
                   [&](double x, double y) { return 1.75 - std::abs(depth(x, y)); });

    for (int pass : {0, 1}) {
        RecordedDraw const& corners = draws[static_cast<std::size_t>(2 * pass + 1)];
        EXPECT_EQ(corners.shader, "MKRoundRectRoundShader");
        EXPECT_EQ(Values(corners, {"uIsFill", "uStrokeWidth", "uRxry"}),
                  pass == 0 ? "1 | 2.5 | 4 3" : "0 | 2.5 | 4 3");
        std::vector<Vertex> const vertices = VerticesOf(corners);
        ASSERT_THAT(vertices, SizeIs(24));
        // One quad between each corner, pushed out, and its centre.
        double const reach = pass == 0 ? 0.5 : 1.75;
        EXPECT_DOUBLE_EQ(AreaOf(vertices), 4 * (4 + reach) * (3 + reach));
        for (Vertex const& v : vertices) {
            bool const left = v[2] == straight.left;
            bool const top = v[3] == straight.top;
            EXPECT_EQ(v[2], left ? straight.left : straight.right);
            EXPECT_EQ(v[3], top ? straight.top : straight.bottom);
            EXPECT_THAT(v[0], ::testing::AnyOf(v[2], left ? rect.left - reach : rect.right + reach));
            EXPECT_THAT(v[1], ::testing::AnyOf(v[3], top ? rect.top - reach : rect.bottom + reach));
        }
    }

    // Radii are clamped from above only.
    auto const radii = [&](float rx, float ry) {
        drawable.DrawRoundRectRT(RectF(0, 0, 20, 10), rx, ry, projection, MKPaint());
        return Values(TakeDraws().at(1), {"uRxry"});
    };
    EXPECT_EQ(radii(10.5f, 5.5f), "10 5");
    EXPECT_EQ(radii(9.5f, -3), "9.5 -3");
}

TEST_F(PrimitivesTest, ACircleIsOneQuadDrawnForTheFillAndForTheStroke) {
    MKCircleDrawable drawable;
    // The uniforms of each draw; each is a box of the given reach.
    auto const draw = [&](MKPaint const& paint, float reach) {
        drawable.DrawCircleRT(PointF(20, 30), 5, projection, paint);
        std::vector<std::string> values;
        for (RecordedDraw const& drawn : TakeDraws()) {
            values.push_back(Values(drawn, {"uCenter", "uRadius", "uIsFill", "uStrokeWidth"}));
            EXPECT_THAT(VerticesOf(drawn), SizeIs(6));
            EXPECT_DOUBLE_EQ(AreaOf(VerticesOf(drawn)), 4.0 * reach * reach);
            for (Vertex const& v : VerticesOf(drawn)) {
                EXPECT_EQ(std::abs(v[0] - 20), reach);
                EXPECT_EQ(std::abs(v[1] - 30), reach);
            }
        }
        return values;
    };
    EXPECT_THAT(draw(Paint(MKPaint::Fill, 3, false), 5.5f), ElementsAre("20 30 | 5 | 1 | unset"));
    EXPECT_THAT(draw(Paint(MKPaint::FillAndStroke, 3, false), 8),
                ElementsAre("20 30 | 5 | 1 | unset", "20 30 | 5 | 0 | 3"));
    EXPECT_THAT(draw(Paint(MKPaint::Stroke, 0.5f, false), 6.75f), ElementsAre("20 30 | 5 | 0 | 0.5"));
    EXPECT_THAT(draw(Paint(MKPaint::Stroke, 0, false), 0), IsEmpty());
    EXPECT_THAT(draw(Paint(MKPaint::Stroke, kNaN, false), 0), IsEmpty());
    EXPECT_THAT(draw(Paint(static_cast<MKPaint::Style>(-1), 3, false), 0), IsEmpty());
}

TEST_F(PrimitivesTest, AFullLineIsAQuadInTheLinesOwnCoordinates) {
    MKLineDrawable drawable;
    PointF const start(10, 20);
    PointF const end(13, 24); // (0.6, 0.8), 5 long
    drawable.DrawLineRT(start, end, projection, Paint(MKPaint::Fill, 4, false));
    RecordedDraw const draw = TakeDraw();
    EXPECT_EQ(draw.shader, "MKLineShader");
    EXPECT_EQ(Values(draw, {"uLineInfo"}), "2 5");
    std::vector<Vertex> const vertices = VerticesOf(draw);
    ASSERT_THAT(vertices, SizeIs(6));
    EXPECT_NEAR(AreaOf(vertices), (5 + 2 * 2.5) * 5, 1e-4);
    for (Vertex const& v : vertices) {
        double const x = v[0] - start.x;
        double const y = v[1] - start.y;
        EXPECT_THAT(v[2], ::testing::AnyOf(-2.5f, 7.5f));
        EXPECT_NEAR(x * 0.6 + y * 0.8, v[2], 1e-5);
        EXPECT_EQ(std::abs(v[3]), 2.5f);
        EXPECT_NEAR(y * 0.6 - x * 0.8, v[3], 1e-5);
    }
}

TEST_F(PrimitivesTest, DashesAreRunningSumsAndASolidLineLeavesThemAlone) {
    MKLineDrawable drawable;
    MKPaint paint = Paint(MKPaint::Fill, 2, false);
    auto const draw = [&] {
        drawable.DrawLineRT(PointF(0, 0), PointF(9, 0), projection, paint);
        return Values(TakeDraw(), {"uIsDashedLine", "uDashedLinePattern", "uDashedLinePatternLength"});
    };
    EXPECT_EQ(draw(), "0 | unset | unset");
    paint.SetDashedLinePattern(Vector4<float>(-0.5f, 2, 8, 1));
    EXPECT_EQ(draw(), "1 | -0.5 1.5 9.5 10.5 | 10.5");
    paint.SetDashedLinePattern(Vector4<float>(-1, 7, 7, 7));
    EXPECT_EQ(draw(), "0 | -0.5 1.5 9.5 10.5 | 10.5");
    paint.SetLineCapType(MKPaint::Square);
    drawable.DrawLineRT(PointF(0, 0), PointF(9, 0), projection, paint);
    EXPECT_EQ(Values(TakeDraw(), {"uLineCapType"}), "2");
}

TEST_F(PrimitivesTest, SimpleLinesAreBatchedAndCutSquare) {
    MKLineDrawable drawable;
    auto const distance = [](double x, double y) { return std::abs((y - 5) * 0.8 - (x - 4) * 0.6); };
    auto const isBeside = [](double x, double y) {
        double const along = (x - 4) * 0.8 + (y - 5) * 0.6;
        return along > 0 && along < 10;
    };
    for (bool batched : {false, true}) {
        auto const draw = [&](MKPaint const& paint) {
            if (batched) {
                // The odd last point is ignored.
                drawable.DrawSimpleLinesRT(
                    new std::vector<PointF>{{4, 5}, {12, 11}, {30, 40}, {30, 50}, {60, 60}}, projection,
                    paint);
            } else {
                drawable.DrawSimpleLineRT(PointF(4, 5), PointF(12, 11), projection, paint);
            }
            RecordedDraw const drawn = TakeDraw();
            EXPECT_EQ(drawn.shader, "MKRectShader");
            EXPECT_EQ(drawn.floatsPerVertex, 3);
            return VerticesOf(drawn);
        };
        std::vector<Vertex> const hard = draw(Paint(MKPaint::Fill, 3, false));
        EXPECT_THAT(hard, SizeIs(batched ? 12 : 6));
        ExpectCoverage(hard, 0, 20,
                       [&](double x, double y) { return isBeside(x, y) && distance(x, y) < 1.5; });
        std::vector<Vertex> const soft = draw(Paint(MKPaint::Fill, 3, true));
        EXPECT_THAT(soft, SizeIs(batched ? 36 : 18));
        ExpectCoverage(soft, 0, 20,
                       [&](double x, double y) { return isBeside(x, y) ? 2 - distance(x, y) : 0; });
        if (!batched) continue;
        ExpectCoverage(soft, 28, 52,
                       [](double x, double y) { return y > 40 && y < 50 ? 2 - std::abs(x - 30) : 0; });
    }
}

TEST_F(PrimitivesTest, ThePointsAreFreedUnlessTheLineIsTooThin) {
    auto const isFreed = [&](MKLineDrawable& drawable, std::size_t count, float width) {
        auto points = std::make_unique<std::vector<PointF>>(count);
        DeleteWatch const watch(points.get());
        drawable.DrawSimpleLinesRT(points.get(), projection, Paint(MKPaint::Fill, width, true));
        bool const freed = watch.GetPlainDeletes() == 1;
        if (freed) static_cast<void>(points.release());
        return freed;
    };
    MKLineDrawable drawable;
    EXPECT_TRUE(isFreed(drawable, 4, 1));
    EXPECT_TRUE(isFreed(drawable, 1, 1));
    EXPECT_THAT(TakeDraws(), SizeIs(2));
    EXPECT_FALSE(isFreed(drawable, 4, 0.9f));
    drawable.DrawLineRT(PointF(), PointF(5, 5), projection, Paint(MKPaint::Fill, 0.9f, true));
    drawable.DrawSimpleLineRT(PointF(), PointF(5, 5), projection, Paint(MKPaint::Fill, 0.9f, true));
    drawable.DrawSimpleLinesRT(nullptr, projection, MKPaint());
    RecordingRenderer::FailCreations(ObjectKind::GraphicsObject);
    MKLineDrawable refused;
    EXPECT_TRUE(isFreed(refused, 4, 1));
    EXPECT_THAT(TakeDraws(), IsEmpty());
}

struct Primitives {
    void DrawAll(RectF const& r, float size, Matrix4<float> const& projection, MKPaint const& paint) {
        PointF const from(r.left, r.top);
        PointF const to(r.right, r.bottom);
        rect.DrawRectRT(r, projection, paint);
        roundRect.DrawRoundRectRT(r, size, size, projection, paint);
        circle.DrawCircleRT(from, size, projection, paint);
        line.DrawLineRT(from, to, projection, paint);
        line.DrawSimpleLineRT(from, to, projection, paint);
        if (!(paint.GetLineWidth() < 1)) // else it would stay ours
            line.DrawSimpleLinesRT(new std::vector<PointF>{from, to}, projection, paint);
    }

    MKRectDrawable rect;
    MKRoundRectDrawable roundRect;
    MKCircleDrawable circle;
    MKLineDrawable line;
};

TEST_F(PrimitivesTest, EveryDrawAppliesThePaintAndItsOwnStates) {
    Primitives primitives;
    MKPaint paint = CommonPaint();
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(2);
    ForceStencil();
    primitives.DrawAll(RectF(2, 2, 12, 12), 3, projection, paint);
    std::vector<RecordedDraw> const draws = TakeDraws();
    EXPECT_THAT(draws, SizeIs(1 + 4 + 2 + 3));
    for (RecordedDraw const& draw : draws) {
        ExpectCommonState(draw);
        EXPECT_FALSE(draw.state.depthStencil.IsStencil());
    }
    paint.ClearTintColor();
    primitives.rect.DrawRectRT(RectF(2, 2, 12, 12), projection, paint);
    EXPECT_EQ(Values(TakeDraw(), {"uHasTintColor"}), "0");
}

TEST_F(PrimitivesTest, NumbersThatAreNoneDoNoHarm) {
    Primitives primitives;
    for (float const number : {kNaN, kInfinity, -kInfinity, 3e38f, 0.0f, -5.0f}) {
        RectF const rect(number, number, 10, number);
        primitives.DrawAll(rect, number, projection, Paint(MKPaint::FillAndStroke, number, true));
        primitives.DrawAll(rect, 3, projection, Paint(MKPaint::FillAndStroke, 2, false));
    }
    EXPECT_FALSE(TakeDraws().empty());
}

TEST_F(PrimitivesTest, WhatTheRendererRefusedDrawsNothing) {
    RectF const rect(2, 2, 12, 12);
    for (ObjectKind kind :
         {ObjectKind::GraphicsObject, ObjectKind::BlendState, ObjectKind::DepthStencilState}) {
        RecordingRenderer::FailCreations(kind);
        Primitives primitives;
        RecordingRenderer::StopFailing();
        primitives.DrawAll(rect, 3, projection, Paint(MKPaint::FillAndStroke, 2, true));
        EXPECT_FALSE(primitives.rect.DrawRectRT(rect, projection, MKPaint()));
        EXPECT_FALSE(primitives.roundRect.DrawRoundRectRT(rect, 3, 3, projection, MKPaint()));
    }
    EXPECT_THAT(TakeDraws(), IsEmpty());
}

} // namespace
} // namespace Moka::Testing
