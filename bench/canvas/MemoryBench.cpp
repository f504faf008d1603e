// Measures the memory of requests that wait in the queue: 100,000 requests of each kind, each kind in its own
// process, because task memory is pooled.
// Counters: heap_mb and rss_mb are the memory of all requests; bytes is the heap memory of one.
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/host/TaskQueue.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <vector>

#include <malloc.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Moka::Bench {
namespace {

constexpr int kRequests = 100'000;

struct Usage {
    double heap = 0; // bytes
    double resident = 0;
};

Usage GetUsage() {
    struct mallinfo2 const heap = mallinfo2();
    long pages = 0;
    long residentPages = 0;
    if (std::FILE* const file = std::fopen("/proc/self/statm", "r")) {
        if (std::fscanf(file, "%ld %ld", &pages, &residentPages) != 2) residentPages = 0;
        std::fclose(file);
    }
    return {static_cast<double>(heap.uordblks + heap.hblkhd),
            static_cast<double>(residentPages) * static_cast<double>(sysconf(_SC_PAGESIZE))};
}

void DrawRect(IMKCanvas& canvas, IMKBitmap*, MKPaint const& paint) { canvas.DrawRect(1, 2, 3, 4, &paint); }
void DrawRoundRect(IMKCanvas& canvas, IMKBitmap*, MKPaint const& paint) {
    canvas.DrawRoundRect(1, 2, 30, 40, 5, 6, &paint);
}
void DrawCircle(IMKCanvas& canvas, IMKBitmap*, MKPaint const& paint) { canvas.DrawCircle(1, 2, 3, &paint); }
void DrawLine(IMKCanvas& canvas, IMKBitmap*, MKPaint const& paint) { canvas.DrawLine(1, 2, 3, 4, &paint); }
void DrawBitmap(IMKCanvas& canvas, IMKBitmap* bitmap, MKPaint const& paint) {
    canvas.DrawBitmap(bitmap, 1, 2, &paint);
}
void SetClip(IMKCanvas& canvas, IMKBitmap*, MKPaint const&) {
    canvas.SetClipRect(1, 2, 3, 4, IMKCanvasBase::Intersect);
}
void DrawFourSimpleLines(IMKCanvas& canvas, IMKBitmap*, MKPaint const& paint) {
    static std::vector<PointF> const points(8, PointF(1, 2));
    canvas.DrawSimpleLines(points, &paint);
}

using Request = void (*)(IMKCanvas&, IMKBitmap*, MKPaint const&);

Usage PostAll(Request request) {
    // The queue is never run, so all posted tasks stay.
    TaskQueue queue;
    auto const target = NewBitmap(queue, 64, 64);
    auto const bitmap = NewBitmap(queue, 64, 64);
    auto const canvas = NewCanvas(queue, target);
    MKPaint const paint;
    Usage const before = GetUsage();
    for (int i = 0; i < kRequests; ++i) request(*canvas, bitmap.Get(), paint);
    Usage const after = GetUsage();
    return {after.heap - before.heap, after.resident - before.resident};
}

// Returns false if the process failed.
bool PostAllInOwnProcess(Request request, Usage& usage) {
    int ends[2];
    if (pipe(ends) != 0) return false;
    pid_t const child = fork();
    if (child == 0) {
        Usage const mine = PostAll(request);
        _exit(write(ends[1], &mine, sizeof mine) == sizeof mine ? 0 : 1);
    }
    close(ends[1]);
    bool const isRead = child > 0 && read(ends[0], &usage, sizeof usage) == sizeof usage;
    close(ends[0]);
    if (child > 0) waitpid(child, nullptr, 0);
    return isRead;
}

void Post(benchmark::State& state, Request request) {
    Usage usage;
    for (auto _ : state) {
        if (!PostAllInOwnProcess(request, usage)) state.SkipWithError("the process that posts failed");
    }
    state.counters["heap_mb"] = usage.heap / 1e6;
    state.counters["rss_mb"] = usage.resident / 1e6;
    state.counters["bytes"] = usage.heap / kRequests;
}
BENCHMARK_CAPTURE(Post, rect, DrawRect)->Iterations(1);
BENCHMARK_CAPTURE(Post, round_rect, DrawRoundRect)->Iterations(1);
BENCHMARK_CAPTURE(Post, circle, DrawCircle)->Iterations(1);
BENCHMARK_CAPTURE(Post, line, DrawLine)->Iterations(1);
BENCHMARK_CAPTURE(Post, bitmap, DrawBitmap)->Iterations(1);
BENCHMARK_CAPTURE(Post, clip, SetClip)->Iterations(1);
BENCHMARK_CAPTURE(Post, four_simple_lines, DrawFourSimpleLines)->Iterations(1);

} // namespace
} // namespace Moka::Bench
