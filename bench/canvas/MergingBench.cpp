// Frames whose draws differ in properties that merging supports: uniform values, alternating programs, clips.
#include "bench/canvas/BareComparison.h"
#include "bench/canvas/BareShapes.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"

#include <benchmark/benchmark.h>

#include <cmath>
#include <vector>

namespace Moka::Bench {
namespace {

template <class DrawFrame>
void Measure(benchmark::State& state, double things, DrawFrame const& drawFrame) {
    for (int i = 0; i < kWarmUpFrames; ++i) MeasureFrame(drawFrame);
    FrameCounters counters(state, things, 1e-9);
    for (auto _ : state) counters.Add(MeasureFrame(drawFrame));
}

// Sets a clip that needs the stencil.
void ClipRotated(IMKCanvas& canvas, float degrees) {
    canvas.PreRotate(degrees, kSide / 2.0f, kSide / 2.0f);
    canvas.SetClipRect(100, 100, kSide - 200, kSide - 200, IMKCanvasBase::Intersect);
    canvas.SetMatrix(Matrix3<float>());
}

// Drops the log lines of stencil clips, except in one benchmark.
enum class ClipLog { Dropped, Written };

class ClipLogging {
public:
    explicit ClipLogging(ClipLog log) {
        if (log == ClipLog::Dropped) SetLogPriority(ANDROID_LOG_ERROR);
    }
    ~ClipLogging() { SetLogPriority(ANDROID_LOG_INFO); }
};

void ClippedRects(benchmark::State& state, int clips, bool each, ClipLog log) {
    constexpr int kRects = 1000;
    constexpr int kSize = 8;
    ClipLogging const logging(log);
    BenchCanvas target;
    MKPaint paint;
    Measure(state, kRects, [&] {
        target.canvas->Save(IMKCanvasBase::SaveAll);
        for (int i = 0; i < clips && !each; ++i) ClipRotated(*target.canvas, static_cast<float>(3 + i));
        for (int i = 0; i < kRects; ++i) {
            if (each) {
                target.canvas->Save(IMKCanvasBase::SaveAll);
                ClipRotated(*target.canvas, static_cast<float>(i % 80 + 3));
            }
            SetColor(paint, ColorOf(i, Colors::Distinct));
            target.canvas->DrawRect(BoxOf(i, kSize), &paint);
            if (each) target.canvas->Restore(-1);
        }
        target.canvas->Restore(-1);
    });
}

// Draws rows of buttons: a round rectangle, an icon and two lines each.
void Buttons(benchmark::State& state) {
    constexpr int kButtons = 500;
    constexpr int kColumns = 20;
    BenchCanvas target;
    RefPtr<IMKBitmap> const icon = MakeBitmap(12, 12);
    MKPaint fill;
    MKPaint line;
    line.SetLineWidth(2);
    Measure(state, kButtons, [&] {
        for (int i = 0; i < kButtons; ++i) {
            int const row = i / kColumns;
            float const x = static_cast<float>(i % kColumns) * 50 + 4;
            float const y = static_cast<float>(row) * 40 + 4;
            SetColor(fill, ColorOf(i, Colors::Distinct));
            target.canvas->DrawRoundRect({x, y, x + 44, y + 32}, 6, 6, &fill);
            target.canvas->DrawBitmap(icon.Get(), x + 4, y + 10, &line);
            target.canvas->DrawLine(x + 20, y + 12, x + 38, y + 12, &line);
            target.canvas->DrawLine(x + 20, y + 20, x + 34, y + 20, &line);
        }
    });
}

// Draws round rectangles in rows of 64, which alternate between two programs. If step is below size, they
// overlap.
void RoundRects(benchmark::State& state, int size, int step) {
    constexpr int kRoundRects = 4000;
    BenchCanvas target;
    MKPaint paint;
    Measure(state, kRoundRects, [&] {
        for (int i = 0; i < kRoundRects; ++i) {
            float const x = static_cast<float>(i % 64 * step);
            float const y = static_cast<float>(i / 64 * step);
            float const side = static_cast<float>(size);
            SetColor(paint, ColorOf(i, Colors::Distinct));
            target.canvas->DrawRoundRect({x, y, x + side, y + side}, side / 4, side / 4, &paint);
        }
    });
}

// Each draw overlaps earlier ones, and integer uniforms differ from draw to draw.
void OverlappingCircles(benchmark::State& state) {
    BenchCanvas target;
    MKPaint paint;
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(3);
    Measure(state, 1000, [&] {
        for (int i = 0; i < 1000; ++i) {
            SetColor(paint, ColorOf(i, Colors::Distinct));
            target.canvas->DrawCircle(500 + static_cast<float>(i % 30), 500, 60, &paint);
        }
    });
}

// Draws 20,000 strokes of 40 segments, panned by one pixel in each frame.
void PageOfStrokes(benchmark::State& state) {
    constexpr int kStrokes = 20'000;
    constexpr int kSegments = 40;
    BenchCanvas target(1200, 1600);
    std::vector<std::vector<PointF>> strokes;
    for (int i = 0; i < kStrokes; ++i) {
        std::vector<PointF>& points = strokes.emplace_back();
        float const x = static_cast<float>(i * 37 % 1100);
        float const y = static_cast<float>(i * 91 % 1500);
        for (int k = 0; k < kSegments; ++k) {
            for (float const at : {static_cast<float>(k), static_cast<float>(k + 1)}) {
                points.emplace_back(x + at * 2, y + 10 * std::sin(at * 0.4f));
            }
        }
    }
    MKPaint paint;
    paint.SetAntiAliasing(true);
    float pan = 0;
    Measure(state, 1, [&] {
        target.canvas->Save(IMKCanvasBase::SaveAll);
        pan = pan > 100 ? 0 : pan + 1;
        target.canvas->PreTranslate(pan, 0);
        for (int i = 0; i < kStrokes; ++i) {
            SetColor(paint, ColorOf(i % 200, Colors::Distinct));
            paint.SetLineWidth(static_cast<float>(1 + i % 3));
            target.canvas->DrawSimpleLines(strokes[static_cast<std::size_t>(i)], &paint);
        }
        target.canvas->Restore(-1);
    });
}

void ManyRects(benchmark::State& state) {
    auto const count = static_cast<int>(state.range(0));
    BenchCanvas target;
    MKPaint paint;
    Measure(state, count, [&] {
        for (int i = 0; i < count; ++i) {
            SetColor(paint, ColorOf(i & 0xFFFF, Colors::Distinct));
            target.canvas->DrawRect(BoxOf(i, 4), &paint);
        }
    });
}

// Compares with one batch of bare GL, whose program draws only these shapes.
void BesideBatch(benchmark::State& state, BareBatch::Shape shape, int size) {
    BenchCanvas target;
    RefPtr<IMKBitmap> const bitmap = MakeBitmap(size, size);
    OnRenderThread<BareBatch> bare(shape, size);
    MKPaint paint;
    paint.SetLineWidth(4);
    auto const half = static_cast<float>(size) / 2;
    Compare(
        state, kShapes,
        [&] {
            for (int i = 0; i < kShapes; ++i) {
                SetColor(paint, ColorOf(i, Colors::Distinct));
                RectF const box = BoxOf(i, size);
                switch (shape) {
                case BareBatch::Shape::Rect:
                case BareBatch::Shape::CoveredRect:
                    target.canvas->DrawRect(box, &paint);
                    break;
                case BareBatch::Shape::Bitmap:
                    target.canvas->DrawBitmap(bitmap.Get(), box.left, box.top, &paint);
                    break;
                case BareBatch::Shape::Circle:
                    target.canvas->DrawCircle(box.left + half, box.top + half, half, &paint);
                    break;
                case BareBatch::Shape::Line:
                    target.canvas->DrawLine(box.left, box.top, box.right, box.bottom, &paint);
                    break;
                }
            }
        },
        [&] { bare->Draw(kShapes, size); });
}

void Configure(benchmark::internal::Benchmark* benchmark) {
    benchmark->UseManualTime()->Iterations(10)->Unit(benchmark::kMillisecond);
}

BENCHMARK_CAPTURE(ClippedRects, no_clip, 0, false, ClipLog::Dropped)->Apply(Configure);
BENCHMARK_CAPTURE(ClippedRects, one_rotated, 1, false, ClipLog::Dropped)->Apply(Configure);
BENCHMARK_CAPTURE(ClippedRects, one_rotated_logged, 1, false, ClipLog::Written)->Apply(Configure);
BENCHMARK_CAPTURE(ClippedRects, three_rotated, 3, false, ClipLog::Dropped)->Apply(Configure);
BENCHMARK_CAPTURE(ClippedRects, ten_rotated, 10, false, ClipLog::Dropped)->Apply(Configure);
BENCHMARK_CAPTURE(ClippedRects, one_of_its_own_each, 1, true, ClipLog::Dropped)->Apply(Configure);
BENCHMARK(Buttons)->Apply(Configure);
BENCHMARK_CAPTURE(RoundRects, apart, 14, 16)->Apply(Configure);
BENCHMARK_CAPTURE(RoundRects, overlapping, 14, 8)->Apply(Configure);
BENCHMARK(OverlappingCircles)->Apply(Configure);
BENCHMARK(PageOfStrokes)->Apply(Configure);
BENCHMARK(ManyRects)->RangeMultiplier(10)->Range(1000, 1'000'000)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, rect_16, BareBatch::Shape::Rect, 16)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, rect_64, BareBatch::Shape::Rect, 64)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, covered_rect_16, BareBatch::Shape::CoveredRect, 16)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, covered_rect_64, BareBatch::Shape::CoveredRect, 64)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, bitmap_16, BareBatch::Shape::Bitmap, 16)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, bitmap_64, BareBatch::Shape::Bitmap, 64)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, circle_16, BareBatch::Shape::Circle, 16)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, circle_64, BareBatch::Shape::Circle, 64)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, line_16, BareBatch::Shape::Line, 16)->Apply(Configure);
BENCHMARK_CAPTURE(BesideBatch, line_64, BareBatch::Shape::Line, 64)->Apply(Configure);

} // namespace
} // namespace Moka::Bench
