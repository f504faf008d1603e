// Every scene, drawn by the real canvas: as the reference draws it, and the same in each way of drawing it.
#include "scenes/Scene.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

using Scenes::Scene;

Drawing ToDrawing(Scene const& scene) {
    return {Picture(scene.width, scene.height), [&scene](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                Scenes::DrawScene(scene, canvas, stage);
            }};
}

std::string ToTestName(::testing::TestParamInfo<std::string> const& info) {
    std::string name = info.param;
    for (char& c : name) {
        if (c == '-') c = '_';
    }
    return name;
}

std::vector<std::string> GetNames(bool (*wanted)(Scene const&)) {
    std::vector<std::string> names;
    for (Scene const& scene : Scenes::GetScenes()) {
        if (wanted(scene)) names.push_back(scene.name);
    }
    return names;
}

class SceneTest : public CanvasDrawing, public ::testing::WithParamInterface<std::string> {
protected:
    Scene const& GetScene() const { return *Scenes::FindScene(GetParam()); }
};

class SceneOnCpu : public SceneTest {};

TEST_P(SceneOnCpu, LooksAsTheReferenceDrawsIt) { ExpectLikeReference(ToDrawing(GetScene()), GetParam()); }

INSTANTIATE_TEST_SUITE_P(All, SceneOnCpu,
                         ::testing::ValuesIn(GetNames([](Scene const& s) { return !s.needsGpu; })),
                         ToTestName);

TEST_P(SceneTest, IsTheSameOnEveryWay) {
    Drawing const drawing = Twice(ToDrawing(GetScene()));
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

} // namespace
} // namespace Moka::Testing
