// The save manager, over a loop on a thread that this program lends it.
#include "moka/graphics/loader/MKBitmapSaveManager.h"

#include "moka/base/MessageLoop.h"
#include "tests/unit/loader/LoaderFixture.h"

namespace Moka::Testing {
namespace {

class SaveManager : public LoaderFixture {
protected:
    using Callback = MKBitmapSaveManager::SaveCallback;

    void StartLoop() override {
        static bool const started = [] {
            std::thread([] { MKBitmapLoader::startEventLoop(); }).detach();
            return true;
        }();
        ASSERT_TRUE(started);
    }

    static void Succeeded(void* context, String const* path, void* userData) {
        static_cast<SaveManager*>(context)->Note("saved ", *path, userData);
    }
    static void Failed(void* context, String const* path, void* userData) {
        static_cast<SaveManager*>(context)->Note("failed ", *path, userData);
    }
    void Note(char const* what, String const& path, void* userData) {
        std::lock_guard<std::mutex> const lock(mutex);
        results.push_back(what + std::filesystem::path(path.ToUtf8()).filename().string());
        lastUserData = userData;
        lastThread = std::this_thread::get_id();
    }
    Callback MakeCallback(void* userData = nullptr) { return {Succeeded, Failed, this, userData}; }
    bool Request(MKBitmapSaveManager& manager, std::string const& name, Callback* callback) {
        return manager.RequestSave(1, Path(name), *MakeBitmap(image), callback, 100);
    }
    // The files are there and the results are with the manager.
    void AwaitSaved() {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
        AwaitIdle();
    }

    Picture image = MakeGradient(20, 2 * kMaxSide);
    std::mutex mutex;
    Events results;
    void* lastUserData = nullptr;
    std::thread::id lastThread;
    MessageLoop messages;
};

TEST_F(SaveManager, TwoResultsShareOneMessageAndComeInOrder) {
    MKBitmapSaveManager manager;
    Callback first = MakeCallback(&manager);
    Callback second = MakeCallback(this);
    CodecGate gate; // both are requested before either is done
    EXPECT_TRUE(Request(manager, "a.png", &first));
    EXPECT_TRUE(Request(manager, "no folder/b.png", &second));
    EXPECT_EQ(manager.GetRequestSaveCount(), 2);
    gate.Open();
    AwaitSaved();
    EXPECT_EQ(results, Events{}) << "only from the message loop";
    EXPECT_EQ(manager.GetRequestSaveCount(), 2);
    EXPECT_EQ(messages.RunPending(), 1);
    EXPECT_EQ(results, (Events{"saved a.png", "failed b.png"}));
    EXPECT_EQ(lastUserData, this);
    EXPECT_EQ(manager.GetRequestSaveCount(), 0);
    EXPECT_TRUE(SaveImage(image, folder.Path("direct.png")));
    EXPECT_EQ(ReadBytes("a.png"), ReadBytes("direct.png"));
    EXPECT_EQ(messages.RunPending(), 0);
    EXPECT_EQ(log.Find("SaveManager::sm_OnSave mSaveCount(2) hasError(1)").tag, "mok_log");
}

TEST_F(SaveManager, WaitingHandsResultsOverOnTheWaitingThread) {
    MKBitmapSaveManager manager;
    Callback callback = MakeCallback();
    Callback neither;
    for (char const* name : {"a.png", "b.mki"}) EXPECT_TRUE(Request(manager, name, &callback));
    EXPECT_TRUE(Request(manager, "c.png", nullptr));
    EXPECT_TRUE(Request(manager, "d.png", &neither));
    std::thread::id waiting;
    std::thread([&] {
        waiting = std::this_thread::get_id();
        manager.WaitForSaveCompleting(queue.get());
    }).join();
    EXPECT_EQ(results, (Events{"saved a.png", "saved b.mki"}));
    EXPECT_EQ(lastThread, waiting);
    EXPECT_EQ(manager.GetRequestSaveCount(), 0);
    for (char const* name : {"c.png", "d.png"}) EXPECT_TRUE(Exists(name));
    EXPECT_TRUE(log.Has("SaveManager::WaitForSaveCompleting mSaveCount(0) End"));
    messages.RunPending(); // what was sent finds nothing left
    EXPECT_EQ(results.size(), 2u);
}

TEST_F(SaveManager, ARefusedRequestStaysCounted) {
    MKBitmapSaveManager manager;
    Callback callback = MakeCallback();
    auto const empty = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(queue.get(), reinterpret_cast<TextureObject const*>(this), 1));
    EXPECT_FALSE(manager.RequestSave(1, Path("a.png"), *empty, &callback, 100));
    EXPECT_EQ(manager.GetRequestSaveCount(), 1);
    EXPECT_EQ(results, Events{});
}

TEST_F(SaveManager, DestroyedWithSavesAndResultsItLeavesTheFilesAndCallsNobody) {
    CodecGate gate;
    {
        MKBitmapSaveManager manager;
        Callback callback = MakeCallback();
        gate.Open();
        Request(manager, "result.png", &callback);
        AwaitSaved();
        CodecGate const closed;
        Request(manager, "encoding.png", &callback);
        gate.AwaitArrival();
        Request(manager, "queued.png", &callback);
        EXPECT_EQ(manager.GetRequestSaveCount(), 3);
    }
    AwaitSaved();
    messages.RunPending();
    EXPECT_TRUE(log.Has("SaveManager save remain 3"));
    for (char const* name : {"result.png", "encoding.png", "queued.png"}) EXPECT_TRUE(Exists(name));
    EXPECT_EQ(results, Events{});
}

} // namespace
} // namespace Moka::Testing
