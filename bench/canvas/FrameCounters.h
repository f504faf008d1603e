// FrameCounters: gathers the costs of a benchmark's frames and reports them as counters: medians of times,
// and what the last frame did.
#pragma once

#include "bench/canvas/Frame.h"

#include <benchmark/benchmark.h>

#include <vector>

namespace Moka::Bench {

class FrameCounters {
public:
    // A frame of so many things of a kind; times are reported for each of them, in units of a second.
    FrameCounters(benchmark::State& state, double things, double unit)
        : mState(state), mScale(1 / (things * unit)) {}
    ~FrameCounters() { Report(); }
    FrameCounters(FrameCounters const&) = delete;
    FrameCounters& operator=(FrameCounters const&) = delete;

    void Add(FrameCost const& cost);
    // The same frame drawn by bare GL, right before or after.
    void AddBare(RenderCost const& bare);

private:
    void Report();
    void ReportStatistics();
    void ReportTime(char const* name, std::vector<double>& seconds);

    benchmark::State& mState;
    double mScale;
    FrameCost mLast;
    std::vector<double> mCaller;
    std::vector<double> mRecord;
    std::vector<double> mRender;
    std::vector<double> mFinish;
    std::vector<double> mBareRender;
    std::vector<double> mRenderRatio;
    std::vector<double> mWholeRatio;
};

} // namespace Moka::Bench
