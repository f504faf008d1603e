// Tasks: what they store, what they call, who frees them.
#include "moka/graphics/task/WorkerTask.h"

#include "moka/base/Rect.h"
#include "moka/base/RefCount.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "tests/support/Queues.h"

#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>
#include <string>

namespace Moka {
namespace {

using Testing::HandPumpedQueue;
using Testing::RefusingQueue;

// Counts its copies and the living ones.
struct Tracked {
    static inline int alive = 0;
    int generation = 0;
    Tracked() { ++alive; }
    Tracked(Tracked const& other) : generation(other.generation + 1) { ++alive; }
    Tracked& operator=(Tracked const&) = delete;
    ~Tracked() { --alive; }
};

struct Target {
    virtual ~Target() = default;
    virtual void Virtual(bool) { call = "base"; }
    void Out(unsigned int& result, Point const&) {
        result += 7;
        out = result;
    }
    int Returns() { return ++runs; }
    void ByValue(Tracked value) { generation = value.generation; }
    void Five(Rect const& a, float b, char const* c, Point const& d, bool e) {
        call = std::to_string(a.right) + std::to_string(static_cast<int>(b)) + c + std::to_string(d.y) +
               (e ? "t" : "f");
    }
    void Const() const noexcept { ++runs; }

    std::string call;
    unsigned int out = 0;
    int generation = 0;
    int mutable runs = 0;
};

struct Derived : Target {
    void Virtual(bool) override { call = "derived"; }
};

TEST(WorkerTask, CarriesCopiesOfItsArgumentsToAnyMember) {
    HandPumpedQueue queue;
    Derived target;
    Rect rect(1, 2, 3, 4);
    EXPECT_TRUE(WorkerTask::PostMember(&queue, &target, &Target::Five, rect, 2.0f, "x", Point(0, 3), true));
    rect = Rect();
    EXPECT_TRUE(target.call.empty());
    queue.RunAll();
    EXPECT_EQ(target.call, "32x3t");
    WorkerTask::PostMember(&queue, static_cast<Target*>(&target), &Target::Virtual, true);
    WorkerTask::PostMember(&queue, &target, &Target::Returns);
    WorkerTask::PostMember(&queue, &target, &Target::Const);
    queue.RunAll();
    EXPECT_EQ(target.call, "derived");
    EXPECT_EQ(target.runs, 2);

    unsigned int mine = 5; // an out-parameter is the task's own
    WorkerTask::PostMember(&queue, &target, &Target::Out, mine, Point(1, 1));
    queue.RunAll();
    EXPECT_EQ(target.out, 12u) << "the stored copy starts with the value given";
    EXPECT_EQ(mine, 5u) << "what the function wrote is lost with the task";
}

TEST(WorkerTask, AByValueParameterGetsAFreshCopyAndTheStoredOneDiesWithTheTask) {
    Target target;
    {
        HandPumpedQueue queue;
        Tracked value;
        WorkerTask::PostMember(&queue, &target, &Target::ByValue, value);
        EXPECT_EQ(Tracked::alive, 2);
        queue.RunAll();
        EXPECT_EQ(target.generation, 2);
        EXPECT_EQ(Tracked::alive, 1);
        WorkerTask::PostMember(&queue, &target, &Target::ByValue, value); // freed with the queue, never run
    }
    EXPECT_EQ(Tracked::alive, 0);
}

TEST(WorkerTask, ARefusedTaskIsFreedAndNeverRuns) {
    RefusingQueue queue;
    Target target;
    {
        Tracked const value;
        EXPECT_FALSE(WorkerTask::PostMember(&queue, &target, &Target::ByValue, value));
    }
    EXPECT_EQ(Tracked::alive, 0);
    EXPECT_EQ(target.generation, 0);
    EXPECT_EQ(queue.GetRefusedCount(), 1);
}

struct Mortal {
    static inline int deleted = 0;
    virtual ~Mortal() { ++deleted; }
};

TEST(WorkerTask, DeletionsHappenWhenRunAndOnlyThen) {
    Mortal::deleted = 0;
    Mortal stays;
    {
        HandPumpedQueue queue;
        WorkerTask::PostDelete(&queue, new Mortal);
        WorkerTask::PostDelete(&queue, static_cast<Mortal*>(nullptr));
        WorkerTask::PostDeleteArray(&queue, static_cast<unsigned char const*>(new unsigned char[16]));
        WorkerTask::PostDeleteArray(&queue, static_cast<unsigned char const*>(nullptr));
        EXPECT_EQ(Mortal::deleted, 0);
        queue.RunAll();
        EXPECT_EQ(Mortal::deleted, 1);
        WorkerTask::PostDelete(&queue, &stays); // never run
    }
    EXPECT_EQ(Mortal::deleted, 1) << "a task that never ran leaves its object alive";
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
