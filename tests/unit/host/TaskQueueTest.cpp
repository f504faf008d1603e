#include "moka/host/TaskQueue.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/task/ITask.h"
#include "tests/support/Awaited.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>

#include <atomic>
#include <functional>
#include <future>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

// A queue whose thread starts and stops when the test says so.
class QueueThread final : public TaskQueue {
public:
    ~QueueThread() override { Stop(); }

    void Start() {
        mThread = std::thread([this] { Run({}); });
    }
    void Stop() {
        RequestStop();
        if (mThread.joinable()) mThread.join();
    }

    using TaskQueue::RequestStop;

private:
    std::thread mThread;
};

// Calls a function when run; counts the tasks that are alive.
class FunctionTask final : public ITask {
public:
    explicit FunctionTask(std::function<void()> function) : mFunction(std::move(function)) { ++sAlive; }
    ~FunctionTask() override { --sAlive; }
    void run() override { mFunction(); }

    static int CountAlive() { return sAlive; }

private:
    std::function<void()> mFunction;
    inline static std::atomic<int> sAlive{0};
};

FunctionTask* MakeTask(std::function<void()> function) {
    return new (std::nothrow) FunctionTask(std::move(function));
}

class TaskQueueTest : public testing::Test {
protected:
    void TearDown() override { EXPECT_EQ(FunctionTask::CountAlive(), 0); }

    LogCapture log;
};

TEST_F(TaskQueueTest, RunsEachProducersTasksInOrderAndWaitingSeesThem) {
    constexpr int kProducers = 8;
    QueueThread queue;
    queue.Start();
    std::vector<std::thread> producers;
    for (int p = 0; p < kProducers; ++p) {
        producers.emplace_back([&queue] {
            std::vector<int> seen; // the wait is what makes it ours again
            std::vector<int> expected;
            for (int i = 0; i < 600; ++i) {
                EXPECT_TRUE(queue.Post(MakeTask([&seen, i] { seen.push_back(i); })));
                expected.push_back(i);
                // Now and then the consumer gets to sleep, so that posts meet it falling asleep.
                if (i % 3 != 0) continue;
                queue.WaitForTasks();
                ASSERT_EQ(seen.size(), expected.size());
            }
            queue.WaitForTasks();
            EXPECT_EQ(seen, expected);
        });
    }
    for (std::thread& producer : producers) producer.join();
}

TEST_F(TaskQueueTest, StoppingRunsWhatTasksPostAndThenRefuses) {
    int chain = 0;
    std::unique_ptr<QueueThread> queue = std::make_unique<QueueThread>();
    std::function<void()> const link = [&] {
        if (++chain == 1000) return;
        EXPECT_TRUE(queue->Post(MakeTask(link)));
    };
    queue->Post(MakeTask(link));
    queue->RequestStop();
    queue->Start();
    queue->Stop();
    EXPECT_EQ(chain, 1000);

    // The refused task still belongs to us; freeing it here is the only time it is freed.
    std::unique_ptr<FunctionTask> refused(MakeTask([&chain] { ++chain; }));
    EXPECT_FALSE(queue->Post(refused.get()));
    queue->WaitForTasks();
    queue.reset();
    EXPECT_EQ(FunctionTask::CountAlive(), 1);
    EXPECT_EQ(chain, 1000);
}

TEST_F(TaskQueueTest, RunsOrRefusesEveryTaskThatRacesWithStop) {
    for (int round = 0; round < 20; ++round) {
        std::atomic<int> accepted{0};
        Awaited<int> ran;
        QueueThread queue;
        queue.Start();
        std::vector<std::thread> producers;
        for (int p = 0; p < 4; ++p) {
            producers.emplace_back([&] {
                // Few enough at a time that the queue runs empty now and then, and so can stop.
                for (int i = 0;; ++i) {
                    std::unique_ptr<FunctionTask> task(MakeTask([&ran] { ++ran; }));
                    if (!queue.Post(task.get())) return;
                    static_cast<void>(task.release());
                    ++accepted;
                    if (i % 3 == 2) queue.WaitForTasks();
                }
            });
        }
        ran.AwaitAtLeast(20);
        queue.Stop();
        for (std::thread& producer : producers) producer.join();
        EXPECT_EQ(ran.Get(), accepted);
    }
}

TEST_F(TaskQueueTest, DestructionFreesWhatNobodyRanAndLetsWaitersGo) {
    bool ran = false;
    for (int round = 0; round < 10; ++round) {
        auto queue = std::make_unique<QueueThread>();
        EXPECT_FALSE(queue->Post(nullptr));
        queue->WaitForTasks(); // nothing was posted, so nobody need run
        for (int i = 0; i < 10; ++i) queue->Post(MakeTask([&ran] { ran = true; }));
        Awaited<int> started;
        std::vector<std::thread> waiters;
        for (int i = 0; i < 4; ++i) {
            waiters.emplace_back([&started, &queue = *queue] {
                ++started;
                queue.WaitForTasks();
            });
        }
        started.AwaitAtLeast(4);
        // Long enough for the four to be inside; the test passes when they are not, and then shows less.
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
        queue.reset();
        for (std::thread& waiter : waiters) waiter.join();
    }
    EXPECT_FALSE(ran);
}

TEST_F(TaskQueueTest, WaitingDoesNotAwaitWhatWasPostedAfter) {
    QueueThread queue; // starts once all is posted, and takes it over in one list
    queue.Post(MakeTask([] {}));
    std::promise<void> waited;
    std::thread waiter([&] {
        queue.WaitForTasks();
        waited.set_value();
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(200)); // it is inside by now
    bool inTime = false;
    queue.Post(MakeTask([&] {
        inTime = waited.get_future().wait_for(std::chrono::seconds(30)) == std::future_status::ready;
    }));
    std::thread later([&queue] { queue.WaitForTasks(); }); // for more than the first, which it must not delay
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    queue.Start();
    waiter.join();
    later.join();
    queue.Stop();
    EXPECT_TRUE(inTime);
}

TEST_F(TaskQueueTest, WaitingEndsWhenTheTaskIsFreed) {
    QueueThread queue;
    queue.Start();
    bool gone = false;
    // What a task owns goes with it.
    std::shared_ptr<void> owned(nullptr, [&gone](void*) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        gone = true;
    });
    queue.Post(MakeTask([owned = std::move(owned)] {}));
    queue.WaitForTasks();
    EXPECT_TRUE(gone);
}

TEST_F(TaskQueueTest, GoesOnAfterAnExceptionAndAWaitInsideATask) {
    QueueThread queue;
    queue.Start();
    bool ran = false;
    queue.Post(MakeTask([] { throw std::runtime_error("out of paper"); }));
    queue.Post(MakeTask([] { throw 7; }));
    queue.Post(MakeTask([&queue] { queue.WaitForTasks(); }));
    queue.Post(MakeTask([&ran] { ran = true; }));
    queue.WaitForTasks();
    EXPECT_TRUE(ran);
    queue.Stop();
    queue.WaitForTasks(); // ended: nothing to wait for, nothing to say
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                ElementsAre(HasSubstr("out of paper"), HasSubstr("threw"), HasSubstr("WaitForTasks")));
}

} // namespace
} // namespace Moka::Testing
