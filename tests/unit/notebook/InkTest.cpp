// Tests the geometry of strokes: erasers, lassos, and the curve through a pen's positions.
#include "apps/notebook/Ink.h"
#include "apps/notebook/PenPath.h"

#include <cmath>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using namespace Moka::Notebook;

InkPoints const kLine{{0, 0, 4}, {100, 0, 4}};

TEST(NotebookInkTest, AnEraserRemovesTheCoveredPartAndKeepsBothSides) {
    std::vector<InkPoints> const pieces = Swipe{{50, -30}, {50, 30}, 10}.Cut(kLine);
    ASSERT_EQ(pieces.size(), 2u);
    EXPECT_NEAR(pieces[0].back().x, 40, 0.01);
    EXPECT_NEAR(pieces[1].front().x, 60, 0.01);
    EXPECT_EQ(pieces[0].front(), kLine.front());
    EXPECT_EQ(pieces[1].back(), kLine.back());
}

TEST(NotebookInkTest, AnEraserAtAnEndShortensAStrokeAndOneOverAllRemovesIt) {
    std::vector<InkPoints> const rest = Swipe{{100, 0}, {100, 0}, 20}.Cut(kLine);
    ASSERT_EQ(rest.size(), 1u);
    EXPECT_NEAR(rest[0].back().x, 80, 0.01);
    EXPECT_TRUE((Swipe{{0, 0}, {100, 0}, 5}.Cut(kLine).empty()));
    EXPECT_EQ((Swipe{{50, 40}, {60, 40}, 10}.Cut(kLine)), std::vector<InkPoints>{kLine});
}

TEST(NotebookInkTest, AnEraserHitsAStrokeWithinItsWidth) {
    EXPECT_TRUE((Swipe{{50, 11.9f}, {50, 11.9f}, 10}.Touches(kLine)));
    EXPECT_FALSE((Swipe{{50, 12.1f}, {50, 12.1f}, 10}.Touches(kLine)));
    EXPECT_TRUE((Swipe{{5, 5}, {5, 5}, 5}.Touches({{8, 8, 1}}))) << "a dot";
}

TEST(NotebookInkTest, ALassoSelectsAStrokeWithHalfOfItsPointsInside) {
    std::vector<PointF> const corner{{-10, -10}, {50, -10}, {-10, 50}};
    EXPECT_TRUE(IsMostlyInside(corner, kLine));
    EXPECT_FALSE(IsMostlyInside(corner, {{0, 0, 1}, {90, 0, 1}, {90, 90, 1}}));
    EXPECT_FALSE(IsMostlyInside({}, kLine));
}

// The curve passes through the positions, its steps are short, and settled points do not change.
TEST(NotebookInkTest, AStrokePassesThroughThePositionsOfThePen) {
    InkPoints const positions{{0, 0, 0}, {30, 0, 0}, {30, 40, 0}, {70, 40, 0}};
    PenPath path(4, true);
    InkPoints settled;
    for (std::size_t i = 0; i < positions.size(); ++i) {
        path.Add(positions[i].x, positions[i].y, static_cast<std::uint32_t>(10 * i), -1);
        ASSERT_TRUE(std::equal(settled.begin(), settled.end(), path.GetSettled().begin()));
        settled = path.GetSettled();
    }
    InkPoints const stroke = path.Finish();
    for (InkPoint const& p : positions)
        EXPECT_EQ(std::count_if(stroke.begin(), stroke.end(),
                                [&](InkPoint const& q) { return q.x == p.x && q.y == p.y; }),
                  1);
    for (std::size_t i = 1; i < stroke.size(); ++i)
        EXPECT_LT(std::hypot(stroke[i].x - stroke[i - 1].x, stroke[i].y - stroke[i - 1].y), 6);
}

TEST(NotebookInkTest, PressureWidensAStrokeAndThePredictionContinuesAtThePensSpeed) {
    PenPath light(4, false);
    PenPath firm(4, false);
    for (std::uint32_t i = 0; i < 20; ++i) {
        light.Add(static_cast<float>(i) * 4, 0, i * 4, 0.1f);
        firm.Add(static_cast<float>(i) * 4, 0, i * 4, 0.9f);
    }
    EXPECT_GT(firm.Finish().back().width, 1.5f * light.Finish().back().width);
    EXPECT_NEAR(light.GetTail(16).back().x, 76 + 16, 0.5) << "1 pixel a millisecond";
    EXPECT_EQ(light.GetTail(0).back().x, 76);
}

} // namespace
} // namespace Moka::Testing
