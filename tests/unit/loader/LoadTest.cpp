// Loads through the loader's loop, seen by a listener.
#include "tests/unit/loader/LoaderFixture.h"

#include "tests/support/Queues.h"

namespace Moka::Testing {
namespace {

using detail::BITMAP_TYPE_CPU;
using detail::BITMAP_TYPE_GRAPHICS;
using detail::BitmapType;

class Load : public LoaderFixture {
protected:
    bool Request(int id, String const& path, BitmapType type = BITMAP_TYPE_CPU, int width = 0,
                 int height = 0) {
        return Loader().RequestLoad(&listener, id, path, type, queue.get(), width, height);
    }
};

TEST_F(Load, PendingThenTheResultThenCompletedForEveryKind) {
    for (char const* name : {"a.png", "a.webp", "a.mki"}) WritePicture(name);
    EXPECT_TRUE(Request(1, Path("a.png"), BITMAP_TYPE_CPU));
    EXPECT_TRUE(Request(2, Path("a.webp"), BITMAP_TYPE_GRAPHICS));
    EXPECT_TRUE(Request(3, Path("a.mki"), BITMAP_TYPE_GRAPHICS, 3, 2));
    EXPECT_TRUE(Request(4, Path("a.mki"), BITMAP_TYPE_CPU, 3, 2));
    EXPECT_TRUE(Request(5, Path("a.png"), BITMAP_TYPE_CPU, 3, 0)) << "one side alone scales nothing";
    listener.AwaitCompleted(5);
    Events expected;
    for (char const* result : {"load 1 5x4", "load 2 5x4", "load 3 3x2", "load 4 3x2", "load 5 5x4"})
        expected.insert(expected.end(), {"pending", result, "completed"});
    EXPECT_EQ(listener.GetEvents(), expected);
}

TEST_F(Load, AnIdIsRefusedUntilItsDecodeIsCancelledWhichCallsNobody) {
    String const path = WritePicture("a.mki");
    for (BitmapType const type : {BITMAP_TYPE_CPU, BITMAP_TYPE_GRAPHICS}) {
        RecordingListener other;
        AwaitIdle();
        log.Clear();
        CodecGate gate;
        EXPECT_TRUE(Request(1, path, type));
        gate.AwaitArrival();
        EXPECT_FALSE(Request(1, path, type)) << "being decoded";
        EXPECT_FALSE(Loader().RequestLoad(nullptr, 3, path, type, queue.get(), 0, 0)) << "nobody listens";
        Loader().RequestLoad(&other, 1, path, type, queue.get(), 0, 0);
        Loader().CancelLoadRequest(&listener, 1);
        EXPECT_TRUE(Request(1, path, type));
        EXPECT_FALSE(Request(1, Path("another.mki"), type)) << "waiting";
        Loader().CancelLoadRequest(&listener, 1);
        Loader().CancelLoadRequest(&listener, 1);
        EXPECT_TRUE(log.Has("BitmapLoaderImpl::CancelRequest; queue size(1) no request"));
        gate.Open();
        other.AwaitCompleted(1);
        EXPECT_EQ(listener.GetEvents(), Events{});
    }
}

TEST_F(Load, CancelAllDropsTheLoadsOfOneListenerAndNothingElse) {
    String const path = WritePicture("a.mki");
    RecordingListener other;
    CodecGate gate;
    for (int id = 0; id < 5; ++id) {
        Request(id, path);
        Loader().RequestLoad(&other, id, path, BITMAP_TYPE_CPU, queue.get(), 0, 0);
    }
    Loader().RequestSave(&listener, 9, Path("s.png"), NewPixels(MakeGradient(3, 3)), 3, 3, nullptr, 100);
    gate.AwaitArrival();
    Loader().CancelAllLoadRequest(&listener);
    EXPECT_TRUE(log.Has("BitmapLoaderImpl::CancelAllRequest; queue size(6)"));
    gate.Open();
    other.AwaitCompleted(5);
    listener.AwaitCompleted(1);
    EXPECT_EQ(listener.GetEvents(), (Events{"pending", "save 9", "completed"}));
}

class CountingQueue final : public IGLMsgQueue {
public:
    explicit CountingQueue(IGLMsgQueue& queue) : mQueue(queue) {}
    bool Post(ITask* task) override {
        if (++posted == 1) whenFirst();
        return mQueue.Post(task);
    }
    void WaitForTasks() override { mQueue.WaitForTasks(); }

    std::atomic<int> posted{0};
    std::function<void()> whenFirst;

private:
    IGLMsgQueue& mQueue;
};

// So whoever has cancelled may take the queue away.
TEST_F(Load, NoUploadIsPostedAfterCancelHasReturned) {
    String const path = WritePicture("tall.mki", 1, 3 * kMaxSide);
    CountingQueue counting(*queue);
    std::thread canceller;
    std::promise<void> cancelled;
    int whenCancelled = 0;
    int whenUploaded = 0;
    counting.whenFirst = [&] {
        canceller = std::thread([&] {
            Loader().CancelAllLoadRequest(&listener);
            whenCancelled = counting.posted;
            cancelled.set_value();
        });
        // Time for one that does not wait for the loader.
        cancelled.get_future().wait_for(std::chrono::milliseconds(300));
    };
    listener.whenLoaded = [&](Bitmap*, IMKBitmap*) { whenUploaded = counting.posted; };
    Loader().RequestLoad(&listener, 1, path, BITMAP_TYPE_GRAPHICS, &counting, 0, 0);
    listener.AwaitCompleted(1);
    canceller.join();
    queue->WaitForTasks(); // the strips post through the counting one until they are gone
    EXPECT_GE(whenUploaded, 3);
    EXPECT_GE(whenCancelled, whenUploaded);
}

TEST_F(Load, WhatCannotBeLoadedIsAnErrorAndTheLoopGoesOn) {
    WritePicture("cut.png", 30, 30);
    std::filesystem::resize_file(folder.Path("cut.png"),
                                 std::filesystem::file_size(folder.Path("cut.png")) / 2);
    String const paths[] = {Path("missing.png"), Path("cut.png"), Path(std::string(700, 'x')), String("")};
    int count = 0;
    Events expected;
    for (BitmapType const type : {BITMAP_TYPE_CPU, BITMAP_TYPE_GRAPHICS}) {
        for (String const& path : paths) {
            expected.push_back("error " + std::to_string(count));
            EXPECT_TRUE(Request(count++, path, type));
        }
    }
    String const good = WritePicture("a.png");
    Loader().RequestLoad(&listener, count, good, BITMAP_TYPE_GRAPHICS, nullptr, 0, 0); // needs a queue
    expected.push_back("error " + std::to_string(count++));
    expected.push_back("load " + std::to_string(count) + " 5x4");
    Request(count, good);
    listener.AwaitCompleted(count + 1);
    EXPECT_EQ(listener.GetResults(), expected);
    AwaitIdle();
    // The error of a bitmap that was decoded ends as a load.
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, "BitmapLoaderImpl::LoadBitmap Call OnLoad finish."), 2);
}

TEST_F(Load, ACpuBitmapDiesOnItsQueueBehindTheCallbacks) {
    String const path = WritePicture("a.mki");
    HandPumpedQueue pumped;
    Bitmap* seen = nullptr;
    listener.whenLoaded = [&](Bitmap* bitmap, IMKBitmap*) { seen = bitmap; };
    listener.whenNoted = [&](std::string const& event) { EXPECT_EQ(pumped.GetPendingCount(), 0) << event; };
    Loader().RequestLoad(&listener, 1, path, BITMAP_TYPE_CPU, &pumped, 0, 0);
    listener.AwaitCompleted(1);
    Loader().WaitUntilMsgQueueRequired();
    EXPECT_EQ(seen->GetBuffer()[3], 255) << "still alive";
    EXPECT_EQ(pumped.RunAll(), 1);

    CodecGate gate;
    Loader().RequestLoad(&listener, 2, path, BITMAP_TYPE_CPU, &pumped, 0, 0);
    gate.AwaitArrival();
    Loader().CancelLoadRequest(&listener, 2);
    gate.Open();
    Loader().WaitUntilMsgQueueRequired();
    EXPECT_EQ(pumped.RunAll(), 1) << "a cancelled load's, too";
}

} // namespace
} // namespace Moka::Testing
