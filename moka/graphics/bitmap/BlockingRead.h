// BlockingRead: what a caller that waits for a read shares with the task that reads. It belongs to both, so a
// task that runs after the caller has gone on writes into nothing of the caller's, and one that is dropped
// leaves nothing behind.
// Thread: the task finishes it on the render thread, the caller looks at it afterwards.
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

    // Null when memory runs out: the read then has no result.
    static Ptr Make() { return Ptr::Adopt(new (std::nothrow) BlockingRead); }

    void Finish(unsigned int pixel) {
        mPixel.store(pixel, std::memory_order_relaxed);
        mIsFinished.store(true, std::memory_order_release);
    }

    // 0 while the read has not run.
    static unsigned int GetPixel(Ptr const& read) {
        return read ? read->mPixel.load(std::memory_order_relaxed) : 0;
    }

    // The caller's destination may be gone when a late read writes there.
    static void CheckFinished([[maybe_unused]] Ptr const& read, [[maybe_unused]] bool accepted) {
        MOKA_CHECK(!accepted || !read || read->mIsFinished.load(std::memory_order_acquire),
                   "WaitForTasks returned and the queue has not caught up with a read that it accepted");
    }

private:
    std::atomic<unsigned int> mPixel{0};
    std::atomic<bool> mIsFinished{false};
};

} // namespace Moka::detail
