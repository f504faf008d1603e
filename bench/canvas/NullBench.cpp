// Draws rectangles with the device without a driver, to measure the library's own cost on the render thread
// (recording and flushing) and on the caller's thread.
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>

namespace Moka::Bench {
namespace {

constexpr int kRectangles = 5000;

RenderThread& GetQueue() {
    static std::string error;
    static std::unique_ptr<RenderThread> const queue = RenderThread::Start({}, &error);
    if (!queue) std::exit((std::fprintf(stderr, "%s\n", error.c_str()), 1));
    return *queue;
}

// atOnce: uses a render-thread canvas on the render thread. Otherwise a caller-side canvas posts, and the
// time includes waiting for the tasks.
void DrawRectangles(benchmark::State& state, bool atOnce, bool distinct) {
    RenderThread& queue = GetQueue();
    UseFrom const from = atOnce ? UseFrom::RenderThread : UseFrom::AnyThread;
    auto const measure = [&] {
        auto const bitmap = NewBitmap(queue, 1024, 1024, from);
        auto const canvas = NewCanvas(queue, bitmap, from);
        MKPaint paint;
        for (auto _ : state) {
            for (int i = 0; i < kRectangles; ++i) {
                if (distinct) paint.SetColor(static_cast<float>(i) / kRectangles, 0.5f, 0.25f);
                auto const x = static_cast<float>(i % 1000);
                canvas->DrawRect(RectF(x, x, x + 16, x + 16), &paint);
            }
            if (atOnce) {
                RendererFactory::Flush();
            } else {
                queue.WaitForTasks();
            }
        }
    };
    if (atOnce) {
        queue.Call(measure);
    } else {
        measure();
    }
    state.SetItemsProcessed(state.iterations() * kRectangles);
}

BENCHMARK_CAPTURE(DrawRectangles, render_thread_same, true, false)->UseRealTime();
BENCHMARK_CAPTURE(DrawRectangles, render_thread_distinct, true, true)->UseRealTime();
BENCHMARK_CAPTURE(DrawRectangles, posted_same, false, false)->UseRealTime();

} // namespace
} // namespace Moka::Bench
