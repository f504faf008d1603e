// Every scene of the gallery on Mesa's driver and on ANGLE's. Each driver draws in a process of its own, since a process
// has one EGL. The pixel tests hold both to the reference, but for the scenes that it cannot draw; the report says how far
// they are apart.
#include "scenes/Scene.h"
#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"

#include <array>
#include <cstdio>
#include <fstream>

namespace Moka::Testing {
namespace {

using DriversTest = ToolTest;

// In steps of a channel: how far two drivers may round differently.
constexpr int kRounding = 4;
// ANGLE over SwiftShader rounds each vertex to a sixteenth of a pixel (GL_SUBPIXEL_BITS is 4, the least that
// OpenGL ES allows): it moves shapes by up to 1/32 on both axes. That changes ramps and seams a little, and hard edges
// by more. So many of a scene's pixels may differ so.
constexpr int kLargestRamp = 16;
constexpr double kMostOnRamps = 0.04;
constexpr double kMostOnEdges = 0.0015;

int CountOver(Picture const& a, Picture const& b, unsigned char steps) {
    Slack const same(a.width, a.height, steps);
    return CompareImages(a, b, &same).differingPixels;
}

TEST_F(DriversTest, EverySceneIsTheSameOnBothButForRampsAndEdges) {
    std::filesystem::path const angle = MOKA_ANGLE_FOLDER;
    if (!exists(angle / "VERSION")) GTEST_SKIP() << "ANGLE is not here; scripts/fetch-angle brings it";
    std::string report;
    for (std::string const name : {"llvmpipe", "SwiftShader"}) {
        std::string driver = "LD_LIBRARY_PATH=";
        if (name == "SwiftShader")
            driver += angle.string() + " VK_ICD_FILENAMES=" + (angle / "vk_swiftshader_icd.json").string();
        RunWell("gallery --mki --out " + name, driver);
        std::string const device = RunWell("info --device", driver);
        ASSERT_THAT(device, ::testing::HasSubstr(name));
        report += device.substr(0, device.find('\n') + 1);
    }
    report += "scene                   pixels largest on ramps on edges\n";
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        Picture const mesa = Load("llvmpipe/" + scene.name + ".mki");
        Picture const other = Load("SwiftShader/" + scene.name + ".mki");
        ASSERT_EQ(mesa.width, scene.width) << scene.name;
        int const onEdges = CountOver(mesa, other, kLargestRamp);
        int const onRamps = CountOver(mesa, other, kRounding) - onEdges;
        int const pixels = scene.width * scene.height;
        EXPECT_TRUE(onRamps <= kMostOnRamps * pixels && onEdges <= kMostOnEdges * pixels)
            << scene.name << ": " << onRamps << " on ramps, " << onEdges << " on edges; "
            << KeepDifference(mesa, other, "drivers-" + scene.name);
        std::array<char, 120> line{};
        std::snprintf(line.data(), line.size(), "%-22s %7d %7d %8d %8d\n", scene.name.c_str(), pixels,
                      CompareImages(mesa, other).largest, onRamps, onEdges);
        report += line.data();
    }
    std::printf("%s", report.c_str());
    std::ofstream("drivers.txt") << report;
}

} // namespace
} // namespace Moka::Testing
