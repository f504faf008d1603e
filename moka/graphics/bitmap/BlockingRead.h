// BlockingRead: the result of a blocking read, shared by the caller and the task. Both hold a reference, so a
// task that runs after the caller has returned does not write into memory of the caller, and a dropped task
// leaks nothing.
// Thread: the task calls Finish() on the render thread; the caller reads the result afterwards.
#pragma once

#include "moka/base/Check.h"
#include "moka/base/RefCount.h"
#include "moka/base/RefPtr.h"

#include <atomic>
#include <new>

namespace Moka::detail {

class BlockingRead final : public RefCount {
public:
    using Ptr = RefPtr<BlockingRead>;

    // Returns null if memory runs out; the read then has no result.
    static Ptr Make() { return Ptr::Adopt(new (std::nothrow) BlockingRead); }

    void Finish(unsigned int pixel) {
        mPixel.store(pixel, std::memory_order_relaxed);
        mIsFinished.store(true, std::memory_order_release);
    }

    // 0 until the read has run.
    static unsigned int GetPixel(Ptr const& read) {
        return read ? read->mPixel.load(std::memory_order_relaxed) : 0;
    }

    // Debug check: a read that runs after WaitForTasks might write to a destination that no longer exists.
    static void CheckFinished([[maybe_unused]] Ptr const& read, [[maybe_unused]] bool accepted) {
        MOKA_CHECK(!accepted || !read || read->mIsFinished.load(std::memory_order_acquire),
                   "WaitForTasks returned and the queue has not caught up with a read that it accepted");
    }

private:
    std::atomic<unsigned int> mPixel{0};
    std::atomic<bool> mIsFinished{false};
};

} // namespace Moka::detail
