// Every scene, drawn by the real canvas: as the reference draws it, the same in each way of drawing it, and the same to
// the byte when it was recorded.
#include "scenes/Scene.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "tests/pixel/canvas/CanvasDrawing.h"
#include "tests/support/TestFiles.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

using Scenes::Scene;
using Scenes::SceneRecorder;

Drawing ToDrawing(Scene const& scene) {
    return {Picture(scene.width, scene.height), [&scene](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                Scenes::DrawScene(scene, canvas, stage);
            }};
}

std::string ToTestName(::testing::TestParamInfo<std::string> const& info) {
    std::string name = info.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

std::vector<std::string> GetNames(bool (*wanted)(Scene const&)) {
    std::vector<std::string> names;
    for (Scene const& scene : Scenes::GetScenes()) {
        if (wanted(scene)) names.push_back(scene.name);
    }
    return names;
}

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

class SceneTest : public RecorderTest, public ::testing::WithParamInterface<std::string> {
protected:
    Scene const& GetScene() const { return *Scenes::FindScene(GetParam()); }
};

class SceneOnCpu : public SceneTest {};

TEST_P(SceneOnCpu, LooksAsTheReferenceDrawsIt) { ExpectLikeReference(ToDrawing(GetScene()), GetParam()); }

INSTANTIATE_TEST_SUITE_P(All, SceneOnCpu,
                         ::testing::ValuesIn(GetNames([](Scene const& s) { return !s.needsGpu; })),
                         ToTestName);

TEST_P(SceneTest, IsTheSameOnEveryWayAndFromItsRecording) {
    Drawing const once = ToDrawing(GetScene());
    Draw({once.start, [&](IMKCanvas&, Scenes::SceneStage& stage) {
              auto const recorder = SceneRecorder::Start(path, once.start.width, once.start.height);
              once.draw(*recorder, stage);
              std::string error;
              EXPECT_TRUE(recorder->Close(&error)) << error;
          }});
    EXPECT_EQ(ReadFile(path).find("LeftOut"), std::string::npos);
    ExpectSame(Draw(once), Replay(once.start), GetParam() + " recorded");

    Drawing const drawing = Twice(once);
    Picture const deferred = Draw(drawing);
    // Merged draws run another program.
    Slack const slack(deferred.width, deferred.height, 1);
    ExpectSame(deferred, Draw(drawing, Way::Immediate), GetParam() + " immediate", &slack);
    // What a scene makes of the GPU's own it makes through the queue.
    if (GetScene().needsGpu) return;
    ExpectSame(deferred, Draw(drawing, Way::RenderThread), GetParam() + " on the render thread", &slack);
}

INSTANTIATE_TEST_SUITE_P(All, SceneTest,
                         ::testing::ValuesIn(GetNames([](Scene const& s) { return !s.needsPen; })),
                         ToTestName);

class SceneInStrips : public SceneTest {};

TEST_P(SceneInStrips, LooksAsTheReferenceDrawsIt) {
    Scene const& scene = GetScene();
    // A strip is as high as the scene is wide at least; so the scene is moved to where its middle is the cut.
    int const side = std::max(scene.width, scene.height);
    int const top = side - scene.height / 2;
    UseLargestSide(side);
    ExpectLikeReference({Picture(scene.width, top + scene.height),
                         [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                             canvas.PreTranslate(0, static_cast<float>(top));
                             Scenes::DrawScene(scene, canvas, stage);
                         }},
                        GetParam() + " in strips");
}

INSTANTIATE_TEST_SUITE_P(All, SceneInStrips,
                         ::testing::ValuesIn(GetNames([](Scene const& s) { return !s.needsGpu; })),
                         ToTestName);

// Over what the target held and under the canvas's matrix; a bitmap that changes between two draws; and one that
// comes back to what it was, which is no third file.
TEST_F(RecorderTest, ItHandsCallsOnAndRecordsBitmapsAsTheyAreDrawn) {
    Picture const start = MakeBackdrop(60, 40);
    Picture const red = MakeChecker(20, 20, 5, {255, 0, 0, 255}, {80, 0, 0, 128});
    Picture const green = MakeChecker(20, 20, 3, {0, 255, 0, 255}, {0, 60, 0, 60});
    auto const through = [&](bool records) {
        return Draw({start, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                         canvas.PreTranslate(3, -1.5f);
                         auto const recorder =
                             records ? SceneRecorder::Start(path, canvas) : RefPtr<SceneRecorder>();
                         IMKCanvas& onto = records ? *recorder : canvas;
                         auto const bitmap = MakeBitmap(stage, red);
                         auto const change = [&](Picture const& to, TextureParamFilteringValue filter) {
                             bitmap->GetTextureBitmap()->UpdateBitmap(to.pixels.data(), to.GetStride());
                             bitmap->GetBitmapReadable()->SetTextureFilter(filter);
                         };
                         onto.DrawBitmap(bitmap.Get(), 1, 2, nullptr);
                         change(green, TextureFilterNearest);
                         onto.DrawBitmap(bitmap.Get(), RectF(20, 2, 53, 36), nullptr);
                         change(red, TextureFilterLinear);
                         onto.DrawBitmap(bitmap.Get(), RectF(2, 22, 19, 39), nullptr);
                         stage.GetQueue()->WaitForTasks(); // which reads the pictures of this scope
                         if (!records) return;
                         EXPECT_TRUE(recorder->Close());
                         EXPECT_EQ(recorder->GetMatrix()[6], 3);
                         EXPECT_EQ(recorder->GetBitmap(), canvas.GetBitmap());
                     }});
    };
    Picture const drawn = through(false);
    ExpectSame(drawn, through(true), "through the recorder");
    ExpectSame(drawn, Replay(Picture(60, 40)), "recorded");
    EXPECT_EQ(folder.List("fault.bitmaps").size(), 3u); // the target, red and green
}

} // namespace
} // namespace Moka::Testing
