// ScenePen: draws ink with external GL code through a pen canvas. Scenes use no GL, so the program that draws
// them implements this interface, or leaves those scenes out.
// Thread: any except the render thread.
#pragma once

#include "moka/graphics/math/Vector.h"

#include <vector>

namespace Moka {

class IMKPenCanvas;

} // namespace Moka

namespace Moka::Scenes {

// A point in coordinates before the canvas's matrix.
struct InkPoint {
    float x;
    float y;
    float radius;
};

class ScenePen {
public:
    virtual ~ScenePen() = default;

    // Draws one line through the points, in a premultiplied colour, with the canvas's matrix and clip, in
    // order with the requests of other canvases on the same target. Fewer than two points draw nothing.
    virtual void DrawStroke(IMKPenCanvas& canvas, std::vector<InkPoint> const& points,
                            Vector4<float> const& color) = 0;
};

} // namespace Moka::Scenes
