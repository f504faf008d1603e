// Scene: a named picture with a description, for the gallery, the tests and the benchmarks.
// Units: pixels; colours 0 ... 1. The background colour is premultiplied.
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

// A caption for a part of a picture. The gallery page shows it; it is not drawn.
struct SceneLabel {
    PointF at; // the top left corner of that part
    std::string text;
};

struct Scene {
    std::string name;  // [a-z0-9-], unique
    std::string about; // one sentence
    int width = 0;
    int height = 0;
    Vector4<float> background; // transparent by default
    std::vector<SceneLabel> labels;
    std::string text; // the scene's JSON; empty for a scene in C++

    SceneGroup group = SceneGroup::Rectangles;
    bool alsoInStrips = false; // the gallery shows it on a target of three strips as well
    bool onScreen = false;     // for a screen bitmap; can be drawn on any target
    bool needsGpu = false;     // needs a stage with a queue: it creates GPU objects or depends on the driver
    bool needsPen = false;     // needs a stage with a pen, because external GL code draws ink

    // Draws on a new canvas, over the present contents of its target. May leave a matrix, clips and saves.
    std::function<void(IMKCanvas&, SceneStage&)> draw;
};

// All scenes, in the gallery's order. Any thread. The first call creates them.
std::vector<Scene> const& GetScenes();

// Returns the scene of this name, or null.
Scene const* FindScene(std::string const& name);

// Clears the target and draws the scene. The target must have the scene's size and may have any number of
// strips.
// Fails: throws SceneError if the stage cannot create a bitmap. Only the background has been drawn then.
void DrawScene(Scene const& scene, IMKCanvas& canvas, SceneStage& stage);

// Returns the largest texture side for which the scene's target has three strips.
int GetSideForThreeStrips(Scene const& scene);

} // namespace Moka::Scenes
