// SceneSteps.h: the operations of a scene, read once and checked, then played onto canvases.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "scenes/ScenePaint.h"

#include <functional>
#include <map>
#include <string>
#include <vector>

namespace Moka {
class IGLMsgQueue;
}

namespace Moka::Scenes {

// Everything a scene draws, with repetitions counted as often as they are drawn.
constexpr long long kMaxOperations = 1'000'000;

struct SceneBitmaps : std::vector<RefPtr<IMKBitmap>> {
    IGLMsgQueue* queue = nullptr; // for steps that need a GPU
};
using SceneStep = std::function<void(IMKCanvas&, SceneBitmaps const&)>;

struct SceneSteps {
    std::vector<SceneStep> steps;
    long long count = 0;   // operations when played once
    bool needsGpu = false; // see Scene::needsGpu

    void Play(IMKCanvas& canvas, SceneBitmaps const& bitmaps) const {
        for (SceneStep const& step : steps) step(canvas, bitmaps);
    }
};

// What operations refer to by name.
struct SceneNames {
    NamedPaints paints;
    std::map<std::string, std::size_t> bitmaps; // position in SceneBitmaps
};

// A step and what it counts for.
struct SceneOperation {
    SceneStep step;
    long long count = 1;
    bool needsGpu = false;
};

using SceneOperationReader = SceneOperation (*)(SceneFields&, SceneNames const&);
using SceneOperationTable = std::map<std::string, SceneOperationReader>;

// By the names that the canvas gives them: what draws; what clears, clips, saves or sets the matrix. By names of
// their own: custom drawables of the library, and what a recording could not say.
SceneOperationTable const& GetDrawingOperations();
SceneOperationTable const& GetDrawableOperations();
SceneOperationTable const& GetStateOperations();

// Of the field "paint", a new one without it; of the field key, which names a bitmap.
MKPaint GetPaint(SceneFields& fields, SceneNames const& names);
std::size_t GetBitmap(SceneFields& fields, SceneNames const& names, char const* key = "bitmap");

// value is a list of operations, groups among them.
SceneSteps ReadSteps(SceneValue const& value, SceneNames const& names);

} // namespace Moka::Scenes
