// The scenes that come with the library: whole, well-formed, and complete.
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneRenderer.h"
#include "scenes/SceneTexts.h"
#include "tests/support/LogCapture.h"
#include "tests/support/PumpedRenderer.h"

#include <algorithm>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <set>

namespace Moka::Testing {
namespace {

using Scenes::GetScenes;
using Scenes::Scene;
using ::testing::MatchesRegex;

TEST(SceneRegistry, EveryFileIsASceneWithANameOfItsOwnAndASentence) {
    std::set<std::string> names;
    for (Scene const& scene : GetScenes()) {
        SCOPED_TRACE(scene.name);
        EXPECT_TRUE(names.insert(scene.name).second);
        EXPECT_THAT(scene.name, MatchesRegex("[a-z0-9-]+"));
        EXPECT_THAT(scene.about, MatchesRegex("[A-Z].*\\."));
        EXPECT_LE(scene.width, 1280);
        EXPECT_LE(scene.height, 800);
        EXPECT_EQ(Scenes::FindScene(scene.name), &scene);
    }
    for (std::size_t i = 0; i < Scenes::kSceneTextCount; ++i)
        EXPECT_EQ(names.count(Scenes::kSceneTexts[i].name), 1u) << Scenes::kSceneTexts[i].name;
    EXPECT_EQ(Scenes::FindScene("nonesuch"), nullptr);
    EXPECT_TRUE(std::is_sorted(GetScenes().begin(), GetScenes().end(),
                               [](Scene const& a, Scene const& b) { return a.group < b.group; }));
}

TEST(SceneRegistry, TallScenesHaveExactlyThreeStrips) {
    Scene odd;
    odd.height = 31;
    EXPECT_EQ(GetSideForThreeStrips(odd), 11);
    int count = 0;
    for (Scene const& scene : GetScenes()) {
        if (!scene.alsoInStrips) continue;
        int const side = GetSideForThreeStrips(scene);
        EXPECT_GE(side, scene.width) << scene.name;
        EXPECT_EQ((scene.height + side - 1) / side, 3) << scene.name;
        ++count;
    }
    EXPECT_GE(count, 3);
}

// In so many operations of the scene's file.
int CountOf(std::string const& scene, std::string const& part) {
    std::string const& content = Scenes::FindScene(scene)->text;
    int count = 0;
    for (std::size_t at = 0; (at = content.find(part, at)) != std::string::npos; ++at) ++count;
    return count;
}

TEST(SceneRegistry, NothingTheLibraryKnowsIsLeftOut) {
    for (char const* const scene : {"modes-rectangles", "modes-bitmaps"})
        for (std::string const mode :
             {"Add", "BlendingOff", "Clear", "Darken", "Dst", "DstAtop", "DstIn", "DstOut", "DstOver",
              "Lighten", "Modulate", "Src", "SrcAtop", "SrcIn", "SrcKeepDstAlpha", "SrcNonPremultiplied",
              "SrcOut", "SrcOver", "SrcOverNonPremultiplied"})
            EXPECT_EQ(CountOf(scene, "\"xfermode\": \"" + mode + '"'), 1) << scene << ' ' << mode;
    for (std::string const op : {"Intersect", "Replace", "Union", "Xor", "Difference", "ReverseDifference"})
        EXPECT_GE(CountOf("clips", "\"op\": \"" + op + '"'), 2) << op;
    for (std::string const x : {"Clamp", "Mirror", "Repeat"})
        for (std::string const y : {"Clamp", "Mirror", "Repeat"})
            EXPECT_EQ(CountOf("bitmap-tiles", "\"tileMode\": [\"" + x + "\", \"" + y + "\"]"), 1) << x << y;
}

TEST(SceneRenderer, WithoutRoomForItsPictureItThrows) {
    LogCapture const quiet;
    PumpedRenderer queue(64);
    RendererTrace::FailCreations(ObjectKind::kTexture);
    EXPECT_THROW(RenderScene(*Scenes::FindScene("rect-fractions"), queue), Scenes::SceneError);
    RendererTrace::StopFailing();
}

TEST(ScenePictures, ArePremultipliedAtEverySizeDownToOnePixel) {
    EXPECT_EQ(Scenes::MakePicture(1, 8, 8).GetColor(0, 0),
              (Scenes::Color{236, 239, 244, 255})); // a light square, opaque
    for (std::size_t kind = 0; kind < Scenes::GetPictureNames().size(); ++kind) {
        for (auto const& [width, height] : {std::pair{1, 1}, {1, 7}, {200, 3}, {61, 67}}) {
            Scenes::Picture const picture = Scenes::MakePicture(kind, width, height);
            ASSERT_EQ(picture.pixels.size(), picture.CountBytes());
            for (std::size_t i = 0; i < picture.pixels.size(); i += 4)
                for (std::size_t channel = 0; channel < 3; ++channel)
                    ASSERT_LE(picture.pixels[i + channel], picture.pixels[i + 3])
                        << Scenes::GetPictureNames()[kind] << " at " << i;
        }
    }
}

} // namespace
} // namespace Moka::Testing
