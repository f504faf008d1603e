// Scene: something to draw, with a name and a sentence: the gallery's pictures, the tests' and benchmarks'
// subjects.
// Units: pixels; colours 0 ... 1. The background is cleared to as it is, so its colour is premultiplied.
#pragma once

#include "moka/base/Point.h"
#include "moka/graphics/math/Vector.h"
#include "scenes/SceneStage.h"

#include <functional>
#include <string>
#include <vector>

namespace Moka {

class IMKCanvas;

} // namespace Moka

namespace Moka::Scenes {

enum class SceneGroup {
    Note,
    Rectangles,
    TransferModes,
    Clips,
    SaveAndRestore,
    Bitmaps,
    Lines,
    Circles,
    RoundRectangles,
    CustomDrawables,
    Screen,
    PenCanvas,
};

char const* GetTitle(SceneGroup group);

// A name for a part of a picture, for whoever shows it; it is not drawn.
struct SceneLabel {
    PointF at; // its top left corner
    std::string text;
};

struct Scene {
    std::string name;  // [a-z0-9-], unique
    std::string about; // one sentence
    int width = 0;
    int height = 0;
    Vector4<float> background; // transparent by default
    std::vector<SceneLabel> labels;
    std::string text; // its JSON; empty for a scene that is code

    SceneGroup group = SceneGroup::Rectangles;
    bool alsoInStrips = false; // worth seeing on a target of three strips as well
    bool onScreen = false;     // meant for a screen bitmap; draws on any target
    bool needsGpu = false; // makes objects of the GPU, or shows what drivers do: only on a stage with a queue
    bool needsPen = false; // draws ink by foreign GL code: only on a stage with a pen

    // On a new canvas, over what its target holds. May leave a matrix, clips and saves.
    std::function<void(IMKCanvas&, SceneStage&)> draw;
};

// All of them, in the gallery's order. Any thread; made by the first call.
std::vector<Scene> const& GetScenes();

// Null when there is none of that name.
Scene const* FindScene(std::string const& name);

// Clears the target and draws. The target is as large as the scene; how many strips it has makes no
// difference to the picture.
// Fails: throws SceneError when the stage cannot make a bitmap; nothing has been drawn then but the
//        background.
void DrawScene(Scene const& scene, IMKCanvas& canvas, SceneStage& stage);

// The largest texture side with which the scene's target has three strips, for scenes alsoInStrips.
int GetSideForThreeStrips(Scene const& scene);

} // namespace Moka::Scenes
