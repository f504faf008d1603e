#include "bench/canvas/Frame.h"

#include "apps/notebook/AllocationCount.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"

#include <GLES3/gl3.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <future>
#include <memory>
#include <optional>
#include <string>

namespace Moka::Bench {
namespace {

double GetClockSeconds() {
    return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
}

double GetThreadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

// Measures the seconds between two calls.
class Lap {
public:
    explicit Lap(double (*now)()) : mNow(now), mStart(now()) {}

    double Take() {
        double const end = mNow();
        double const taken = end - mStart;
        mStart = end;
        return taken;
    }

private:
    double (*mNow)();
    double mStart;
};

// The tasks before and after those of a frame.
class FrameTasks {
public:
    void Hold() {
        mReached.set_value();
        mGate.get_future().wait();
        cost.before = RendererFactory::GetStatistics();
        mAllocations = CountAllocations();
        mWhole.emplace(GetClockSeconds);
        mPart.emplace(GetThreadSeconds);
    }

    void End() {
        cost.render.record = mPart->Take();
        RendererFactory::Flush();
        cost.render.play = mPart->Take();
        cost.allocations = CountAllocations() - mAllocations;
        Lap finish(GetClockSeconds);
        glFinish();
        cost.render.finish = finish.Take();
        cost.render.whole = mWhole->Take();
        cost.after = RendererFactory::GetStatistics();
        mDone.set_value();
    }

    void AwaitHold() { mReached.get_future().wait(); }
    void Open() { mGate.set_value(); }
    void AwaitEnd() { mDone.get_future().wait(); }

    FrameCost cost;

private:
    std::promise<void> mReached;
    std::promise<void> mGate;
    std::promise<void> mDone;
    std::uint64_t mAllocations = 0;
    std::optional<Lap> mWhole;
    std::optional<Lap> mPart;
};

std::unique_ptr<RenderThread>& GetRenderThreadSlot() {
    static std::unique_ptr<RenderThread> thread;
    return thread;
}

} // namespace

RenderThread& GetRenderThread() {
    std::unique_ptr<RenderThread>& thread = GetRenderThreadSlot();
    if (thread) return *thread;
    std::string error;
    thread = RenderThread::Start({}, &error);
    if (!thread) {
        std::fprintf(stderr, "%s\n", error.c_str());
        std::exit(1);
    }
    return *thread;
}

void StopRenderThread() { GetRenderThreadSlot().reset(); }

FrameCost MeasureFrame(std::function<void()> const& draw) {
    RenderThread& thread = GetRenderThread();
    FrameTasks tasks;
    WorkerTask::PostMember(&thread, &tasks, &FrameTasks::Hold);
    tasks.AwaitHold();
    Lap caller(GetThreadSeconds);
    draw();
    tasks.cost.caller = caller.Take();
    WorkerTask::PostMember(&thread, &tasks, &FrameTasks::End);
    tasks.Open();
    tasks.AwaitEnd();
    // The last task may still use the object.
    thread.WaitForTasks();
    return tasks.cost;
}

void CallBare(std::function<void()> const& function) {
    GetRenderThread().Call([&] {
        RendererFactory::Flush();
        function();
        RendererFactory::InvalidateState();
    });
}

RenderCost MeasureBareFrame(std::function<void()> const& draw) {
    RenderCost cost;
    CallBare([&] {
        glFinish();
        Lap whole(GetClockSeconds);
        Lap part(GetThreadSeconds);
        draw();
        cost.record = part.Take();
        Lap finish(GetClockSeconds);
        glFinish();
        cost.finish = finish.Take();
        cost.whole = whole.Take();
    });
    return cost;
}

} // namespace Moka::Bench
