// What is drawn on a recorder is drawn again from its scene, to the byte.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "scenes/Scene.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "tests/pixel/canvas/CanvasDrawing.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <filesystem>
#include <iterator>

namespace Moka::Testing {
namespace {

using Scenes::Scene;
using Scenes::SceneRecorder;

class RecorderTest : public CanvasDrawing {
protected:
    Picture Replay(Picture const& start) {
        Scene const scene = Scenes::LoadScene(path);
        return Draw(
            {start, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) { scene.draw(canvas, stage); }});
    }

    TempFolder const folder;
    std::string const path = folder.Path("fault.json");
};

class RecordedSceneTest : public RecorderTest, public ::testing::WithParamInterface<std::string> {};

TEST_P(RecordedSceneTest, IsDrawnAgainToTheByte) {
    Scene const& scene = *Scenes::FindScene(GetParam());
    Picture const empty(scene.width, scene.height);
    Picture const drawn = Draw({empty, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                    Scenes::DrawScene(scene, canvas, stage);
                                }});
    Draw({empty, [&](IMKCanvas&, Scenes::SceneStage& stage) {
              auto const recorder = SceneRecorder::Start(path, scene.width, scene.height);
              Scenes::DrawScene(scene, *recorder, stage);
              std::string error;
              EXPECT_TRUE(recorder->Close(&error)) << error;
          }});
    EXPECT_EQ(ReadFile(path).find("LeftOut"), std::string::npos);
    ExpectSame(drawn, Replay(empty), GetParam() + " recorded");
}

std::vector<std::string> GetNames() {
    std::vector<std::string> names;
    for (Scene const& scene : Scenes::GetScenes()) {
        if (!scene.needsPen) names.push_back(scene.name);
    }
    return names;
}

std::string ToTestName(::testing::TestParamInfo<std::string> const& scene) {
    std::string name = scene.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(All, RecordedSceneTest, ::testing::ValuesIn(GetNames()), ToTestName);

// Over what the target held and under the canvas's matrix; a bitmap that changes between two draws; and one that
// comes back to what it was, which is no third file.
TEST_F(RecorderTest, ItHandsCallsOnAndRecordsBitmapsAsTheyAreDrawn) {
    Picture const start = MakeBackdrop(60, 40);
    Picture const red = MakeChecker(20, 20, 5, {255, 0, 0, 255}, {80, 0, 0, 128});
    Picture const green = MakeChecker(20, 20, 3, {0, 255, 0, 255}, {0, 60, 0, 60});
    auto const draw = [&](IMKCanvas& canvas, IMKCanvas* recorder, Scenes::SceneStage& stage) {
        auto const bitmap = MakeBitmap(stage, red);
        auto const change = [&](Picture const& to) {
            bitmap->GetTextureBitmap()->UpdateBitmap(to.pixels.data(), to.GetStride());
        };
        IMKCanvas& onto = recorder ? *recorder : canvas;
        onto.DrawBitmap(bitmap.Get(), 1, 2, nullptr);
        change(green);
        bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterNearest);
        onto.DrawBitmap(bitmap.Get(), RectF(20, 2, 53, 36), nullptr);
        change(red);
        bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterLinear);
        onto.DrawBitmap(bitmap.Get(), RectF(2, 22, 19, 39), nullptr);
        stage.GetQueue()->WaitForTasks(); // which reads the pictures of this scope
    };
    auto const through = [&](bool records) {
        return Draw({start, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                         canvas.PreTranslate(3, -1.5f);
                         auto const recorder =
                             records ? SceneRecorder::Start(path, canvas) : RefPtr<SceneRecorder>();
                         draw(canvas, recorder.Get(), stage);
                         if (records) {
                             EXPECT_TRUE(recorder->Close());
                             EXPECT_EQ(recorder->GetMatrix()[6], 3);
                             EXPECT_EQ(recorder->GetBitmap(), canvas.GetBitmap());
                         }
                     }});
    };
    Picture const drawn = through(false);
    ExpectSame(drawn, through(true), "through the recorder");
    ExpectSame(drawn, Replay(Picture(60, 40)), "recorded");
    EXPECT_EQ(
        static_cast<int>(std::distance(std::filesystem::directory_iterator(folder.Path("fault.bitmaps")),
                                       std::filesystem::directory_iterator())),
        3); // the target, red and green
}

} // namespace
} // namespace Moka::Testing
