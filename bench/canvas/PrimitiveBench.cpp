// Frames of many primitives of one kind, one request each.
#include "bench/canvas/BenchCanvas.h"
#include "bench/canvas/FrameCounters.h"
#include "bench/canvas/Registration.h"

#include <benchmark/benchmark.h>

#include <string>

namespace Moka::Bench {
namespace {

struct Shape {
    IMKCanvas& canvas;
    RectF box;
    IMKBitmap* bitmap; // of the box's size
    MKPaint const& paint;

    float GetHalf() const { return (box.right - box.left) / 2; }
};

struct Primitive {
    char const* name;
    void (*prepare)(MKPaint&);
    void (*draw)(Shape const&);
};

void Fill(MKPaint&) {}
void FillSmoothly(MKPaint& paint) { paint.SetAntiAliasing(true); }
void Stroke(MKPaint& paint) {
    paint.SetStyle(MKPaint::Stroke);
    paint.SetLineWidth(2);
}
void StrokeSmoothly(MKPaint& paint) {
    Stroke(paint);
    paint.SetAntiAliasing(true);
}
void Dash(MKPaint& paint) {
    Stroke(paint);
    paint.SetLineCapType(MKPaint::Round);
    paint.SetDashedLinePattern(Vector2<float>(6, 4));
}

void DrawRect(Shape const& s) { s.canvas.DrawRect(s.box, &s.paint); }
void DrawCircle(Shape const& s) {
    s.canvas.DrawCircle(s.box.left + s.GetHalf(), s.box.top + s.GetHalf(), s.GetHalf(), &s.paint);
}
void DrawRoundRect(Shape const& s) {
    s.canvas.DrawRoundRect(s.box, s.GetHalf() / 2, s.GetHalf() / 2, &s.paint);
}
void DrawLine(Shape const& s) {
    s.canvas.DrawLine(s.box.left, s.box.top, s.box.right, s.box.bottom, &s.paint);
}
void DrawSimpleLine(Shape const& s) {
    s.canvas.DrawSimpleLine(s.box.left, s.box.top, s.box.right, s.box.bottom, &s.paint);
}
void DrawBitmap(Shape const& s) { s.canvas.DrawBitmap(s.bitmap, s.box.left, s.box.top, &s.paint); }

constexpr Primitive kPrimitives[] = {
    {"rect", Fill, DrawRect},
    {"rect-aa", FillSmoothly, DrawRect},
    {"rect-stroke", Stroke, DrawRect},
    {"rect-stroke-aa", StrokeSmoothly, DrawRect},
    {"circle", Fill, DrawCircle},
    {"circle-stroke", Stroke, DrawCircle},
    {"round-rect", Fill, DrawRoundRect},
    {"round-rect-stroke", Stroke, DrawRoundRect},
    {"line", Stroke, DrawLine},
    {"line-dashed", Dash, DrawLine},
    {"simple-line", Stroke, DrawSimpleLine},
    {"simple-line-aa", StrokeSmoothly, DrawSimpleLine},
    {"bitmap", Fill, DrawBitmap},
};

void DrawShapes(benchmark::State& state, Primitive const& primitive, int size, Colors colors) {
    BenchCanvas target;
    RefPtr<IMKBitmap> const bitmap = MakeBitmap(size, size);
    MKPaint paint;
    primitive.prepare(paint);
    auto const drawFrame = [&] {
        for (int i = 0; i < kShapes; ++i) {
            SetColor(paint, ColorOf(i, colors));
            primitive.draw({*target.canvas, BoxOf(i, size), bitmap.Get(), paint});
        }
    };
    for (int i = 0; i < kWarmUpFrames; ++i) MeasureFrame(drawFrame);
    FrameCounters counters(state, kShapes, 1e-9);
    for (auto _ : state) counters.Add(MeasureFrame(drawFrame));
}

// Draws with Darken and Lighten, which copy the destination. The texture for the copy is created once.
void DrawDarkerAndLighter(benchmark::State& state) {
    constexpr int kDraws = 50;
    constexpr int kSize = 64;
    BenchCanvas target;
    RefPtr<IMKBitmap> const bitmap = MakeBitmap(kSize, kSize);
    MKPaint paint;
    auto const drawFrame = [&] {
        for (int i = 0; i < kDraws; ++i) {
            paint.SetXFermode(i % 2 == 0 ? MKPaint::Darken : MKPaint::Lighten);
            PointF const place = PlaceOf(i, kSize);
            target.canvas->DrawBitmap(bitmap.Get(), place.x, place.y, &paint);
        }
    };
    MeasureFrame([] {}); // frees objects of earlier benchmarks
    FrameCost const first = MeasureFrame(drawFrame);
    FrameCounters counters(state, kDraws, 1e-9);
    FrameCost last;
    for (auto _ : state) {
        last = MeasureFrame(drawFrame);
        counters.Add(last);
    }
    state.counters["first_textures"] = first.after.textures - first.before.textures;
    state.counters["more_textures"] = last.after.textures - first.after.textures;
}
BENCHMARK(DrawDarkerAndLighter)->UseManualTime()->Iterations(10)->Unit(benchmark::kMillisecond);

} // namespace

void RegisterPrimitives() {
    for (Primitive const& primitive : kPrimitives) {
        for (int const size : {16, 64}) {
            for (Colors const colors : {Colors::Same, Colors::Distinct}) {
                std::string const name = std::string("Primitive/") + primitive.name + "/" +
                                         std::to_string(size) +
                                         (colors == Colors::Same ? "/same-color" : "/distinct-colors");
                benchmark::RegisterBenchmark(name.c_str(), DrawShapes, primitive, size, colors)
                    ->UseManualTime()
                    ->Iterations(10)
                    ->Unit(benchmark::kMillisecond);
            }
        }
    }
}

} // namespace Moka::Bench
