// Compares the library with bare GL that draws the same. Frames alternate, so that other load on the machine
// affects both.
#include "bench/canvas/BareComparison.h"
#include "bench/canvas/BareShapes.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"

#include <benchmark/benchmark.h>

namespace Moka::Bench {
namespace {

enum class BareWay { OneCallEach, OneCall };

void Rects(benchmark::State& state, BareWay way, Colors colors) {
    constexpr int kSize = 16;
    BenchCanvas target;
    OnRenderThread<BareRects> bare;
    MKPaint paint;
    Compare(
        state, kShapes,
        [&] {
            for (int i = 0; i < kShapes; ++i) {
                SetColor(paint, ColorOf(i, colors));
                target.canvas->DrawRect(BoxOf(i, kSize), &paint);
            }
        },
        [&] {
            if (way == BareWay::OneCall)
                bare->DrawTogether(kShapes, kSize);
            else
                bare->DrawEach(kShapes, kSize);
        });
}

void Batch(benchmark::State& state) {
    constexpr int kSize = 16;
    BenchCanvas target;
    RefPtr<IMKBitmap> const bitmap = MakeBitmap(kSize, kSize);
    OnRenderThread<BareQuads> bare(kSize);
    std::vector<RectF> dsts;
    dsts.reserve(kShapes);
    for (int i = 0; i < kShapes; ++i) dsts.push_back(BoxOf(i, kSize));
    MKPaint const paint;
    Compare(
        state, kShapes, [&] { target.canvas->DrawBitmaps(bitmap.Get(), dsts, &paint); },
        [&] { bare->Draw(dsts); });
}

void SimpleLines(benchmark::State& state, bool antiAliased) {
    constexpr int kSegments = 10'000;
    constexpr float kWidth = 2;
    BenchCanvas target;
    OnRenderThread<BareLines> bare;
    std::vector<PointF> points;
    for (int i = 0; i < kSegments; ++i) {
        RectF const box = BoxOf(i, 16);
        points.insert(points.end(), {PointF(box.left, box.top), PointF(box.right, box.bottom)});
    }
    MKPaint paint;
    paint.SetLineWidth(kWidth);
    paint.SetAntiAliasing(antiAliased);
    SetColor(paint, ColorOf(0, Colors::Same));
    Compare(
        state, kSegments, [&] { target.canvas->DrawSimpleLines(points, &paint); },
        [&] { bare->Draw(points, kWidth, antiAliased); });
}

RefPtr<MKGaussianBlurDrawable> MakeBlur(IMKBitmap* bitmap, bool across) {
    auto blur = RefPtr<MKGaussianBlurDrawable>::Adopt(new MKGaussianBlurDrawable(&GetRenderThread()));
    blur->SetBitmap(bitmap);
    blur->SetHorizotalDirection(across);
    return blur;
}

void Blur(benchmark::State& state) {
    RefPtr<IMKBitmap> const source = MakeBitmap(kSide, kSide);
    BenchCanvas between;
    BenchCanvas target;
    auto const across = MakeBlur(source.Get(), true);
    auto const down = MakeBlur(between.bitmap.Get(), false);
    OnRenderThread<BareBlur> bare;
    MKPaint paint;
    paint.SetXFermode(MKPaint::BlendingOff);
    Compare(
        state, 1,
        [&] {
            between.canvas->Draw(across.Get(), &paint);
            target.canvas->Draw(down.Get(), &paint);
        },
        [&] { bare->Draw(); });
}

void Configure(benchmark::internal::Benchmark* benchmark) {
    benchmark->UseManualTime()->Iterations(40)->Unit(benchmark::kMillisecond);
}
BENCHMARK_CAPTURE(Rects, same_color_beside_one_call_each, BareWay::OneCallEach, Colors::Same)
    ->Apply(Configure);
BENCHMARK_CAPTURE(Rects, distinct_colors_beside_one_call_each, BareWay::OneCallEach, Colors::Distinct)
    ->Apply(Configure);
BENCHMARK_CAPTURE(Rects, same_color_beside_one_call, BareWay::OneCall, Colors::Same)->Apply(Configure);
BENCHMARK_CAPTURE(Rects, distinct_colors_beside_one_call, BareWay::OneCall, Colors::Distinct)
    ->Apply(Configure);
BENCHMARK(Batch)->Apply(Configure);
BENCHMARK_CAPTURE(SimpleLines, plain, false)->Apply(Configure);
BENCHMARK_CAPTURE(SimpleLines, anti_aliased, true)->Apply(Configure);
BENCHMARK(Blur)->Apply(Configure);

} // namespace
} // namespace Moka::Bench
