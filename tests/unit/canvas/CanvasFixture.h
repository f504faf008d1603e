// CanvasFixture: canvases over the recording renderer and hand-pumped queues, and what they had drawn. Strips
// are 64 rows high. Every test ends with nothing alive and nothing misused.
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/canvas/MKPaint.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <gmock/gmock.h>

#include <functional>
#include <limits>
#include <vector>

namespace Moka::Testing {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();

using BitmapPtr = RefPtr<IMKBitmap>;
using CanvasPtr = RefPtr<IMKCanvas>;
using PenCanvasPtr = RefPtr<IMKPenCanvas>;
using Numbers = std::vector<float>;

inline Numbers NumbersOf(Matrix4<float> const& m) { return {m.data(), m.data() + 16}; }

// What a draw of a shape says about where it goes.
inline Numbers ProjectionOf(RecordedDraw const& draw) {
    return draw.uniforms.at("uProjectionMatrix").numbers;
}

// A drawable that does what the test says and counts its references.
class FakeDrawable : public IMKCustomDrawable {
public:
    virtual ~FakeDrawable() = default;
    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override {
        ++draws;
        if (onDraw) onDraw(projection, paint);
    }
    int Ref() override { return ++references; }
    int Unref() override { return --references; }

    int references = 1;
    int draws = 0;
    std::function<void(Matrix4<float> const&, MKPaint const&)> onDraw;
};

class CanvasFixture : public BitmapFixture {
protected:
    BitmapPtr NewBitmap(int width, int height) { return BitmapPtr::Adopt(Create(width, height)); }
    BitmapPtr NewScreen(int width, int height) {
        return BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, 1));
    }
    CanvasPtr NewCanvas(BitmapPtr const& target) {
        return CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&queue, target.Get(), 1));
    }
    PenCanvasPtr NewPenCanvas(BitmapPtr const& target) {
        return PenCanvasPtr::Adopt(MKGraphicsFactory::CreatePenCanvas(&queue, target.Get(), 1));
    }

    // Runs what was posted.
    std::vector<RecordedEvent> TakeEvents() {
        queue.RunAll();
        return RecordingRenderer::TakeEvents();
    }
    std::vector<RecordedDraw> TakeDraws() {
        std::vector<RecordedDraw> draws;
        for (RecordedEvent const& event : TakeEvents())
            if (auto const* draw = std::get_if<RecordedDraw>(&event)) draws.push_back(*draw);
        return draws;
    }
    RecordedDraw TakeDraw() {
        std::vector<RecordedDraw> const draws = TakeDraws();
        EXPECT_EQ(draws.size(), 1u);
        return draws.empty() ? RecordedDraw() : draws.back();
    }
    // The calls of one operation since the calls were last taken, with their objects.
    std::vector<std::string> TakeCalls(std::string const& operation) {
        queue.RunAll();
        std::vector<std::string> calls;
        for (RecordedCall const& call : RecordingRenderer::GetCalls())
            if (call.operation == operation) calls.push_back(ToString(call));
        RecordingRenderer::TakeCalls();
        return calls;
    }

    MKPaint paint;
    LogCapture log;
};

} // namespace Moka::Testing
