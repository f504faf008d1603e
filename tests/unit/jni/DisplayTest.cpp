// The display as native code has it; what Java makes of it is tested in a Java VM.
#include "moka/graphics/jni/Display.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <limits>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;

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

// A source that computes what it says, and tells the order in which it was asked.
class Telling : public Display {
public:
    Telling() : Display(MakeDisplay(1, 1, 1)) {}
    int GetWidthPixels() const override { return Tell("width"), 1; }
    int GetHeightPixels() const override { return Tell("height"), 2; }
    float GetSystemDensity() const override { return Tell("system density"), 0.5f; }
    int GetLocalWidthPixels() const override { return Tell("local width"), 256; }
    int GetLocalHeightPixels() const override { return Tell("local height"), 300; }
    float GetDensity() const override { return Tell("density"), 3.0f; }
    float GetScaledDensity() const override { return Tell("scaled density"), 4.0f; }
    int GetDensityDpi() const override { return Tell("dpi"), 5; }
    float GetXdpi() const override { return Tell("xdpi"), 6.0f; }
    float GetYdpi() const override { return Tell("ydpi"), 7.0f; }
    LayoutDirection GetLayoutDirection() const override { return Tell("direction"), LayoutDirection{8}; }
    Orientation GetOrientation() const override { return Tell("orientation"), Orientation{9}; }
    ScreenOrientation GetScreenOrientation() const override { return Tell("screen"), ScreenOrientation{10}; }
    bool IsTabletUX() const override { return Tell("tablet UX"), false; }
    bool IsTablet() const override { return Tell("tablet"), true; }
    bool IsUWP() const override { return Tell("UWP"), true; }
    int GetDebugLevel() const override { return Tell("debug level"), 11; }
    long long GetAppVsyncOffsetNanos() const override { return Tell("vsync"), 12; }

    std::vector<std::string> mutable told;

private:
    void Tell(char const* name) const { told.emplace_back(name); }
};

TEST(Display, CopyAsksTheSourceInOrderAndLeavesTwoFieldsAlone) {
    Display display = MakeDisplay(1, 1, 1);
    Telling const source;
    display.Copy(&source);
    EXPECT_THAT(source.told, ElementsAre("width", "height", "system density", "local width", "local height",
                                         "density", "scaled density", "xdpi", "ydpi", "direction",
                                         "orientation", "screen", "UWP", "debug level", "vsync"));
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
