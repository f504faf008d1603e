// Frames: records for each frame when it began, when it was shown, the age of its input, and the allocations of the
// render thread. The trace and --statistics use the records.
// Thread: the window's. A task on the render thread reads the time at which a frame is shown; it does not allocate.
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
    static constexpr std::size_t kMaxFrames = 100'000; // later frames are not recorded

    // notify is called on the render thread when a frame has been shown.
    Frames(RenderThread& queue, bool isCounting, std::function<void()> notify);

    // Records input that the next frame shows, `age` milliseconds old. The oldest input counts.
    void Mark(std::uint32_t age);
    void Begin() { mBegin = Trace::GetTime(); }
    // Call this directly after Present.
    void End();
    // While a frame is in flight, the window collects input for the next one: a frame requested now would wait.
    bool IsInFlight() const { return mIsInFlight; }
    // The milliseconds from Begin to the end of the swap. Call this only while no frame is in flight.
    double GetLast() const { return mLast; }
    // Call this when the render thread has no more tasks.
    void Print() const;

private:
    struct Shown {
        std::int64_t begin; // all in nanoseconds; input is 0 for none
        std::int64_t input;
        std::int64_t end;
        std::uint64_t allocations; // of the render thread since its start
    };
    void Finish(std::int64_t begin, std::int64_t input);

    RenderThread& mQueue;
    std::function<void()> const mNotify;
    std::atomic<bool> mIsInFlight{false};
    std::int64_t const mStart = Trace::GetTime();
    std::int64_t mBegin = 0;
    std::int64_t mInput = 0;
    double mLast = 0;
    std::vector<Shown> mShown; // only the render thread uses it while that runs
};

} // namespace Moka::Notebook
