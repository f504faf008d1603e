// Four callers, the render thread, the loader and two message loops at once. Meant for the thread sanitizer.
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/support/TracingThread.h"
#include "tests/trust/Scenarios.h"

#include <atomic>
#include <gtest/gtest.h>
#include <thread>

namespace Moka::Testing {
namespace {

constexpr int kScenarios = 60;
constexpr int kLoads = 60;
constexpr int kCancellations = 15;
constexpr int kTags = 3000;

// One front end after the other, destroyed with requests in hand: each request calls once at most, and none calls
// afterwards.
template <class Loader>
void CancelAndDestroy(IGLMsgQueue& queue, String const& path, unsigned seed) {
    std::mt19937 random(seed);
    for (int round = 0; round < kCancellations; ++round) {
        std::atomic<bool> isAlive{true};
        std::vector<std::atomic<int>> calls(20);
        typename Loader::Callback callback;
        callback.onLoad = [&](int id, String const&, auto&) {
            EXPECT_TRUE(isAlive);
            EXPECT_EQ(++calls[static_cast<std::size_t>(id)], 1);
        };
        {
            Loader loader("pad", &callback);
            for (int id = 0; id < 20; ++id) {
                EXPECT_TRUE(loader.RequestLoad(id, path, &queue));
                if (random() % 4 == 0) loader.CancelLoadRequest(id / 2);
                if (random() % 16 == 0) loader.CancelAllLoadRequest();
                if (random() % 16 == 0) loader.WaitForCallback();
                if (random() % 4 == 0) Loader::WaitForAllSaveRequestsToEnd(&queue);
            }
            if (round % 2 == 0) MKBitmapLoader::WaitUntilMsgQueueRequired();
        }
        isAlive = false;
    }
}

TEST(ThreadsTest, CallersTheLoaderAndMessageLoopsShareOneRenderThread) {
    TempFolder const folder;
    LogCapture const log;
    MKBitmapFactory_UseNativeDecoder();
    ASSERT_TRUE(SaveImage(MakeGradient(5, 4), folder.Path("picture.png")));
    ASSERT_TRUE(MKBitmapLoader::startEventLoopBySelf());
    String const path(folder.Path("picture.png"));
    {
        TracingThread queue(kMaxTexture);
        auto const shared = NewBitmap(queue, 6, 2 * kMaxTexture);
        Stage const stage{queue, [] {}, folder.GetPath(), shared.Get()};
        std::vector<std::thread> threads;
        for (unsigned seed = 0; seed < 4; ++seed)
            threads.emplace_back([&stage, seed] {
                std::mt19937 random(seed);
                for (int i = 0; i < kScenarios; ++i) RunAnyScenario(stage, random);
            });
        for (int i = 0; i < 2; ++i)
            threads.emplace_back([&stage] {
                for (int load = 0; load < kLoads; ++load) GetScenarios().back().run(stage);
            });
        threads.emplace_back([&] { CancelAndDestroy<MKBitmapLoader>(queue, path, 1); });
        threads.emplace_back([&] { CancelAndDestroy<BitmapLoader>(queue, path, 2); });
        threads.emplace_back([&] {
            auto const own = NewBitmap(queue, 6, 6);
            for (int i = 0; i < kTags; ++i) own->SetTag(i % 2 == 0 ? "one tag" : "the other");
        });
        for (std::thread& thread : threads) thread.join();
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(&queue);
    }
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_TRUE(RendererTrace::GetViolations().empty());
}

} // namespace
} // namespace Moka::Testing
