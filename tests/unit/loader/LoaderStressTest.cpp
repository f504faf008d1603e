// Four threads request, cancel, wait and destroy at random. Meant for the thread sanitizer.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"

#include <atomic>
#include <random>

namespace Moka::Testing {
namespace {

class LoaderStress : public LoaderFixture {
protected:
    static constexpr int kSteps = 80;

    // One front end's life. Every id is used once; what was accepted and not cancelled calls exactly once.
    template <class L>
    void Live(unsigned seed) {
        std::mt19937 random(seed);
        auto const pick = [&](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
        RecordingListener listener;
        std::vector<bool> due(kSteps, false);
        std::vector<bool> allowed(kSteps, false);
        auto callback = MakeCallback<L>(listener);
        auto loader = std::make_unique<L>(seed % 2 ? "stress" : nullptr, &callback);
        for (int id = 0; id < kSteps; ++id) {
            auto const at = static_cast<std::size_t>(id);
            switch (pick(10)) {
            case 0:
                loader->CancelLoadRequest(id * 7 % kSteps);
                due[static_cast<std::size_t>(id * 7 % kSteps)] = false;
                break;
            case 1:
                if (pick(5) > 0) break;
                loader->CancelAllLoadRequest();
                std::fill(due.begin(), due.end(), false);
                break;
            case 2:
                loader->WaitForCallback();
                break;
            case 3:
            case 4:
                due[at] = allowed[at] = loader->RequestSave(id, Path(std::to_string(seed) + ".mki"),
                                                            NewPixels(image), 5, 4, nullptr, 100);
                break;
            case 5:
                due[at] = allowed[at] = loader->RequestLoad(id, Path("missing.mki"), queue.get());
                break;
            case 6:
                MKBitmapLoader::WaitUntilMsgQueueRequired();
                break;
            default:
                due[at] = allowed[at] = loader->RequestLoad(id, path, queue.get());
            }
        }
        bool const early = pick(2) == 0;
        if (!early) MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
        if (!early) MKBitmapLoader::WaitUntilMsgQueueRequired();
        loader.reset();
        std::vector<int> calls(kSteps, 0);
        for (std::string const& event : listener.GetEvents()) {
            std::size_t const number = event.find_first_of("0123456789");
            ++calls[static_cast<std::size_t>(std::stoi(event.substr(number)))];
            EXPECT_TRUE(event[0] != 'l' || event.find(" 5x4") != std::string::npos) << event;
            EXPECT_NE(event.substr(0, 6), "save e") << event;
        }
        for (std::size_t id = 0; id < calls.size(); ++id) {
            EXPECT_LE(calls[id], allowed[id] ? 1 : 0);
            EXPECT_GE(calls[id], due[id] && !early ? 1 : 0);
        }
    }

    Picture const image = MakeGradient(5, 4);
    String path;
};

TEST_F(LoaderStress, FourThreadsOfFrontEndsAndASaveManager) {
    path = WritePicture("a.mki");
    std::vector<std::thread> threads;
    for (unsigned t = 0; t < 4; ++t)
        threads.emplace_back([this, t] {
            for (unsigned seed = t; seed < 30; seed += 10)
                t % 2 == 0 ? Live<MKBitmapLoader>(seed) : Live<BitmapLoader>(seed);
        });
    std::atomic<int> saved{0};
    {
        MKBitmapSaveManager manager;
        MKBitmapSaveManager::SaveCallback callback;
        callback.onSaveSucceeded = [](void* count, String const*, void*) {
            ++*static_cast<std::atomic<int>*>(count);
        };
        callback.context = &saved;
        for (int i = 0; i < 20; ++i) {
            EXPECT_TRUE(manager.RequestSave(i, Path("m.mki"), *MakeBitmap(image), &callback, 100));
            if (i % 7 == 0) manager.WaitForSaveCompleting(queue.get());
        }
        manager.WaitForSaveCompleting(queue.get());
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(saved, 20);
}

} // namespace
} // namespace Moka::Testing
