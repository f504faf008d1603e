// CanvasFixture: canvases over the tracing renderer and hand-pumped queues, and what they had drawn. Strips
// are 64 rows high. Every test ends with nothing alive and nothing misused.
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <gmock/gmock.h>

#include <functional>
#include <limits>
#include <sstream>
#include <vector>

namespace Moka::Testing {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();

using CanvasPtr = RefPtr<IMKCanvas>;
using PenCanvasPtr = RefPtr<IMKPenCanvas>;
using Numbers = std::vector<float>;

inline Numbers NumbersOf(Matrix4<float> const& m) { return {m.data(), m.data() + 16}; }

// What a draw of a shape says about where it goes.
inline Numbers ProjectionOf(TracedDraw const& draw) { return draw.uniforms.at("uProjectionMatrix").numbers; }

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
    // The target and the canvas are these from now on, and everything so far has run and is forgotten.
    void Use(BitmapPtr const& bitmap) {
        target = bitmap;
        target->SetTag("page");
        canvas = NewCanvas(target);
        queue.RunAll();
        RendererTrace::TakeEvents();
        RendererTrace::TakeCalls();
    }
    BitmapPtr NewScreen(int width, int height) {
        return BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 0, 0, width, height, 1, 1));
    }
    CanvasPtr NewCanvas(BitmapPtr const& bitmap) {
        return CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&queue, bitmap.Get(), 1));
    }
    PenCanvasPtr NewPenCanvas(BitmapPtr const& bitmap) {
        return PenCanvasPtr::Adopt(MKGraphicsFactory::CreatePenCanvas(&queue, bitmap.Get(), 1));
    }

    // Runs what was posted.
    std::vector<TracedEvent> TakeEvents() {
        queue.RunAll();
        return RendererTrace::TakeEvents();
    }
    std::vector<TracedDraw> TakeDraws() {
        std::vector<TracedDraw> draws;
        for (TracedEvent const& event : TakeEvents())
            if (auto const* draw = std::get_if<TracedDraw>(&event)) draws.push_back(*draw);
        return draws;
    }
    TracedDraw TakeDraw() {
        std::vector<TracedDraw> const draws = TakeDraws();
        EXPECT_EQ(draws.size(), 1u);
        return draws.empty() ? TracedDraw() : draws.back();
    }
    // The draws and clears, as text.
    std::vector<std::string> TakePictures() {
        std::vector<std::string> pictures;
        for (TracedEvent const& event : TakeEvents()) {
            std::ostringstream text;
            if (auto const* clear = std::get_if<TracedClear>(&event)) {
                for (float component : clear->color) text << component << ' ';
            } else {
                auto const& draw = std::get<TracedDraw>(event);
                text << draw.shader << ' ';
                for (float number : draw.vertices) text << number << ' ';
                for (auto const& [name, value] : draw.uniforms) text << name << '=' << value.text;
            }
            pictures.push_back(text.str());
        }
        return pictures;
    }
    // The calls of one operation since the calls were last taken, with their objects.
    std::vector<std::string> TakeCalls(std::string const& operation) {
        queue.RunAll();
        std::vector<std::string> calls;
        for (std::string const& call : RendererTrace::TakeCalls())
            if (call.find(" " + operation) != std::string::npos) calls.push_back(call);
        return calls;
    }

    BitmapPtr target;
    CanvasPtr canvas;
    MKPaint paint;
    LogCapture log;
};

} // namespace Moka::Testing
