// Frames: when frames began, when they were shown, which input they show, and what the render thread allocated for
// them: for the trace and --statistics.
// Thread: the window's; the moment of showing is taken on the render thread, which allocates nothing for it.
#pragma once

#include "moka/base/Trace.h"
#include "moka/host/RenderThread.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <vector>

namespace Moka::Notebook {

class Frames {
public:
    static constexpr std::size_t kMaxFrames = 100'000; // that are counted

    // notify is called on the render thread when a frame has been shown.
    Frames(RenderThread& queue, bool isCounting, std::function<void()> notify);

    // Input that the next frame shows; `age` in milliseconds. The oldest counts.
    void Mark(std::uint32_t age);
    void Begin() { mBegin = Trace::GetTime(); }
    // Right after Present.
    void End();
    // While it is, input is collected for the next frame: what is requested now would only wait.
    bool IsInFlight() const { return mIsInFlight; }
    // The milliseconds from Begin to the end of the swap. No frame is in flight.
    double GetLast() const { return mLast; }
    // Once the render thread has nothing more to do.
    void Print() const;

private:
    struct Shown {
        std::int64_t begin; // all in nanoseconds; input is 0 for none
        std::int64_t input;
        std::int64_t end;
        std::uint64_t allocations; // of the render thread, from its start on
    };
    void Finish(std::int64_t begin, std::int64_t input);

    RenderThread& mQueue;
    std::function<void()> const mNotify;
    std::atomic<bool> mIsInFlight{false};
    std::int64_t const mStart = Trace::GetTime();
    std::int64_t mBegin = 0;
    std::int64_t mInput = 0;
    double mLast = 0;
    std::vector<Shown> mShown; // the render thread's while it runs
};

} // namespace Moka::Notebook
