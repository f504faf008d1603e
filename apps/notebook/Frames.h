// Frames: when frames began, when they were shown, and which input they show: for the trace and --statistics.
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
    // Once the render thread has nothing more to do.
    void Print() const;

private:
    struct Shown {
        std::int64_t begin; // all in nanoseconds; input is 0 for none
        std::int64_t input;
        std::int64_t end;
    };
    void Finish(std::int64_t begin, std::int64_t input);
    static void PrintTimes(char const* what, std::vector<double> times);

    RenderThread& mQueue;
    std::function<void()> const mNotify;
    std::atomic<bool> mIsInFlight{false};
    std::int64_t const mStart = Trace::GetTime();
    std::int64_t mBegin = 0;
    std::int64_t mInput = 0;
    std::vector<Shown> mShown; // the render thread's while it runs
};

} // namespace Moka::Notebook
