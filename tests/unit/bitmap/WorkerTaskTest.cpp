// Tasks: what they store, what they call, who frees them.
#include "moka/graphics/task/WorkerTask.h"

#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "tests/support/Queues.h"

#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>

namespace Moka {
namespace {

using Testing::RefusingQueue;

// Counts the living ones, copies among them.
struct Tracked {
    static inline int alive = 0;
    Tracked() { ++alive; }
    Tracked(Tracked const&) { ++alive; }
    Tracked& operator=(Tracked const&) = delete;
    ~Tracked() { --alive; }
};

struct Target {
    void ByValue(Tracked) { ++runs; }
    int runs = 0;
};

TEST(WorkerTask, ARefusedTaskIsFreedAndNeverRuns) {
    RefusingQueue queue;
    Target target;
    {
        Tracked const value;
        EXPECT_FALSE(WorkerTask::PostMember(&queue, &target, &Target::ByValue, value));
    }
    EXPECT_EQ(Tracked::alive, 0);
    EXPECT_EQ(target.runs, 0);
    EXPECT_EQ(queue.GetRefusedCount(), 1);
}

// Where a virtual function stands in its table: in the Itanium ABI a pointer to one holds its offset plus
// one.
template <class F>
std::size_t SlotOf(F function) {
    static_assert(sizeof(function) == 2 * sizeof(std::uintptr_t));
    std::uintptr_t words[2];
    std::memcpy(words, &function, sizeof words);
#if defined(__aarch64__)
    return words[0] / sizeof(void*);
#else
    return (words[0] - 1) / sizeof(void*);
#endif
}

TEST(VirtualOrder, CallersFindEachFunctionInItsSlot) {
    EXPECT_EQ(SlotOf(&IGLMsgQueue::Post), 2u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::WaitForTasks), 3u);
    EXPECT_EQ(SlotOf(&ITask::run), 2u);
    EXPECT_EQ(SlotOf(&ITask::isGlobalLockAllowed), 3u);
    EXPECT_EQ(SlotOf(&IRendererDeviceCaps::GetMaxTextureSize), 2u);
    using T = IRenderTarget;
    std::size_t const slots[] = {
        SlotOf(&T::Activate),           SlotOf(&T::Deactivate),
        SlotOf(&T::ReadPixels),         SlotOf(&T::Release),
        SlotOf(&T::ClearColor),         SlotOf(&T::AttachDepthStencil),
        SlotOf(&T::DetachDepthStencil), SlotOf(&T::ClearDepthStencil),
    };
    for (std::size_t i = 0; i < 8; ++i) EXPECT_EQ(slots[i], i);
}

} // namespace
} // namespace Moka
