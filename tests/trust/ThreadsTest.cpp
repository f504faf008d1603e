// Four callers, the render thread, the loader and two message loops at once. Meant for the thread sanitizer.
#include "moka/base/MessageLoop.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/Awaited.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"
#include "tests/support/TestFiles.h"
#include "tests/support/TracingThread.h"
#include "tests/trust/MixedWork.h"

#include <atomic>
#include <gtest/gtest.h>
#include <random>
#include <string>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

constexpr int kSteps = 1500;
constexpr int kLoads = 150;

class ThreadsTest : public ::testing::Test {
protected:
    void SetUp() override {
        MKBitmapFactory_UseNativeDecoder();
        ASSERT_TRUE(SaveImage(MakeGradient(5, 4), folder.Path("a.mki")));
        ASSERT_TRUE(MKBitmapLoader::startEventLoopBySelf());
    }

    // Loads a picture again and again, draws each onto a bitmap of its own on the loader's thread, and saves
    // the bitmap.
    void LoadDrawAndSave(IGLMsgQueue& queue) {
        auto const target = RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(
            &queue, MixedWork::kSide, MixedWork::kHeight, nullptr, false, 1, false));
        auto const canvas =
            RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, target.Get(), 1));
        Awaited<int> own;
        MKBitmapLoader::Callback callback;
        callback.onLoad = [&](int, String const&, IMKBitmap& loaded) {
            canvas->DrawBitmap(&loaded, 0, 0, nullptr);
            ++own;
        };
        callback.onSave = [&](int, String const&, void*) { ++own; };
        MKBitmapLoader loader(nullptr, &callback);
        for (int id = 0; id < kLoads; ++id) {
            EXPECT_TRUE(loader.RequestLoad(id, path, &queue));
            EXPECT_TRUE(loader.RequestSave(id, savePath, *target, nullptr, 100));
        }
        own.AwaitAtLeast(2 * kLoads);
        loader.WaitForCallback();
        called += own.Get();
    }

    // Saves what all draw, and hears of it through the thread's message loop.
    void SaveManaged(IGLMsgQueue& queue, IMKBitmap& bitmap, std::string const& name) {
        MessageLoop loop;
        MKBitmapSaveManager manager;
        std::atomic<int>* const count = &called;
        MKBitmapSaveManager::SaveCallback callback;
        callback.context = count;
        callback.onSaveSucceeded = [](void* counter, String const*, void*) {
            ++*static_cast<std::atomic<int>*>(counter);
        };
        for (int id = 0; id < kLoads; ++id) {
            EXPECT_TRUE(manager.RequestSave(id, String(folder.Path(name)), bitmap, &callback, 100));
            loop.RunPending();
        }
        loop.RunPending();
        manager.WaitForSaveCompleting(&queue);
    }

    // One front end after the other, destroyed with requests in hand: each request calls once at most, and
    // none calls afterwards.
    template <class Loader>
    void CancelAndDestroy(IGLMsgQueue& queue, unsigned seed) {
        std::mt19937 random(seed);
        for (int round = 0; round < 15; ++round) {
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

    TempFolder const folder;
    String const path{folder.Path("a.mki")};
    String const savePath{folder.Path("b.mki")};
    std::atomic<int> called{0};
    LogCapture log;
};

TEST_F(ThreadsTest, RandomCallersTheLoaderAndHandlersShareOneRenderThread) {
    {
        TracingThread queue(MixedWork::kSide);
        auto const shared = RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(
            &queue, MixedWork::kSide, MixedWork::kHeight, nullptr, false, 1, false));
        std::vector<std::thread> threads;
        for (unsigned seed = 0; seed < 4; ++seed)
            threads.emplace_back([&, seed] {
                MixedWork work(queue, seed, shared.Get());
                for (int i = 0; i < kSteps; ++i) work.Step();
            });
        threads.emplace_back([&] { LoadDrawAndSave(queue); });
        threads.emplace_back([&] { CancelAndDestroy<MKBitmapLoader>(queue, 1); });
        threads.emplace_back([&] { CancelAndDestroy<BitmapLoader>(queue, 2); });
        for (char const* const name : {"c.mki", "d.png"})
            threads.emplace_back([&, name] { SaveManaged(queue, *shared, name); });
        for (std::thread& thread : threads) thread.join();
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(&queue);
    }
    EXPECT_EQ(called, 4 * kLoads);
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_TRUE(RendererTrace::GetViolations().empty());
}

} // namespace
} // namespace Moka::Testing
