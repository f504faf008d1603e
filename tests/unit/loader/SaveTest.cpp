// Saves through the loader's loop, seen by a listener.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"
#include "tests/support/Allocation.h"
#include "tests/support/Queues.h"
#include "tests/support/reference/ReferenceBitmap.h"

#include <cstring>
#include <limits>

namespace Moka::Testing {
namespace {

// A bitmap whose read-back calls back when the test says so.
class HeldBitmap final : public ReferenceBitmap {
public:
    using ReferenceBitmap::ReferenceBitmap;
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                            DataCallback callback) override {
        std::memset(destination, 0xFF, static_cast<std::size_t>(GetWidth() * GetHeight() * 4));
        deliver = [=] { callback(r, destination, userData); };
    }
    std::function<void()> deliver;
};

class Save : public LoaderFixture {
protected:
    bool Request(int id, std::string const& name, int quality = 100) {
        return Loader().RequestSave(&listener, id, Path(name), NewPixels(image), image.width, image.height,
                                    nullptr, quality);
    }
    std::string EncodedDirectly(std::string const& extension, int quality = 100) {
        EXPECT_TRUE(SaveImage(image, folder.Path("direct." + extension), quality));
        return ReadBytes("direct." + extension);
    }

    Picture image = MakeAlphaPattern(40, 30);
};

TEST_F(Save, WhatCannotBeWrittenIsAnErrorAndTheLoopGoesOn) {
    int count = 0;
    for (char const* name : {"s.unknown", "no folder/s.png"}) EXPECT_TRUE(Request(count++, name));
    for (auto const& [width, height] : {std::pair{40, -1}, {std::numeric_limits<int>::max(), 1}}) {
        EXPECT_TRUE(Loader().RequestSave(&listener, count++, Path("s.png"), NewPixels(image), width, height,
                                         nullptr, 100));
    }
    listener.AwaitCompleted(count);
    codecsThrow = true;
    EXPECT_TRUE(Request(count++, "s.png"));
    listener.AwaitCompleted(count);
    codecsThrow = false;
    EXPECT_FALSE(Exists("s.png"));
    Events expected;
    for (int i = 0; i < count; ++i) expected.push_back("save error " + std::to_string(i));
    expected.push_back("save " + std::to_string(count));
    EXPECT_TRUE(Request(count, "s.jpg", 30));
    listener.AwaitCompleted(count + 1);
    EXPECT_EQ(listener.GetResults(), expected);
    EXPECT_EQ(ReadBytes("s.jpg"), EncodedDirectly("jpg", 30));
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, "BitmapLoaderImpl::SaveBitmap error bitmap construct fail"), 2);
}

TEST_F(Save, WhatABitmapDoesNotCoverIsTransparent) {
    Picture const whole = MakeGradient(8, 8);
    auto const bitmap = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(queue.get(), Rect(0, 2, 8, 5), 8, 8, whole.pixels.data(), 1));
    EXPECT_TRUE(Loader().RequestSave(&listener, 1, Path("s.png"), *bitmap, nullptr, 100));
    MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
    image = Picture(8, 8);
    for (int y = 2; y < 5; ++y)
        for (int x = 0; x < 8; ++x) image.SetColor(x, y, whole.GetColor(x, y));
    EXPECT_EQ(ReadBytes("s.png"), EncodedDirectly("png"));
}

TEST_F(Save, WaitersWaitForTheReadBackAndTheFile) {
    image = Picture(4, 3);
    std::fill(image.pixels.begin(), image.pixels.end(), static_cast<unsigned char>(0xFF));
    HeldBitmap bitmap(Picture(4, 3));
    EXPECT_TRUE(Loader().RequestSave(&listener, 1, Path("s.png"), bitmap, nullptr, 100));
    std::vector<std::thread> waiters;
    for (int i = 0; i < 3; ++i)
        waiters.emplace_back([this] {
            Loader().WaitForAllSaveRequestsToEnd();
            EXPECT_TRUE(Exists("s.png"));
            EXPECT_EQ(listener.GetEvents().size(), 3u);
        });
    log.AwaitLines("SaveTaskRunning -> Start Wait", 3);
    EXPECT_TRUE(log.Has("WaitForAllSaveRequestsToEnd - SaveTaskRunning -> Start Wait, "
                        "mPendingSaveRequestList->GetCount() = 1, mQueue->GetCount() = 0, "
                        "mSaveTaskRunning = 0"));
    CodecGate gate;
    bitmap.deliver();
    gate.AwaitArrival();
    gate.Open();
    for (std::thread& waiter : waiters) waiter.join();
    EXPECT_EQ(ReadBytes("s.png"), EncodedDirectly("png"));
}

TEST_F(Save, WaitingForAllRunsTheRenderThreadsTasksFirst) {
    HandPumpedQueue pumped;
    MKBitmapLoader::WaitForAllSaveRequestsToEnd(&pumped);
    BitmapLoader::WaitForAllSaveRequestsToEnd(&pumped);
    EXPECT_EQ(pumped.GetWaitCount(), 2);
}

// Pending, waiting in the queue, and being encoded.
TEST_F(Save, ARemovedCallbackLeavesTheFile) {
    HeldBitmap bitmap(Picture(4, 3));
    RecordingListener other;
    EXPECT_TRUE(Loader().RequestSave(&listener, 1, Path("pending.png"), bitmap, nullptr, 100));
    CodecGate gate;
    Request(2, "encoding.png");
    gate.AwaitArrival();
    Request(3, "queued.png");
    Loader().RequestSave(&other, 4, Path("other.png"), NewPixels(image), 40, 30, nullptr, 100);
    Loader().RequestLoad(&listener, 5, Path("missing.png"), detail::BITMAP_TYPE_CPU, nullptr, 0, 0);
    Loader().RemoveAllSaveCallback(&listener);
    gate.Open();
    bitmap.deliver();
    Loader().WaitForAllSaveRequestsToEnd();
    for (char const* name : {"pending.png", "encoding.png", "queued.png", "other.png"})
        EXPECT_TRUE(Exists(name));
    EXPECT_EQ(listener.GetEvents(), (Events{"pending", "error 5", "completed"})) << "a load is no save";
    EXPECT_EQ(other.GetEvents(), (Events{"pending", "save 4", "completed"}));
}

} // namespace
} // namespace Moka::Testing
