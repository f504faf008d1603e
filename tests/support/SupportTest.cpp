// The queues, the log capture and the image helpers that other tests believe in.
#include "moka/base/log/AndroidLog.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"
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

TEST_F(HandPumpedQueueTest, RunsInPostingOrderAndFreesEachOnce) {
    HandPumpedQueue queue;
    queue.Post(MakeTask([&] {
        mOrder.push_back(1);
        queue.Post(MakeTask([&] { mOrder.push_back(3); }));
    }));
    queue.Post(nullptr);
    queue.Post(MakeTask([&] { mOrder.push_back(2); }));
    EXPECT_TRUE(mOrder.empty());
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
}

TEST_F(HandPumpedQueueTest, AWaitInsideATaskRunsNothingAndIsCountedApart) {
    HandPumpedQueue queue;
    queue.Post(MakeTask([&] {
        queue.WaitForTasks();
        EXPECT_EQ(queue.GetPendingCount(), 1);
    }));
    queue.Post(MakeTask());
    EXPECT_EQ(queue.RunAll(), 2);
    EXPECT_EQ(queue.GetWaitInsideTaskCount(), 1);
    EXPECT_EQ(queue.GetWaitCount(), 0);
}

TEST_F(HandPumpedQueueTest, TheTaskRunsAndDiesBetweenTheCallsAroundItEvenWhenItThrows) {
    HandPumpedQueue queue;
    int freedAfter = -1;
    bool inside = false;
    queue.SetAroundRun([&] { inside = true; },
                       [&] {
                           inside = false;
                           freedAfter = mFreed;
                       });
    queue.Post(MakeTask([&] {
        EXPECT_TRUE(inside);
        throw std::runtime_error("task");
    }));
    EXPECT_THROW(queue.RunAll(), std::runtime_error);
    EXPECT_FALSE(inside);
    EXPECT_EQ(freedAfter, 1);
}

TEST_F(HandPumpedQueueTest, TasksNeverRunAreFreedWithTheQueueAndRefusedOnesStayWithTheCaller) {
    ITask* const refused = MakeTask([&] { mOrder.push_back(2); });
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
    RefusingQueue never;
    EXPECT_FALSE(never.Post(refused));
    delete refused;
    EXPECT_EQ(mFreed, 3);
}

TEST(LogCaptureTest, TheInnerCaptureTakesTheLinesOfItsScopeOnly) {
    LogCapture outer;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "before %d", 1);
    {
        LogCapture inner;
        __android_log_print(ANDROID_LOG_ERROR, "tag", "inner %s", "text");
        EXPECT_EQ(inner.Count(ANDROID_LOG_ERROR, "ner te"), 1);
        EXPECT_EQ(inner.Count(ANDROID_LOG_INFO), 0);
        EXPECT_TRUE(inner.Has("inner text"));
        EXPECT_FALSE(inner.Has("inner"));
        EXPECT_EQ(inner.Find("inner text").tag, "tag");
    }
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "after");
    EXPECT_THAT(outer.GetTexts(), ElementsAre("before 1", "after"));
}

TEST(TestImagesTest, TheGradientRepeatsNoPixelAcrossItsByteBoundaries) {
    TestImage const image = MakeGradient(520, 517);
    std::set<Color> seen;
    for (int y = 0; y < image.height; ++y) {
        for (int x = 0; x < image.width; ++x) seen.insert(image.GetColor(x, y));
    }
    EXPECT_EQ(seen.size(), 520u * 517u);
    EXPECT_EQ(image.Crop(300, 400, 2, 2).GetColor(1, 1), GetGradientColor(301, 401));
}

TEST(TestImagesTest, TransparentImagesArePremultiplied) {
    for (TestImage const& image : {MakeAlphaPattern(64, 64), MakeInkPage(320, 200)}) {
        std::set<int> alphas;
        for (std::size_t i = 0; i < image.pixels.size(); i += 4) {
            unsigned char const* const pixel = image.pixels.data() + i;
            ASSERT_TRUE(pixel[0] <= pixel[3] && pixel[1] <= pixel[3] && pixel[2] <= pixel[3]) << i;
            alphas.insert(pixel[3]);
        }
        EXPECT_GE(alphas.size(), image.width == 64 ? 256u : 50u);
    }
}

TEST(ImageCompareTest, ReportsHowManyHowFarAndWhere) {
    TestImage const image = MakeGradient(10, 10);
    TestImage changed = image;
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
}

} // namespace
} // namespace Moka::Testing
