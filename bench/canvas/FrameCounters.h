// FrameCounters: collects the costs of a benchmark's frames and reports them as counters: the medians of
// times, and the statistics of the last frame.
#pragma once

#include "bench/canvas/Frame.h"

#include <benchmark/benchmark.h>

#include <vector>

namespace Moka::Bench {

class FrameCounters {
public:
    // things is the number of items in a frame. Times are reported for each item, in this unit (in seconds).
    FrameCounters(benchmark::State& state, double things, double unit)
        : mState(state), mScale(1 / (things * unit)) {}
    ~FrameCounters() { Report(); }
    FrameCounters(FrameCounters const&) = delete;
    FrameCounters& operator=(FrameCounters const&) = delete;

    void Add(FrameCost const& cost);
    // Adds the cost of the same frame drawn by bare GL.
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
