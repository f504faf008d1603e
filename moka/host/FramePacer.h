// FramePacer: holds back whoever presents faster than the window shows, so that only so many frames wait.
// Thread: any.
#pragma once

#include "moka/base/Trace.h"

#include <condition_variable>
#include <mutex>

namespace Moka::detail {

class FramePacer {
public:
    explicit FramePacer(int framesInFlight) : mLimit(framesInFlight) {}

    // Counts a frame, once there is room for it. Without waiting there may be one too many.
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
