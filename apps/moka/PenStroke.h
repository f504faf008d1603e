// PenStroke: draws ink with external GL code, as a pen engine does: with its own program, vertices and vertex
// array, between the two clip operations of a pen canvas.
// Owner:  the first stroke creates the GL objects and the destructor deletes them, both on the render thread.
// Thread: any except the render thread, because every call waits for it.
// Fails:  if the program does not compile, logs an error and draws nothing.
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
    // The thread must outlive this object.
    explicit PenStroke(RenderThread& thread);
    ~PenStroke() override;

    void DrawStroke(IMKPenCanvas& canvas, std::vector<Scenes::InkPoint> const& points,
                    Vector4<float> const& color) override;

private:
    RenderThread& mThread;
    std::unique_ptr<GlInk> mInk; // render thread
};

} // namespace Moka::Tool
