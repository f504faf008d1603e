// The queues and the comparison of images that other tests believe in.
#include "tests/support/ImageCompare.h"
#include "tests/support/Queues.h"
#include "tests/support/TestImages.h"

#include <gmock/gmock.h>

#include <functional>
#include <new>
#include <set>
#include <stdexcept>
#include <vector>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;

// Runs a function; says when it is freed.
class FunctionTask final : public ITask {
public:
    FunctionTask(int* freed, std::function<void()> function)
        : mFreed(freed), mFunction(std::move(function)) {}
    ~FunctionTask() override { ++*mFreed; }
    void run() override { mFunction(); }

private:
    int* mFreed;
    std::function<void()> mFunction;
};

class HandPumpedQueueTest : public ::testing::Test {
protected:
    ITask* MakeTask(std::function<void()> function = [] {}) {
        return new (std::nothrow) FunctionTask(&mFreed, std::move(function));
    }

    int mFreed = 0;
    std::vector<int> mOrder;
};

TEST_F(HandPumpedQueueTest, RunsInPostingOrderAndFreesEachOnceAlsoWhatThrows) {
    int freedAfter = -1;
    HandPumpedQueue queue;
    queue.Post(MakeTask([&] {
        mOrder.push_back(1);
        queue.Post(MakeTask([&] { mOrder.push_back(3); }));
        queue.WaitForTasks(); // a deadlock elsewhere
        EXPECT_EQ(queue.GetPendingCount(), 2);
    }));
    queue.Post(nullptr);
    queue.Post(MakeTask([&] { mOrder.push_back(2); }));
    EXPECT_TRUE(queue.RunOne());
    EXPECT_EQ(mFreed, 1);
    queue.WaitForTasks();
    EXPECT_THAT(mOrder, ElementsAre(1, 2, 3));
    EXPECT_EQ(mFreed, 3);
    EXPECT_EQ(queue.GetPostedCount(), 3);
    EXPECT_EQ(queue.GetRunCount(), 3);
    EXPECT_EQ(queue.GetNullCount(), 1);
    EXPECT_EQ(queue.GetWaitCount(), 1);
    EXPECT_FALSE(queue.RunOne());

    queue.SetAroundRun([&] { mOrder.push_back(4); }, [&] { freedAfter = mFreed; });
    queue.Post(MakeTask([] { throw std::runtime_error("task"); }));
    EXPECT_THROW(queue.RunAll(), std::runtime_error);
    EXPECT_EQ(mOrder.back(), 4);
    EXPECT_EQ(freedAfter, 4);
}

TEST_F(HandPumpedQueueTest, TasksNeverRunAreFreedWithTheQueueAndRefusedOnesStayWithTheCaller) {
    ITask* const refused = MakeTask();
    {
        RefusingQueue queue(std::set<int>{2});
        EXPECT_TRUE(queue.Post(MakeTask([&] { mOrder.push_back(1); })));
        queue.Post(nullptr); // does not count as one of them
        EXPECT_FALSE(queue.Post(refused));
        EXPECT_TRUE(queue.Post(MakeTask([&] { mOrder.push_back(3); })));
        EXPECT_EQ(queue.GetRefusedCount(), 1);
        queue.RunOne();
    }
    EXPECT_THAT(mOrder, ElementsAre(1));
    EXPECT_EQ(mFreed, 2);
    EXPECT_FALSE(RefusingQueue().Post(refused));
    delete refused;
    EXPECT_EQ(mFreed, 3);
}

TEST(ImageCompareTest, ReportsHowManyHowFarAndWhere) {
    Picture const image = MakeGradient(10, 10);
    Picture changed = image;
    changed.At(3, 4)[3] = 155;
    changed.At(9, 9)[0] = 12;
    ImageDifference const difference = CompareImages(changed, image);
    EXPECT_EQ(difference.differingPixels, 2);
    EXPECT_EQ(difference.largest, 100);
    EXPECT_DOUBLE_EQ(difference.mean, 103.0 / 400);
    EXPECT_EQ(difference.firstX, 3);
    EXPECT_EQ(difference.firstY, 4);
    EXPECT_EQ(CompareImages(image, image).differingPixels, 0);
    EXPECT_EQ(CompareImages(image, MakeGradient(10, 9)).differingPixels, 100);
    Slack slack(10, 10);
    slack.Set(3, 4, 99);
    slack.Set(9, 9, 300); // anything
    EXPECT_EQ(CompareImages(changed, image, &slack).differingPixels, 1);
    slack.Set(3, 4, 100);
    EXPECT_EQ(CompareImages(changed, image, &slack).differingPixels, 0);
    EXPECT_EQ(slack.CountOver(100), 1);
}

} // namespace
} // namespace Moka::Testing
