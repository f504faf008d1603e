// PenStroke: ink drawn by GL code that knows nothing of the library's renderer, the way a pen engine does it:
// a program, vertices and a vertex array of its own, between a pen canvas's two clip operations.
// Owner:  its GL objects are made by the first stroke and deleted by the destructor, on the render thread.
// Thread: any but the render thread, which every call waits for.
// Fails:  a driver that refuses the program leaves one error line and no ink.
#pragma once

#include "apps/moka/GlInk.h"
#include "scenes/ScenePen.h"

#include <memory>

namespace Moka {
class RenderThread;
} // namespace Moka

namespace Moka::Tool {

class PenStroke final : public Scenes::ScenePen {
public:
    // The thread outlives this.
    explicit PenStroke(RenderThread& thread);
    ~PenStroke() override;

    void DrawStroke(IMKPenCanvas& canvas, std::vector<Scenes::InkPoint> const& points,
                    Vector4<float> const& color) override;

private:
    RenderThread& mThread;
    std::unique_ptr<GlInk> mInk; // render thread
};

} // namespace Moka::Tool
