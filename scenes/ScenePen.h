// ScenePen: foreign code that draws ink with GL calls of its own, through a pen canvas. Scenes know no GL, so
// whoever draws them brings one along, or leaves those scenes out.
// Thread: any but the render thread.
#pragma once

#include "moka/graphics/math/Vector.h"

#include <vector>

namespace Moka {

class IMKPenCanvas;

} // namespace Moka

namespace Moka::Scenes {

// In the pixels of the canvas's matrix.
struct InkPoint {
    float x;
    float y;
    float radius;
};

class ScenePen {
public:
    virtual ~ScenePen() = default;

    // One line through the points, in a premultiplied colour, under the canvas's matrix and clip; in order
    // with what was asked of the target's other canvases. Fewer than two points draw nothing.
    virtual void DrawStroke(IMKPenCanvas& canvas, std::vector<InkPoint> const& points,
                            Vector4<float> const& color) = 0;
};

} // namespace Moka::Scenes
