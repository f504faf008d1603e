// The display as native code has it; what Java makes of it is tested in a Java VM.
#include "moka/graphics/jni/Display.h"

#include <gtest/gtest.h>
#include <limits>

namespace Moka::Testing {
namespace {

Display MakeDisplay(int localWidth, int localHeight, float systemDensity) {
    return Display(0, 0, systemDensity, localWidth, localHeight, 0, 0, 320, 0, 0, {}, {}, {}, false, false,
                   0);
}

TEST(Display, TabletsHaveAShorterSideOfAtLeast512) {
    constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
    struct {
        int width, height;
        float density;
        bool isTablet;
    } const cases[] = {
        {1080, 1920, 2.0f, true}, {1920, 1080, 2.25f, false}, {512, 512, 1.0f, true},
        {511, 9999, 1.0f, false}, {1, 1, 0.0f, true},         {0, 9, 0.0f, false},
        {-1, 9, 0.0f, false},     {1080, 1080, kNaN, false},  {9999, 9999, -1.0f, false},
    };
    for (auto const& [width, height, density, isTablet] : cases) {
        EXPECT_EQ(MakeDisplay(width, height, density).IsTabletUX(), isTablet)
            << width << " x " << height << " / " << density;
    }
}

TEST(Display, CopyTakesOverAllButTwoFields) {
    Display display = MakeDisplay(1, 1, 1);
    Display source(1, 2, 0.5f, 256, 300, 3, 4, 5, 6, 7, Display::LayoutDirection{8}, Display::Orientation{9},
                   Display::ScreenOrientation{10}, true, true, 12);
    source.SetDebugLevel(11);
    display.Copy(&source);
    EXPECT_EQ(display.GetWidthPixels(), 1);
    EXPECT_EQ(display.GetHeightPixels(), 2);
    EXPECT_EQ(display.GetScaledDensity(), 4);
    EXPECT_EQ(display.GetYdpi(), 7);
    EXPECT_EQ(display.GetScreenOrientation(), Display::ScreenOrientation{10});
    EXPECT_TRUE(display.IsTabletUX()) << "computed from the copied sizes: 256 / 0.5";
    EXPECT_EQ(display.GetDensityDpi(), 320);
    EXPECT_FALSE(display.IsTablet());
    EXPECT_TRUE(display.IsUWP());
    EXPECT_EQ(display.GetLocalHeightPixels(), 300);
    EXPECT_EQ(display.GetAppVsyncOffsetNanos(), 12);
    display.Copy(nullptr);
    EXPECT_EQ(display.GetDebugLevel(), 11);
}

} // namespace
} // namespace Moka::Testing
