// FramePacer: makes a thread wait that presents faster than the window shows frames, to limit the frames in
// flight.
// Thread: any.
#pragma once

#include "moka/base/Trace.h"

#include <condition_variable>
#include <mutex>

namespace Moka::detail {

class FramePacer {
public:
    explicit FramePacer(int framesInFlight) : mLimit(framesInFlight) {}

    // Counts a frame, after waiting until fewer than framesInFlight are counted. If mayWait is false, the
    // limit may be exceeded.
    void Enter(bool mayWait) {
        std::unique_lock<std::mutex> lock(mMutex);
        if (mayWait && mFrames >= mLimit) Wait(lock);
        ++mFrames;
    }
    void Leave() {
        std::lock_guard<std::mutex> const lock(mMutex);
        --mFrames;
        mChanged.notify_all();
    }

private:
    void Wait(std::unique_lock<std::mutex>& lock) {
        TraceScope const trace("wait", "Present");
        mChanged.wait(lock, [this] { return mFrames < mLimit; });
    }

    int const mLimit;
    std::mutex mMutex;
    std::condition_variable mChanged;
    int mFrames = 0;
};

} // namespace Moka::detail
