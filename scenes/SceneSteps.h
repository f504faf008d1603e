// SceneSteps.h: the operations of a scene. They are read and checked once, and can be drawn on any canvas.
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

// The most operations of a scene. Repetitions count as often as they are drawn.
constexpr long long kMaxOperations = 1'000'000;

struct SceneBitmaps : std::vector<RefPtr<IMKBitmap>> {
    IGLMsgQueue* queue = nullptr; // for steps that need a GPU
};
using SceneStep = std::function<void(IMKCanvas&, SceneBitmaps const&)>;

struct SceneSteps {
    std::vector<SceneStep> steps;
    long long count = 0;   // the number of operations of one Play()
    bool needsGpu = false; // see Scene::needsGpu

    void Play(IMKCanvas& canvas, SceneBitmaps const& bitmaps) const {
        for (SceneStep const& step : steps) step(canvas, bitmaps);
    }
};

// The objects that operations refer to by name.
struct SceneNames {
    NamedPaints paints;
    std::map<std::string, std::size_t> bitmaps; // position in SceneBitmaps
};

// A step, and the number of operations that it counts as.
struct SceneOperation {
    SceneStep step;
    long long count = 1;
    bool needsGpu = false;
};

using SceneOperationReader = SceneOperation (*)(SceneFields&, SceneNames const&);
using SceneOperationTable = std::map<std::string, SceneOperationReader>;

// The operations by name. Drawing and state operations have the names of the canvas's functions. Drawable
// operations are custom drawables of the library, and "LeftOut".
SceneOperationTable const& GetDrawingOperations();
SceneOperationTable const& GetDrawableOperations();
SceneOperationTable const& GetStateOperations();

// Return the paint of the field "paint", or a new one; and the bitmap that the field `key` names.
MKPaint GetPaint(SceneFields& fields, SceneNames const& names);
std::size_t GetBitmap(SceneFields& fields, SceneNames const& names, char const* key = "bitmap");

// value is a list of operations, groups among them.
SceneSteps ReadSteps(SceneValue const& value, SceneNames const& names);

} // namespace Moka::Scenes
