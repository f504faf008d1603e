// BareComparison.h: measures frames of the library and of bare GL alternately, so that other load on the
// machine affects both.
#pragma once

#include "bench/canvas/BenchCanvas.h"
#include "bench/canvas/FrameCounters.h"

#include <benchmark/benchmark.h>

#include <optional>

namespace Moka::Bench {

// Creates and destroys an object with bare GL calls on the render thread.
template <class T>
class OnRenderThread {
public:
    template <class... Arguments>
    explicit OnRenderThread(Arguments... arguments) {
        CallBare([&] { mObject.emplace(arguments...); });
    }
    ~OnRenderThread() {
        CallBare([&] { mObject.reset(); });
    }
    OnRenderThread(OnRenderThread const&) = delete;
    OnRenderThread& operator=(OnRenderThread const&) = delete;

    T* operator->() { return &*mObject; }

private:
    std::optional<T> mObject;
};

template <class Ours, class Bare>
void Compare(benchmark::State& state, double things, Ours const& ours, Bare const& bare) {
    for (int i = 0; i < kWarmUpFrames; ++i) {
        MeasureFrame(ours);
        MeasureBareFrame(bare);
    }
    FrameCounters counters(state, things, 1e-9);
    bool oursFirst = false;
    for (auto _ : state) {
        oursFirst = !oursFirst;
        RenderCost const early = oursFirst ? RenderCost() : MeasureBareFrame(bare);
        counters.Add(MeasureFrame(ours));
        counters.AddBare(oursFirst ? MeasureBareFrame(bare) : early);
    }
}

} // namespace Moka::Bench
