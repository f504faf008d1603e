#include "scenes/CustomScenes.h"
#include "scenes/NoteScene.h"
#include "scenes/PenScenes.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneTexts.h"

#include <algorithm>
#include <iterator>

namespace Moka::Scenes {
namespace {

struct Entry {
    char const* name; // the name of a file in data/
    SceneGroup group;
    bool alsoInStrips = false;
};

// The scenes in the gallery's order.
constexpr Entry kEntries[] = {
    {"note", SceneGroup::Note},
    {"rect-styles", SceneGroup::Rectangles},
    {"rect-widths", SceneGroup::Rectangles},
    {"rect-fractions", SceneGroup::Rectangles},
    {"rect-matrices", SceneGroup::Rectangles},
    {"modes-rectangles", SceneGroup::TransferModes},
    {"modes-bitmaps", SceneGroup::TransferModes},
    {"clips", SceneGroup::Clips, true},
    {"clip-primitives", SceneGroup::Clips, true},
    {"clip-combinations", SceneGroup::Clips},
    {"clip-clear", SceneGroup::Clips},
    {"save-restore", SceneGroup::SaveAndRestore},
    {"save-flags", SceneGroup::SaveAndRestore},
    {"bitmap-whole", SceneGroup::Bitmaps},
    {"bitmap-parts", SceneGroup::Bitmaps},
    {"bitmap-turned", SceneGroup::Bitmaps},
    {"bitmap-scaled", SceneGroup::Bitmaps},
    {"bitmap-tiles", SceneGroup::Bitmaps},
    {"bitmap-tall", SceneGroup::Bitmaps, true},
    {"bitmap-batch", SceneGroup::Bitmaps},
    {"bitmap-darken-lighten", SceneGroup::Bitmaps},
    {"line-caps", SceneGroup::Lines},
    {"line-dashes", SceneGroup::Lines},
    {"line-fan", SceneGroup::Lines},
    {"simple-lines", SceneGroup::Lines},
    {"circle-styles", SceneGroup::Circles},
    {"circle-sizes", SceneGroup::Circles},
    {"circle-matrices", SceneGroup::Circles},
    {"round-rect-styles", SceneGroup::RoundRectangles},
    {"round-rect-radii", SceneGroup::RoundRectangles},
    {"round-rect-matrices", SceneGroup::RoundRectangles},
    {"strokes", SceneGroup::CustomDrawables},
    {"screen", SceneGroup::Screen},
};

Scene ReadEntry(Entry const& entry) {
    SceneText const* const end = kSceneTexts + kSceneTextCount;
    SceneText const* const text = std::find_if(kSceneTexts, end, [&](SceneText const& candidate) {
        return std::string(entry.name) == candidate.name;
    });
    if (text == end) throw SceneError(std::string("there is no file of the scene ") + entry.name);
    Scene scene = ParseScene(text->text, std::string("scenes/data/") + entry.name + ".json", "");
    if (entry.group == SceneGroup::Note) AddHandwriting(scene);
    scene.name = entry.name;
    scene.text = text->text;
    scene.group = entry.group;
    scene.alsoInStrips = entry.alsoInStrips;
    scene.onScreen = entry.group == SceneGroup::Screen;
    return scene;
}

std::vector<Scene> MakeScenes() {
    std::vector<Scene> scenes;
    std::transform(std::begin(kEntries), std::end(kEntries), std::back_inserter(scenes), ReadEntry);
    for (auto const make : {MakeCustomScenes, MakePenScenes}) {
        std::vector<Scene> made = make();
        std::move(made.begin(), made.end(), std::back_inserter(scenes));
    }
    std::stable_sort(scenes.begin(), scenes.end(),
                     [](Scene const& a, Scene const& b) { return a.group < b.group; });
    return scenes;
}

} // namespace

std::vector<Scene> const& GetScenes() {
    static std::vector<Scene> const kScenes = MakeScenes();
    return kScenes;
}

} // namespace Moka::Scenes
