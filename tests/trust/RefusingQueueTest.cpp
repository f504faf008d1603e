// A queue that refuses at random. It does itself what a refused task was to do, so that nothing may be left, and
// what somebody else has done in the task's place shows as done twice.
#include "tests/support/Allocation.h"
#include "tests/support/LogCapture.h"
#include "tests/support/PumpedRenderer.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Scenarios.h"

#include <gtest/gtest.h>
#include <set>
#include <typeinfo>

namespace Moka::Testing {
namespace {

constexpr int kRuns = 480;
constexpr int kRunsBetweenLooks = 160;

// Thread: one, which stands for both sides.
class UnreliableQueue final : public PumpedRenderer {
public:
    explicit UnreliableQueue(int percent) : PumpedRenderer(kMaxTexture), mPercent(percent) {}

    // A task posted by a task is accepted: those that wait may come before it only in part.
    bool Post(ITask* task) override {
        if (mIsRunning || static_cast<int>(mRandom() % 100) >= mPercent) return HandPumpedQueue::Post(task);
        std::string const kind = typeid(*task).name();
        bool const hasVector = kind.find("vector") != std::string::npos;
        // The caller frees the rectangles of a refused batch, but not the reference for it.
        if (hasVector && kind.find("RectF") != std::string::npos) return HandPumpedQueue::Post(task);
        ++refused;
        kinds.insert(kind);
        Drain();
        if (!hasVector) {
            RendererTrace::DeclareRenderThread();
            mIsRunning = true;
            task->run();
            mIsRunning = false;
            RendererTrace::DeclareNoRenderThread();
        }
        Drain();
        return false;
    }
    void WaitForTasks() override { Drain(); }
    void Drain() {
        if (std::exchange(mIsRunning, true)) return;
        RunAll();
        mIsRunning = false;
    }

    int refused = 0;
    std::set<std::string> kinds;

private:
    std::mt19937 mRandom{7};
    int const mPercent;
    bool mIsRunning = false;
};

class RefusingQueueTest : public ::testing::TestWithParam<int> {};

TEST_P(RefusingQueueTest, WhatRefusedTasksWereToDoIsAllThatIsLeftBehind) {
    TempFolder const folder;
    ASSERT_TRUE(SaveImage(MakeAlphaPattern(20, 90), folder.Path("picture.png")));
    UnreliableQueue queue(GetParam());
    RendererTrace::KeepRecords(false);
    SetLogSink([](LogLine const&) {}); // each refusal is reported
    std::mt19937 random(11);
    Stage const stage{queue,
                      [&] {
                          if (random() % 2 == 0) queue.Drain();
                      },
                      folder.GetPath()};
    GetScenarios(); // which are made once and kept
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    for (int i = 1; i <= kRuns && !HasFailure(); ++i) {
        RunAnyScenario(stage, random);
        if (i % kRunsBetweenLooks != 0) continue;
        queue.Drain();
        EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
    }
    SetLogSink({});
    EXPECT_EQ(queue.GetPostedCount(), queue.GetRunCount());
    EXPECT_GE(queue.kinds.size(), 20u); // the work is mixed
    for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
    RecordProperty("refused", queue.refused);
}

INSTANTIATE_TEST_SUITE_P(PerCent, RefusingQueueTest, ::testing::Values(1, 10, 50));

} // namespace
} // namespace Moka::Testing
