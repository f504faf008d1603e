// Every scene of the gallery on Mesa's driver and on ANGLE's, compared byte by byte, premultiplied. Each driver
// draws in a process of its own, since a process has one EGL.
#include "moka/base/RefPtr.h"
#include "scenes/Scene.h"
#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/reference/ReferenceCanvas.h"
#include "tests/support/reference/ReferenceStage.h"

#include <array>
#include <cstdio>
#include <fstream>
#include <map>

namespace Moka::Testing {
namespace {

using Scenes::Scene;

// In steps of a channel: how far two drivers may round differently.
constexpr int kRounding = 4;
// What differs by more lies on a hard edge, and may be so many of a scene's pixels.
constexpr int kLargestRamp = 16;
constexpr double kMostOnEdges = 0.0015;
// ANGLE over SwiftShader rounds each vertex to a sixteenth of a pixel (GL_SUBPIXEL_BITS is 4, the least that
// OpenGL ES allows): it moves shapes by up to 1/32 on both axes, as far as the reference's five bits allow for.
constexpr int kSubpixelBits = 5;

// Scenes that the reference cannot draw.
std::map<std::string, int> const kBounds = {
    {"bitmap-scaled", 64}, // grain of single texels; at a tenth of its size, 1/32 pixel is a third of a texel
    {"non-premultiplied", 8}, // divides by an alpha down to 0.15, which makes a step up to seven
    {"note", 255},            // single pixels of its slim triangles; few: see kMostOnEdges
    {"pen-stroke", 16},       // its ink falls off over a pixel, by 255 / 32 steps on each axis that moves
};

// How far the drivers may be apart: by rounding, and by what the reference leaves open, which knows neither
// picture: where an edge, a ramp or the seam between two pieces of a round rectangle may be found.
Slack FindAllowed(Scene const& scene) {
    auto const bitmap =
        RefPtr<ReferenceBitmap>::Adopt(new ReferenceBitmap(Picture(scene.width, scene.height)));
    auto const canvas = RefPtr<ReferenceCanvas>::Adopt(new ReferenceCanvas(*bitmap, {4096, kSubpixelBits}));
    ReferenceStage stage;
    if (!scene.needsGpu) DrawScene(scene, *canvas, stage);
    auto const bound = kBounds.find(scene.name);
    int const least = bound == kBounds.end() ? kRounding : bound->second;
    Slack allowed = canvas->GetSlack();
    for (int y = 0; y < scene.height; ++y) {
        for (int x = 0; x < scene.width; ++x) allowed.Set(x, y, std::max(least, allowed.Get(x, y)));
    }
    return allowed;
}

int CountOver(Picture const& a, Picture const& b, unsigned char steps) {
    Slack const same(a.width, a.height, steps);
    return CompareImages(a, b, &same).differingPixels;
}

class DriversTest : public ToolTest {
protected:
    void DrawAll(std::string const& folder, std::vector<std::string> const& environment) {
        ProcessOptions driver;
        driver.environment = environment;
        ProcessResult const drawn = Run("gallery --mki --out " + folder, driver);
        ASSERT_EQ(drawn.status, 0) << drawn.err;
        std::string const device = Run("info --device", driver).out;
        mReport += device.substr(0, device.find('\n')) + "\n";
    }

    void Compare(Scene const& scene) {
        Picture const mesa = Load("mesa/" + scene.name + ".mki");
        Picture const angle = Load("angle/" + scene.name + ".mki");
        ASSERT_EQ(mesa.width, scene.width) << scene.name; // the tool has written it
        Slack const allowed = FindAllowed(scene);
        ImageDifference const left = CompareImages(mesa, angle, &allowed);
        if (left.differingPixels > 0)
            ADD_FAILURE() << scene.name << ": " << left << "; "
                          << KeepDifference(mesa, angle, "drivers-" + scene.name, &allowed);
        int const onEdges = CountOver(mesa, angle, kLargestRamp);
        EXPECT_LE(onEdges, kMostOnEdges * scene.width * scene.height) << scene.name;
        std::array<char, 120> line{};
        std::snprintf(line.data(), line.size(), "%-22s %7d %7d %7d %8d %8d %7d\n", scene.name.c_str(),
                      scene.width * scene.height, allowed.CountOver(kLargestRamp),
                      CompareImages(mesa, angle).largest, CountOver(mesa, angle, kRounding) - onEdges,
                      onEdges, left.differingPixels);
        mReport += line.data();
    }

    std::string mReport;
};

TEST_F(DriversTest, EverySceneIsTheSameOnBoth) {
    std::filesystem::path const angle = MOKA_ANGLE_FOLDER;
    if (!exists(angle / "VERSION")) GTEST_SKIP() << "ANGLE is not here; scripts/fetch-angle brings it";
    ASSERT_NO_FATAL_FAILURE(DrawAll("mesa", {"LD_LIBRARY_PATH="}));
    ASSERT_NO_FATAL_FAILURE(
        DrawAll("angle", {"LD_LIBRARY_PATH=" + angle.string(),
                          "VK_ICD_FILENAMES=" + (angle / "vk_swiftshader_icd.json").string()}));
    ASSERT_NE(mReport.find("llvmpipe"), std::string::npos) << mReport;
    ASSERT_NE(mReport.find("SwiftShader"), std::string::npos) << mReport;
    mReport += "scene                   pixels    open largest on ramps on edges   wrong\n";
    for (Scene const& scene : Scenes::GetScenes()) Compare(scene);
    std::printf("%s", mReport.c_str());
    std::ofstream("drivers.txt") << mReport;
}

} // namespace
} // namespace Moka::Testing
