#include "scenes/Scene.h"

#include "moka/graphics/canvas/IMKCanvas.h"

#include <algorithm>

namespace Moka::Scenes {

char const* GetTitle(SceneGroup group) {
    switch (group) {
    case SceneGroup::Note:
        return "A note page";
    case SceneGroup::Rectangles:
        return "Rectangles";
    case SceneGroup::TransferModes:
        return "Transfer modes";
    case SceneGroup::Clips:
        return "Clips";
    case SceneGroup::SaveAndRestore:
        return "Save and restore";
    case SceneGroup::Bitmaps:
        return "Bitmaps";
    case SceneGroup::Lines:
        return "Lines";
    case SceneGroup::Circles:
        return "Circles";
    case SceneGroup::RoundRectangles:
        return "Round rectangles";
    case SceneGroup::CustomDrawables:
        return "Custom drawables";
    case SceneGroup::Screen:
        return "Screen";
    case SceneGroup::PenCanvas:
        return "Pen canvas";
    }
    return "";
}

Scene const* FindScene(std::string const& name) {
    std::vector<Scene> const& scenes = GetScenes();
    auto const found =
        std::find_if(scenes.begin(), scenes.end(), [&](Scene const& scene) { return scene.name == name; });
    return found == scenes.end() ? nullptr : &*found;
}

void DrawScene(Scene const& scene, IMKCanvas& canvas, SceneStage& stage) {
    Vector4<float> const& c = scene.background;
    canvas.ClearAll(c.x, c.y, c.z, c.w);
    scene.draw(canvas, stage);
}

int GetSideForThreeStrips(Scene const& scene) { return std::max(scene.width, (scene.height + 2) / 3); }

} // namespace Moka::Scenes
