// The end of a process whose loader sleeps, works or waits. Each case ends a process of its own, which must
// come to its end, with no crash and no leak that a sanitizer would report.
#include "moka/base/Bitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/Queues.h"
#include "tests/support/TestFiles.h"
#include "tests/unit/loader/CodecGate.h"

#include <cstdlib>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

// In a process that has nothing to decode the platform's foreign formats with. The others here are fresh ones.
TEST(NoDecoder, ACpuLoadDoesWithoutItAndItsBitmapIsTheReceiversWithoutAQueue) {
    LogCapture const quiet;
    TempFolder const folder;
    ASSERT_TRUE(SaveImage(MakeGradient(5, 4), folder.Path("a.png")));
    std::unique_ptr<Bitmap> bitmap;
    BitmapLoader::Callback callback;
    callback.onLoad = [&](int, String const&, Bitmap& loaded) { bitmap.reset(&loaded); };
    BitmapLoader loader("cpu", &callback);
    BitmapLoader::startEventLoopBySelf();
    loader.RequestLoad(1, String(folder.Path("a.png")), nullptr);
    BitmapLoader::WaitForAllSaveRequestsToEnd(nullptr);
    BitmapLoader::WaitUntilMsgQueueRequired();
    ASSERT_TRUE(bitmap);
    EXPECT_EQ(bitmap->GetWidth(), 5);
}

class ProcessExit : public testing::Test {
protected:
    // Run the case in a fresh process instead of a fork, which would have one thread.
    ProcessExit() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }

    static void ExpectCleanExit(void (*live)()) {
        EXPECT_EXIT(
            {
                static LogCapture* const quiet = new LogCapture;
                static_cast<void>(quiet);
                MKBitmapFactory_UseNativeDecoder();
                live();
                std::exit(0);
            },
            testing::ExitedWithCode(0), "");
    }
};

// Requests when the loader's queue is gone.
struct LateRequest {
    ~LateRequest() {
        // NOLINTNEXTLINE(bugprone-unhandled-exception-at-new): the test may end here
        auto* const pixels = new unsigned char[4]();
        if (loader.RequestLoad(1, "missing.mki", nullptr)) std::_Exit(1);
        if (loader.RequestSave(2, "s.png", pixels, 1, 1, nullptr, 100)) std::_Exit(1);
        delete[] pixels;
    }
    MKBitmapLoader loader{"outlives the queue", nullptr};
};

TEST_F(ProcessExit, WhileTheLoopWasNeverStarted) {
    ExpectCleanExit([] {
        static LateRequest late;
        MKBitmapLoader& loader = late.loader;
        loader.RequestLoad(1, "missing.mki", nullptr);
        loader.RequestSave(2, "s.png", new unsigned char[4](), 1, 1, nullptr, 100);
    });
}

TEST_F(ProcessExit, InTheMiddleOfAFileWithMoreQueued) {
    ExpectCleanExit([] {
        static CodecGate gate;
        static MKBitmapLoader loader("outlives the queue", nullptr);
        MKBitmapLoader::startEventLoopBySelf();
        loader.RequestSave(1, "s.unknown", new unsigned char[400](), 10, 10, nullptr, 100);
        gate.AwaitArrival();
        loader.RequestSave(2, "s.unknown", new unsigned char[400](), 10, 10, nullptr, 100);
        for (int id = 0; id < 10; ++id) loader.RequestLoad(id, "missing.mki", nullptr);
    });
}

TEST_F(ProcessExit, WithAReadBackThatTheQueueRefused) {
    ExpectCleanExit([] {
        static bool refuse = false;
        static HandPumpedQueue queue([] { return refuse; });
        RendererFactory::AttachContext();
        MKBitmapLoader::startEventLoopBySelf();
        static IMKBitmap* const bitmap =
            MKGraphicsFactory::CreateBitmap(&queue, 4, 4, nullptr, false, 1, false);
        refuse = true;
        MKBitmapLoader loader("pad", nullptr);
        EXPECT_TRUE(loader.RequestSave(1, "s.png", *bitmap, nullptr, 100));
    });
}

} // namespace
} // namespace Moka::Testing
