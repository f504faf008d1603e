// Frame.h: measures the cost of a frame by phase. The caller posts while a task holds the render thread; then
// the render thread runs alone.
// Units: seconds of the working thread's CPU time, so that other programs on the machine do not count. Only
//        waiting for the GPU is wall-clock time.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <cstdint>
#include <functional>

namespace Moka {

class RenderThread;

} // namespace Moka

namespace Moka::Bench {

// The costs on the render thread.
struct RenderCost {
    double record = 0; // running the tasks, including flushes of full lists
    double play = 0;   // the flush at the end
    double finish = 0; // glFinish
    double whole = 0;  // the whole frame, in wall-clock time

    double GetRender() const { return record + play; }
};

struct FrameCost {
    double caller = 0;
    RenderCost render;
    std::uint64_t allocations = 0; // on the render thread
    RendererStatistics before;
    RendererStatistics after;
};

// The first call starts the thread; StopRenderThread() ends it. Without a driver the process ends.
RenderThread& GetRenderThread();
void StopRenderThread();

// draw posts to the render thread, and must not wait for it.
FrameCost MeasureFrame(std::function<void()> const& draw);

// Runs function, which calls GL, on the render thread, and waits for it.
void CallBare(std::function<void()> const& function);

// Measures draw, which is called as by CallBare.
RenderCost MeasureBareFrame(std::function<void()> const& draw);

} // namespace Moka::Bench
