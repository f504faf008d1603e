// CanvasDrawing: draws the same thing with the real canvas, in each of its ways, and with the reference, and
// compares the pictures.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/host/RenderThread.h"
#include "scenes/Picture.h"
#include "scenes/SceneStage.h"
#include "tests/support/LogCapture.h"
#include "tests/support/reference/ReferenceCanvas.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

namespace Moka::Testing {

// What is drawn over a picture that is there from the start.
struct Drawing {
    using Function = std::function<void(IMKCanvas&, Scenes::SceneStage&)>;

    Picture start;
    Function draw;
};

enum class Way {
    Deferred,    // a caller-side canvas; the renderer flushes its list when the queue is empty
    Immediate,   // a caller-side canvas; the renderer flushes every draw
    RenderThread // a render-thread canvas, drawn on there
};

// Every alpha, with colours of its own, so that every blend shows.
Picture MakeBackdrop(int width, int height);

// On the drawing's own stage.
RefPtr<IMKBitmap> MakeBitmap(Scenes::SceneStage& stage, Picture const& image);

// Draws everything, clears it, and draws it again: the renderer merges short runs of draws when it sees them for
// the second time.
Drawing Twice(Drawing drawing);

class CanvasDrawing : public ::testing::Test {
protected:
    static constexpr int kLarge = 4096;
    static constexpr int kCoarse = 16;

    // Nothing alive on the GPU, no driver message, no error line, when the members of the fixtures that derive from it
    // are gone.
    ~CanvasDrawing() override;

    // The render thread stays from test to test, and only another side begins a new one.
    void UseLargestSide(int side);
    RenderThread& GetRenderThread() const;

    Picture Draw(Drawing const& drawing, Way way = Way::Deferred);

    // As near as the reference allows, which may leave more than kCoarse open in a seventh of the picture.
    void ExpectLikeReference(Drawing const& drawing, std::string const& what, Way way = Way::Deferred);
    static void ExpectSame(Picture const& expected, Picture const& actual, std::string const& what,
                           Slack const* slack = nullptr);

    LogCapture log;
    // What the renderer may keep for the next time: after a target was drawn onto itself its copy.
    int kept = 0;

private:
    int mSide = kLarge;
};

} // namespace Moka::Testing
