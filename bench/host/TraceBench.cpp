// Measures the cost of a trace: frames of 5,000 rectangles, from the first request until a pixel has been
// read back, alternately without and with a trace.
// Time:     the mean of frames without a trace.
// Counters: the CPU time of the process for a frame, on all threads, so that other programs do not count: the
// lower
//           quartiles without and with a trace, and the difference in percent.
#include "moka/base/RefPtr.h"
#include "moka/base/Trace.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <ctime>
#include <filesystem>
#include <vector>

namespace Moka::Bench {
namespace {

constexpr int kSide = 512;

double GetLowerQuartile(std::vector<double>& values) {
    auto const place = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 4);
    std::nth_element(values.begin(), place, values.end());
    return *place;
}

// Returns the CPU time of the process in milliseconds.
double GetProcessorTime() {
    timespec time{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) * 1e3 + static_cast<double>(time.tv_nsec) * 1e-6;
}

class Page {
public:
    explicit Page(RenderThread& queue)
        : mBitmap(RefPtr<IMKBitmap>::Adopt(
              MKGraphicsFactory::CreateBitmap(&queue, kSide, kSide, nullptr, false, 1, false))),
          mCanvas(RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, mBitmap.Get(), 1))) {}

    // Returns the CPU time in milliseconds.
    double Draw(bool isColorful) {
        double const begin = GetProcessorTime();
        MKPaint paint;
        for (int i = 0; i < 5000; ++i) {
            auto const x = static_cast<float>(i % 100 * 5);
            int const row = i / 100;
            auto const y = static_cast<float>(row * 10);
            if (isColorful) paint.SetColor(static_cast<int>(0xFF000000u + static_cast<unsigned>(i) * 331));
            mCanvas->DrawRect(x, y, x + 4, y + 8, &paint);
        }
        benchmark::DoNotOptimize(mBitmap->GetPixel(Point(kSide - 1, kSide - 1)));
        return GetProcessorTime() - begin;
    }

private:
    RefPtr<IMKBitmap> mBitmap;
    RefPtr<IMKCanvas> mCanvas;
};

void Frame(benchmark::State& state, bool isColorful) {
    std::string error;
    auto const queue = RenderThread::Start({}, &error);
    if (!queue) return state.SkipWithError(error.c_str());
    std::string const path = (std::filesystem::temp_directory_path() / "moka-trace-bench.json").string();
    Page page(*queue);
    std::vector<double> plain;
    std::vector<double> traced;
    for (int i = 0; i < 10; ++i) page.Draw(isColorful);
    for (auto _ : state) {
        auto const begin = std::chrono::steady_clock::now();
        plain.push_back(page.Draw(isColorful));
        state.SetIterationTime(
            std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count());
        if (!Trace::Start(path, &error)) state.SkipWithError(error.c_str());
        traced.push_back(page.Draw(isColorful));
        Trace::Stop(nullptr);
    }
    double const plainTime = GetLowerQuartile(plain);
    double const tracedTime = GetLowerQuartile(traced);
    state.counters["cpu_ms"] = plainTime;
    state.counters["traced_cpu_ms"] = tracedTime;
    state.counters["percent_more"] = (tracedTime / plainTime - 1) * 100;
    std::filesystem::remove(path);
}

void EqualRectangles(benchmark::State& state) { Frame(state, false); }
void RectanglesOfAllColors(benchmark::State& state) { Frame(state, true); }
BENCHMARK(EqualRectangles)->Iterations(200)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(RectanglesOfAllColors)->Iterations(100)->UseManualTime()->Unit(benchmark::kMillisecond);

} // namespace
} // namespace Moka::Bench
