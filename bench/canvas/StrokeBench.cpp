// Draws a page of 20,000 pen strokes of 41 points, panned by one pixel in each frame. For comparison, bare GL
// draws each segment as a quad with round ends, all with one call, from prepared vertices; where segments
// meet or cross, it blends twice.
#include "bench/canvas/BareComparison.h"
#include "bench/canvas/BareGl.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/host/RenderThread.h"

#include <benchmark/benchmark.h>

#include <cmath>
#include <vector>

namespace Moka::Bench {
namespace {

constexpr int kStrokes = 20'000;
constexpr int kPoints = 41;
constexpr int kPageWidth = 1200;
constexpr int kPageHeight = 1600;

enum class Ink { OneColor, ManyColors, Translucent };

std::vector<MKStrokePoint> PointsOf(int stroke) {
    std::vector<MKStrokePoint> points;
    auto const x = static_cast<float>(stroke * 37 % 1100);
    auto const y = static_cast<float>(stroke * 91 % 1500);
    for (int k = 0; k < kPoints; ++k) {
        auto const at = static_cast<float>(k);
        points.push_back({x + at * 2, y + 20 + 10 * std::sin(at * 0.4f), static_cast<float>(1 + stroke % 3)});
    }
    return points;
}

Vector4<float> InkOf(int stroke, Ink ink) {
    Vector4<float> color = ColorOf(stroke % 200, ink == Ink::OneColor ? Colors::Same : Colors::Distinct);
    color.w = ink == Ink::Translucent ? 0.5f : 1;
    return color;
}

constexpr char const* kVertex = R"(#version 300 es
layout(location = 0) in highp vec2 aPosition;
layout(location = 1) in highp vec4 aSegment;
layout(location = 2) in highp vec4 aColor;
layout(location = 3) in highp float aRadius;
uniform highp float uPan;
flat out highp vec4 vSegment;
flat out mediump vec4 vColor;
flat out highp float vRadius;
out highp vec2 vPosition;
void main() {
    vSegment = aSegment;
    vColor = aColor;
    vRadius = aRadius;
    vPosition = aPosition;
    gl_Position = vec4((aPosition.x + uPan) / 600.0 - 1.0, aPosition.y / 800.0 - 1.0, 0.0, 1.0);
})";

constexpr char const* kFragment = R"(#version 300 es
flat in highp vec4 vSegment;
flat in mediump vec4 vColor;
flat in highp float vRadius;
in highp vec2 vPosition;
out mediump vec4 color;
void main() {
    highp vec2 line = vSegment.zw - vSegment.xy;
    highp vec2 to = vPosition - vSegment.xy;
    highp float t = clamp(dot(to, line) / dot(line, line), 0.0, 1.0);
    color = vColor * clamp(0.5 + vRadius - length(to - line * t), 0.0, 1.0);
})";

class BarePage {
public:
    explicit BarePage(Ink ink) {
        for (int i = 0; i < kStrokes; ++i) {
            std::vector<MKStrokePoint> const points = PointsOf(i);
            for (std::size_t k = 0; k + 1 < points.size(); ++k)
                Write(points[k], points[k + 1], InkOf(i, ink));
        }
    }

    void Draw(float pan) {
        mTarget.DrawInto();
        SetBareState();
        mProgram.Use();
        glUniform1f(mPan, pan);
        mVertices.Upload(mFloats);
        glDrawArrays(GL_TRIANGLES, 0, mVertices.Count(mFloats));
    }

private:
    void Write(MKStrokePoint const& a, MKStrokePoint const& b, Vector4<float> const& color) {
        float const radius = a.width / 2;
        float const reach = radius + 0.5f;
        float const length = std::hypot(b.x - a.x, b.y - a.y);
        float const x = (b.x - a.x) / length * reach;
        float const y = (b.y - a.y) / length * reach;
        PointF const corners[] = {{a.x - x - y, a.y - y + x},
                                  {b.x + x - y, b.y + y + x},
                                  {a.x - x + y, a.y - y - x},
                                  {b.x + x + y, b.y + y - x}};
        for (int const corner : {0, 1, 2, 2, 1, 3}) {
            mFloats.insert(mFloats.end(),
                           {corners[corner].x, corners[corner].y, a.x, a.y, b.x, b.y, color.x * color.w,
                            color.y * color.w, color.z * color.w, color.w, radius});
        }
    }

    BareImage mTarget{kPageWidth, kPageHeight};
    BareProgram mProgram{kVertex, kFragment};
    GLint mPan = mProgram.Find("uPan");
    BareVertices mVertices{2, 4, 4, 1};
    std::vector<float> mFloats;
};

void Page(benchmark::State& state, Ink ink, float zoom) {
    BenchCanvas target(kPageWidth, kPageHeight);
    OnRenderThread<BarePage> bare(ink);
    std::vector<RefPtr<MKStrokeDrawable>> strokes;
    for (int i = 0; i < kStrokes; ++i) {
        strokes.push_back(RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(&GetRenderThread())));
        std::vector<MKStrokePoint> const points = PointsOf(i);
        strokes.back()->Append(points.data(), kPoints);
    }
    GetRenderThread().WaitForTasks();
    MKPaint paint;
    float pan = 0;
    Compare(
        state, 1,
        [&] {
            pan = pan > 100 ? 0 : pan + 1;
            target.canvas->Save(IMKCanvasBase::SaveAll);
            target.canvas->PreTranslate(pan, 0);
            target.canvas->PreScale(zoom, zoom);
            for (int i = 0; i < kStrokes; ++i) {
                SetColor(paint, InkOf(i, ink));
                target.canvas->Draw(strokes[static_cast<std::size_t>(i)].Get(), &paint);
            }
            target.canvas->Restore(-1);
        },
        [&] { bare->Draw(pan); });
}

void Configure(benchmark::internal::Benchmark* benchmark) {
    benchmark->UseManualTime()->Iterations(5)->Unit(benchmark::kMillisecond);
}

BENCHMARK_CAPTURE(Page, one_color, Ink::OneColor, 1.0f)->Apply(Configure);
BENCHMARK_CAPTURE(Page, many_colors, Ink::ManyColors, 1.0f)->Apply(Configure);
BENCHMARK_CAPTURE(Page, translucent, Ink::Translucent, 1.0f)->Apply(Configure);
BENCHMARK_CAPTURE(Page, a_quarter_as_large, Ink::ManyColors, 0.25f)->Apply(Configure);
BENCHMARK_CAPTURE(Page, four_times_as_large, Ink::ManyColors, 4.0f)->Apply(Configure);

// Measures, in nanoseconds for each point, appending and the first draw, and drawing after each appended
// point.
void Append(benchmark::State& state) {
    auto const count = static_cast<int>(state.range(0));
    BenchCanvas target(kPageWidth, kPageHeight);
    MKPaint paint;
    FrameCounters counters(state, count, 1e-9);
    for (auto _ : state) {
        auto const stroke = RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(&GetRenderThread()));
        GetRenderThread().WaitForTasks();
        counters.Add(MeasureFrame([&] {
            for (int i = 0; i < count; ++i) {
                auto const at = static_cast<float>(i);
                MKStrokePoint const point{600 + 550 * std::sin(at * 0.0013f),
                                          800 + 700 * std::sin(at * 0.0017f), 4};
                stroke->Append(&point, 1);
            }
            target.canvas->Draw(stroke.Get(), &paint);
        }));
    }
}

BENCHMARK(Append)->RangeMultiplier(10)->Range(1000, 1'000'000)->Apply(Configure);

} // namespace
} // namespace Moka::Bench
