#include "moka/base/Rect.h"

#include <gtest/gtest.h>

#include <limits>
#include <vector>

namespace Moka {
namespace {

constexpr int kMin = std::numeric_limits<int>::min();
constexpr int kMax = std::numeric_limits<int>::max();
constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
constexpr float kInf = std::numeric_limits<float>::infinity();

TEST(RectTest, SizesSaturateAndFractionsAreEnclosed) {
    EXPECT_EQ(Rect(kMin, 5, kMax, 2).GetWidth(), kMax);
    EXPECT_EQ(Rect(-3, 1, 4, kMin).GetHeight(), kMin);
    EXPECT_EQ(Rect(RectF(0.5f, -0.5f, 1.5f, -0.25f)), Rect(0, -1, 2, 0));
    EXPECT_EQ(Rect(RectF(-kInf, -3e9f, kInf, kNan)), Rect(kMin, kMin, kMax, 0));
}

TEST(RectTest, IntersectIsExactlyTheSharedPixels) {
    std::vector<Rect> all; // empty and turned ones too
    for (int i = 0; i < 256; ++i) all.emplace_back(i & 3, i >> 2 & 3, i >> 4 & 3, i >> 6);
    for (Rect const& a : all) {
        for (Rect const& b : all) {
            Rect const shared = a.Intersect(b);
            bool any = false;
            for (int y = 0; y < 3; ++y) {
                for (int x = 0; x < 3; ++x) {
                    bool const both = a.Contains({x, y}) && b.Contains({x, y});
                    any = any || both;
                    ASSERT_EQ(shared.Contains({x, y}), both);
                }
            }
            ASSERT_EQ(a.IsIntersect(b), any);
            ASSERT_EQ(shared == Rect(), !any);
        }
    }
}

TEST(RectFTest, IsIntersectCountsLinesAndNotSharedEdges) {
    struct {
        float low, high; // held against 0 to 1
        bool meets;
    } const cases[] = {{-1, 0, false}, {-1, 0.5f, true}, {1, 2, false},
                       {0, 0, true},   {1, 1, true},     {-kInf, kInf, true},
                       {2, 2, false},  {kNan, 2, false}, {-1, kNan, false}};
    for (auto const& [low, high, meets] : cases) {
        EXPECT_EQ(RectF(low, 0, high, 2).IsIntersect(RectF(0, 1, 1, 3)), meets) << low << ' ' << high;
        EXPECT_EQ(RectF(1, 0, 3, 1).IsIntersect(RectF(0, low, 2, high)), meets) << low << ' ' << high;
    }
}

} // namespace
} // namespace Moka
