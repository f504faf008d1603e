// Four threads request, cancel, wait and destroy at random. Meant for the thread sanitizer.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"

#include <atomic>
#include <random>

namespace Moka::Testing {
namespace {

// Counts, for each id, how often it was called back.
class Calls {
public:
    explicit Calls(int ids) : mCounts(static_cast<std::size_t>(ids)) {}

    template <class L>
    typename L::Callback MakeCallback() {
        typename L::Callback callback;
        callback.onLoad = [this](int id, String const&, auto& bitmap) {
            Count(id);
            if (bitmap.GetWidth() != 5) ++mWrong;
        };
        callback.onLoadError = [this](int id, String const&) { Count(id); };
        callback.onSave = [this](int id, String const&, void*) { Count(id); };
        callback.onSaveError = [this](int id, String const&, void*) { ++mWrong, Count(id); };
        return callback;
    }
    int GetCount(int id) const { return mCounts[static_cast<std::size_t>(id)]; }
    int GetWrong() const { return mWrong; }

private:
    void Count(int id) { ++mCounts[static_cast<std::size_t>(id)]; }

    std::vector<std::atomic<int>> mCounts;
    std::atomic<int> mWrong{0};
};

class LoaderStress : public LoaderFixture {
protected:
    static constexpr int kSteps = 80;
    static constexpr int kLives = 3;

    // One front end's life. Every id is used once; what was accepted and not cancelled calls exactly once.
    template <class L>
    void Live(unsigned seed) {
        std::mt19937 random(seed);
        auto const pick = [&](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
        Calls calls(kSteps);
        std::vector<bool> due(kSteps, false);
        std::vector<bool> allowed(kSteps, false);
        auto callback = calls.template MakeCallback<L>();
        auto loader = std::make_unique<L>(seed % 2 ? "stress" : nullptr, &callback);
        for (int id = 0; id < kSteps; ++id) {
            auto const at = static_cast<std::size_t>(id);
            switch (pick(10)) {
            case 0: {
                int const other = pick(kSteps);
                loader->CancelLoadRequest(other);
                due[static_cast<std::size_t>(other)] = false;
                break;
            }
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
        EXPECT_EQ(calls.GetWrong(), 0);
        for (int id = 0; id < kSteps; ++id) {
            auto const at = static_cast<std::size_t>(id);
            EXPECT_LE(calls.GetCount(id), allowed[at] ? 1 : 0);
            EXPECT_GE(calls.GetCount(id), due[at] && !early ? 1 : 0);
        }
    }

    TestImage const image = MakeGradient(5, 4);
    String path;
};

TEST_F(LoaderStress, FourThreadsOfFrontEndsAndASaveManager) {
    path = WritePicture("a.mki");
    std::vector<std::thread> threads;
    for (unsigned t = 0; t < 4; ++t)
        threads.emplace_back([this, t] {
            for (unsigned life = 0; life < kLives; ++life) {
                if (t % 2 == 0)
                    Live<MKBitmapLoader>(t + 10 * life);
                else
                    Live<BitmapLoader>(t + 10 * life);
            }
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
