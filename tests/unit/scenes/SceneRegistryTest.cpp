// The scenes that come with the library: whole, well-formed, and complete.
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneTexts.h"
#include "tests/unit/scenes/CanvasLog.h"

#include <algorithm>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <set>

namespace Moka::Testing {
namespace {

using Scenes::GetScenes;
using Scenes::Picture;
using Scenes::Scene;
using ::testing::MatchesRegex;

TEST(SceneRegistry, EveryFileIsASceneThatDrawsWithANameOfItsOwnAndASentence) {
    std::set<std::string> names;
    std::size_t files = 0;
    for (Scene const& scene : GetScenes()) {
        SCOPED_TRACE(scene.name);
        EXPECT_TRUE(names.insert(scene.name).second);
        EXPECT_THAT(scene.name, MatchesRegex("[a-z0-9-]+"));
        EXPECT_THAT(scene.about, MatchesRegex("[A-Z].*\\."));
        EXPECT_LE(scene.width, 640);
        EXPECT_LE(scene.height, 720);
        EXPECT_EQ(Scenes::FindScene(scene.name), &scene);
        if (scene.needsGpu) continue;
        ++files;
        RefPtr<CanvasLog> const canvas = PlayScene(scene);
        EXPECT_GT(canvas->Count("Draw") + canvas->Count("Clear "), 2);
    }
    EXPECT_EQ(files, Scenes::kSceneTextCount);
    EXPECT_EQ(Scenes::FindScene("nonesuch"), nullptr);
    EXPECT_TRUE(std::is_sorted(GetScenes().begin(), GetScenes().end(),
                               [](Scene const& a, Scene const& b) { return a.group < b.group; }));
}

TEST(SceneRegistry, CustomDrawablesAndInkAreRefusedWhereThereIsNoGpu) {
    EmptyStage stage;
    RefPtr<CanvasLog> const canvas = RefPtr<CanvasLog>::Adopt(new CanvasLog);
    int count = 0;
    for (Scene const& scene : GetScenes()) {
        if (!scene.needsGpu) continue;
        EXPECT_THROW(DrawScene(scene, *canvas, stage), Scenes::SceneError) << scene.name;
        ++count;
    }
    EXPECT_EQ(count, 5);
}

TEST(SceneRegistry, TallScenesHaveExactlyThreeStrips) {
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

TEST(SceneRegistry, NothingTheLibraryKnowsIsLeftOut) {
    RefPtr<CanvasLog> const rectangles = PlayScene(*Scenes::FindScene("modes-rectangles"));
    RefPtr<CanvasLog> const bitmaps = PlayScene(*Scenes::FindScene("modes-bitmaps"));
    for (int mode = 0; mode <= 18; ++mode) {
        if (mode == 12) continue; // a new paint's own
        EXPECT_TRUE(rectangles->Contains(" mode" + std::to_string(mode))) << mode;
        EXPECT_TRUE(bitmaps->Contains(" mode" + std::to_string(mode))) << mode;
    }
    RefPtr<CanvasLog> const clips = PlayScene(*Scenes::FindScene("clips"));
    for (int op = 0; op <= 5; ++op)
        EXPECT_GE(clips->Count("SetClipRect 26 24 60 56 " + std::to_string(op)), 2) << op;
    EXPECT_TRUE(PlayScene(*Scenes::FindScene("bitmap-batch"))->Contains("DrawBitmaps 5x5 1000:"));
    RefPtr<CanvasLog> const tiles = PlayScene(*Scenes::FindScene("bitmap-tiles"));
    for (char const* const tile : {"tile1,1", "tile2,1", "tile3,1", "tile1,2", "tile2,2", "tile3,3"})
        EXPECT_TRUE(tiles->Contains(tile)) << tile;
}

Picture Make(std::string const& name, int width, int height) {
    std::vector<std::string> const& names = Scenes::GetPictureNames();
    auto const found = std::find(names.begin(), names.end(), name);
    return Scenes::MakePicture(static_cast<std::size_t>(found - names.begin()), width, height);
}

TEST(ScenePictures, ArePremultipliedAtEverySizeDownToOnePixel) {
    for (std::string const& name : Scenes::GetPictureNames()) {
        for (auto const& [width, height] : {std::pair{1, 1}, {1, 7}, {200, 3}, {61, 67}}) {
            Picture const picture = Make(name, width, height);
            ASSERT_EQ(picture.pixels.size(), picture.CountBytes());
            for (std::size_t i = 0; i < picture.pixels.size(); i += 4)
                for (std::size_t channel = 0; channel < 3; ++channel)
                    ASSERT_LE(picture.pixels[i + channel], picture.pixels[i + 3]) << name << " at " << i;
        }
    }
}

TEST(ScenePictures, TheLettersLookDifferentHoweverTheyAreTurned) {
    constexpr int kSide = 117; // whole cells
    constexpr int kLast = kSide - 1;
    Picture letters = Make("letters", kSide, kSide);
    auto const alpha = [&](int x, int y) { return int{letters.At(x, y)[3]}; };
    int across = 0, down = 0, turned = 0, swapped = 0;
    for (int i = 0; i < kSide * kSide; ++i) {
        int const x = i % kSide, y = i / kSide;
        across += alpha(x, y) != alpha(kLast - x, y);
        down += alpha(x, y) != alpha(x, kLast - y);
        turned += alpha(x, y) != alpha(kLast - x, kLast - y);
        swapped += alpha(x, y) != alpha(y, x);
    }
    for (int const different : {across, down, turned, swapped}) EXPECT_GT(different, kSide * kSide / 20);
}

} // namespace
} // namespace Moka::Testing
