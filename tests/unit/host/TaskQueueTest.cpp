#include "moka/base/log/AndroidLog.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/host/QueueThread.h"

#include <gmock/gmock.h>

#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class TaskQueueTest : public testing::Test {
protected:
    void TearDown() override { EXPECT_EQ(FunctionTask::CountAlive(), 0); }

    std::vector<std::string> GetErrors() const { return mLog.GetTexts(ANDROID_LOG_ERROR); }

    LogCapture mLog;
};

TEST_F(TaskQueueTest, RunsEachProducersTasksOnceAndInOrder) {
    constexpr int kProducers = 8;
    constexpr int kTasks = 4000;
    std::vector<std::vector<int>> seen(kProducers);
    QueueThread queue;
    queue.Start();
    std::vector<std::thread> producers;
    for (int p = 0; p < kProducers; ++p) {
        producers.emplace_back([&queue, &mine = seen[static_cast<std::size_t>(p)]] {
            for (int i = 0; i < kTasks; ++i) {
                EXPECT_TRUE(queue.Post(MakeTask([&mine, i] { mine.push_back(i); })));
                // Now and then the consumer gets to sleep, so that posts meet it falling asleep.
                if (i % 500 == 0) queue.WaitForTasks();
            }
        });
    }
    for (std::thread& producer : producers) producer.join();
    queue.WaitForTasks();

    std::vector<int> expected(kTasks);
    for (int i = 0; i < kTasks; ++i) expected[static_cast<std::size_t>(i)] = i;
    for (std::vector<int> const& one : seen) EXPECT_EQ(one, expected);
}

TEST_F(TaskQueueTest, WakesForASinglePostEachTime) {
    QueueThread queue;
    queue.Start();
    for (int i = 0; i < 2000; ++i) {
        std::promise<void> ran;
        queue.Post(MakeTask([&ran] { ran.set_value(); }));
        ASSERT_EQ(ran.get_future().wait_for(std::chrono::seconds(30)), std::future_status::ready) << i;
        queue.WaitForTasks(); // the promise may not die while it is being set
    }
}

TEST_F(TaskQueueTest, IgnoresNull) {
    QueueThread queue;
    EXPECT_FALSE(queue.Post(nullptr));
    queue.WaitForTasks(); // nothing was posted, so nobody need run
}

TEST_F(TaskQueueTest, CallsIdleAfterTheQueueHasRunEmptyAndTakesWhatThatPosts) {
    std::vector<std::string> events;
    QueueThread queue;
    auto const log = [&events](char const* what) {
        return MakeTask([&events, what] { events.push_back(what); });
    };
    queue.Post(log("first"));
    queue.Post(MakeTask([&] {
        events.push_back("second");
        queue.Post(log("posted by second"));
    }));
    queue.RequestStop();
    queue.Run([&, posted = false]() mutable {
        events.push_back("idle");
        if (!std::exchange(posted, true)) queue.Post(log("posted by idle"));
    });
    EXPECT_THAT(events, ElementsAre("first", "second", "posted by second", "idle", "posted by idle", "idle"));
}

TEST_F(TaskQueueTest, StoppingRunsWhatTasksPostAndThenRefuses) {
    int chain = 0;
    std::unique_ptr<QueueThread> queue = std::make_unique<QueueThread>();
    std::function<void()> const link = [&] {
        if (++chain == 1000) return;
        EXPECT_TRUE(queue->Post(MakeTask(link)));
    };
    queue->Start();
    Gate gate(*queue);
    queue->Post(MakeTask(link));
    gate.AwaitEntered();
    queue->RequestStop();
    gate.Open();
    queue->Stop();
    EXPECT_EQ(chain, 1000);

    // The refused task still belongs to us; freeing it here is the only time it is freed.
    bool ran = false;
    std::unique_ptr<FunctionTask> refused(MakeTask([&ran] { ran = true; }));
    EXPECT_FALSE(queue->Post(refused.get()));
    EXPECT_EQ(FunctionTask::CountAlive(), 1);
    queue->WaitForTasks();
    queue->Stop();
    queue.reset();
    EXPECT_EQ(FunctionTask::CountAlive(), 1);
    EXPECT_FALSE(ran);
}

TEST_F(TaskQueueTest, RunsOrRefusesEveryTaskThatRacesWithStop) {
    for (int round = 0; round < 20; ++round) {
        std::atomic<int> accepted{0};
        std::atomic<int> ran{0};
        QueueThread queue;
        queue.Start();
        std::vector<std::thread> producers;
        for (int p = 0; p < 4; ++p) {
            producers.emplace_back([&] {
                // Few enough at a time that the queue runs empty now and then, and so can stop.
                for (int i = 0;; ++i) {
                    std::unique_ptr<FunctionTask> task(MakeTask([&ran] { ++ran; }));
                    if (!queue.Post(task.get())) return;
                    task.release();
                    ++accepted;
                    if (i % 3 == 2) queue.WaitForTasks();
                }
            });
        }
        while (ran < 20) std::this_thread::yield();
        queue.Stop();
        for (std::thread& producer : producers) producer.join();
        EXPECT_EQ(ran, accepted);
        EXPECT_EQ(FunctionTask::CountAlive(), 0);
    }
}

TEST_F(TaskQueueTest, FreesTasksThatNobodyRan) {
    bool ran = false;
    {
        QueueThread queue;
        for (int i = 0; i < 10; ++i) queue.Post(MakeTask([&ran] { ran = true; }));
        EXPECT_EQ(FunctionTask::CountAlive(), 10);
    }
    EXPECT_EQ(FunctionTask::CountAlive(), 0);
    EXPECT_FALSE(ran);
}

TEST_F(TaskQueueTest, DestructionLetsWaitersGo) {
    auto queue = std::make_unique<QueueThread>();
    queue->Post(MakeTask([] {}));
    std::atomic<int> started{0};
    std::vector<std::thread> waiters;
    for (int i = 0; i < 4; ++i) {
        waiters.emplace_back([&started, &queue = *queue] {
            ++started;
            queue.WaitForTasks();
        });
    }
    while (started < 4) std::this_thread::yield();
    // Long enough for the four to be inside; the test passes when they are not, and then shows less.
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    queue.reset();
    for (std::thread& waiter : waiters) waiter.join();
}

TEST_F(TaskQueueTest, WaitingSeesAllThatWasPostedBefore) {
    QueueThread queue;
    queue.Start();
    std::vector<std::thread> callers;
    for (int c = 0; c < 4; ++c) {
        callers.emplace_back([&queue] {
            int value = 0; // plain: the wait is what makes it ours again
            for (int i = 1; i <= 2000; ++i) {
                queue.Post(MakeTask([&value] { ++value; }));
                if (i % 3 == 0) {
                    queue.WaitForTasks();
                    ASSERT_EQ(value, i);
                }
            }
            queue.WaitForTasks();
        });
    }
    for (std::thread& caller : callers) caller.join();
}

TEST_F(TaskQueueTest, WaitingDoesNotAwaitWhatWasPostedAfter) {
    QueueThread queue;
    Gate first(queue);
    queue.Start();
    first.AwaitEntered();
    std::promise<void> waited;
    // Taken over in one list with what follows it.
    queue.Post(MakeTask([] {}));
    std::promise<void> started;
    std::thread waiter([&] {
        started.set_value();
        queue.WaitForTasks();
        waited.set_value();
    });
    started.get_future().wait();
    std::this_thread::sleep_for(std::chrono::milliseconds(200)); // it is inside by now
    bool inTime = false;
    queue.Post(MakeTask([&] {
        inTime = waited.get_future().wait_for(std::chrono::seconds(30)) == std::future_status::ready;
    }));
    first.Open();
    waiter.join();
    queue.Stop();
    EXPECT_TRUE(inTime);
}

TEST_F(TaskQueueTest, WaitingOnTheConsumerThreadLogsAndReturns) {
    QueueThread queue;
    queue.Start();
    queue.Post(MakeTask([&queue] { queue.WaitForTasks(); }));
    queue.Stop();
    EXPECT_THAT(GetErrors(), ElementsAre(HasSubstr("WaitForTasks")));
    queue.WaitForTasks(); // ended: nothing to wait for, nothing to say
    EXPECT_EQ(GetErrors().size(), 1u);
}

TEST_F(TaskQueueTest, GoesOnAfterAnException) {
    QueueThread queue;
    queue.Start();
    bool ran = false;
    queue.Post(MakeTask([] { throw std::runtime_error("out of paper"); }));
    queue.Post(MakeTask([] { throw 7; }));
    queue.Post(MakeTask([&ran] { ran = true; }));
    queue.WaitForTasks();
    EXPECT_TRUE(ran);
    EXPECT_EQ(FunctionTask::CountAlive(), 0);
    queue.Stop();
    EXPECT_THAT(GetErrors(), ElementsAre(HasSubstr("out of paper"), HasSubstr("threw")));
}

// A task that posts and waits when it dies, as one that owns a bitmap may.
class TalkativeTask final : public ITask {
public:
    explicit TalkativeTask(TaskQueue& queue) : mQueue(queue) {}
    ~TalkativeTask() override {
        ITask* const task = MakeTask([] {});
        if (!mQueue.Post(task)) delete task;
        mQueue.WaitForTasks();
    }
    void run() override {}

private:
    TaskQueue& mQueue;
};

TEST_F(TaskQueueTest, HoldsNoLockWhileATaskIsFreed) {
    {
        QueueThread queue;
        queue.Start();
        queue.Post(new (std::nothrow) TalkativeTask(queue));
        queue.Stop();
    }
    QueueThread neverRun;
    neverRun.Post(new (std::nothrow) TalkativeTask(neverRun));
}

} // namespace
} // namespace Moka::Testing
