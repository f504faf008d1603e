// Frame.h: what a frame costs, taken apart. The caller posts while the render thread is held by a task at the
// head of the queue; then the render thread runs alone.
// Units: seconds. CPU time of the thread that worked, so that other programs on the machine do not count;
//        only waiting for the GPU is on the clock.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <cstdint>
#include <functional>

namespace Moka {

class RenderThread;

} // namespace Moka

namespace Moka::Bench {

// Of the render thread.
struct RenderCost {
    double record = 0; // running the tasks; includes playing a list that was full
    double play = 0;   // the flush
    double finish = 0; // glFinish
    double whole = 0;  // all of it, by the clock

    double GetRender() const { return record + play; }
};

struct FrameCost {
    double caller = 0;
    RenderCost render;
    std::uint64_t allocations = 0; // on the render thread
    RendererStatistics before;
    RendererStatistics after;
};

// Made by the first call; StopRenderThread() ends it. A machine without a driver ends the process.
RenderThread& GetRenderThread();
void StopRenderThread();

// draw posts to the render thread, and must not wait for it.
FrameCost MeasureFrame(std::function<void()> const& draw);

// Runs function, which calls GL, on the render thread, and waits for it.
void CallBare(std::function<void()> const& function);

// draw is called as by CallBare.
RenderCost MeasureBareFrame(std::function<void()> const& draw);

} // namespace Moka::Bench
