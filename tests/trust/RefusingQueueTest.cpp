// A queue that refuses at random. It does itself what a refused task was to do, so that nothing may be left, and
// what somebody else has done in the task's place shows as done twice.
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/Queues.h"
#include "tests/support/RendererTrace.h"
#include "tests/trust/Faults.h"
#include "tests/trust/MixedWork.h"

#include <gtest/gtest.h>
#include <random>
#include <set>
#include <string>
#include <typeinfo>

namespace Moka::Testing {
namespace {

constexpr std::int64_t kPosts = 60000;
constexpr std::int64_t kPostsBetweenLooks = 20000;

// Thread: one, which stands for both sides.
class UnreliableQueue final : public IGLMsgQueue {
public:
    UnreliableQueue(unsigned seed, int percent) : mRandom(seed), mPercent(percent) {}

    // A task posted by a task is accepted: those that wait may come before it only in part.
    bool Post(ITask* task) override {
        if (mIsRunning || static_cast<int>(mRandom() % 100) >= mPercent) return mTasks.Post(task);
        std::string const kind = typeid(*task).name();
        // The caller frees the rectangles of a refused batch, but not the reference for it.
        if (kind.find("RectF") != std::string::npos && kind.find("vector") != std::string::npos)
            return mTasks.Post(task);
        ++refused;
        kinds.insert(kind);
        RunAll();
        if (kind.find("vector") == std::string::npos) Run([task] { task->run(); });
        RunAll();
        return false;
    }
    void WaitForTasks() override { RunAll(); }

    void RunAll() {
        Run([this] { mTasks.RunAll(); });
    }
    HandPumpedQueue const& GetTasks() const { return mTasks; }

    std::int64_t refused = 0;
    std::set<std::string> kinds;

private:
    template <class Action>
    void Run(Action const& action) {
        if (mIsRunning) return;
        mIsRunning = true;
        RendererTrace::DeclareRenderThread();
        action();
        RendererTrace::DeclareNoRenderThread();
        mIsRunning = false;
    }

    HandPumpedQueue mTasks;
    std::mt19937 mRandom;
    int const mPercent;
    bool mIsRunning = false;
};

class RefusingQueueTest : public ::testing::TestWithParam<int> {};

TEST_P(RefusingQueueTest, WhatRefusedTasksWereToDoIsAllThatIsLeftBehind) {
    RendererTrace::Reset();
    RendererTrace::KeepRecords(false);
    RendererTrace::SetMaxTextureSize(MixedWork::kSide);
    ASSERT_TRUE(RendererFactory::AttachContext());
    RendererTrace::DeclareNoRenderThread();
    UnreliableQueue queue(7, GetParam());
    LogCapture log;
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    auto const countOffered = [&] { return queue.GetTasks().GetPostedCount() + queue.refused; };
    {
        MixedWork work(queue, 11, nullptr);
        while (countOffered() < kPosts && !HasFailure()) {
            std::int64_t const end = countOffered() + kPostsBetweenLooks;
            while (countOffered() < end) {
                work.Step();
                if (countOffered() % 3 == 0) queue.RunAll();
                log.Clear();
            }
            work.DropAll();
            queue.RunAll();
            EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
        }
    }
    EXPECT_EQ(queue.GetTasks().GetPostedCount(), queue.GetTasks().GetRunCount());
    EXPECT_EQ(queue.GetTasks().GetNullCount(), 0);
    EXPECT_EQ(Faults::CountWrongFrees(), 0);
    EXPECT_GE(queue.kinds.size(), 25u); // the work is mixed
    for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
    RecordProperty("refused", static_cast<int>(queue.refused));
    RendererTrace::DeclareRenderThread();
    RendererFactory::DetachContext();
}

INSTANTIATE_TEST_SUITE_P(PerCent, RefusingQueueTest, ::testing::Values(1, 10, 50));

} // namespace
} // namespace Moka::Testing
