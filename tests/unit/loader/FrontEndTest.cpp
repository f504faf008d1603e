// The two front ends: what they log and call, and what happens when they are cancelled or destroyed.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"

#include <chrono>
#include <sstream>

namespace Moka::Testing {
namespace {

class FrontEnd : public LoaderFixture {
protected:
    template <class Loader>
    void ExpectCallsAndLines(std::string const& kind, bool eng);
    void AwaitAll() {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
        MKBitmapLoader::WaitUntilMsgQueueRequired();
    }
};

// kind is the class's name, which is in every line of it.
template <class Loader>
void FrontEnd::ExpectCallsAndLines(std::string const& kind, bool eng) {
    Picture const image = MakeGradient(5, 4);
    String const path = WritePicture("a.mki");
    System::SetBuildTypeEngMode(eng);
    RecordingListener told;
    auto callback = MakeCallback<Loader>(told);
    Loader loader("pad", &callback);
    log.Clear();
    EXPECT_TRUE(loader.RequestLoad(2, Path("missing.mki"), queue.get(), 3, 2));
    EXPECT_TRUE(loader.RequestSave(3, path, NewPixels(image), 5, 4, nullptr, 100));
    EXPECT_FALSE(loader.RequestSave(4, path, nullptr, 5, 4, nullptr, 100));
    EXPECT_TRUE(loader.RequestSave(5, Path("bad.unknown"), NewPixels(image), 5, 4, nullptr, 100));
    AwaitAll();
    EXPECT_EQ(told.GetEvents(), (Events{"error 2", "save 3", "save error 5"}));
    std::ostringstream saved;
    saved << kind << '[' << &loader << (eng ? ":pad] OnSave(" + path.ToUtf8() + ")" : ":pad] OnSave");
    EXPECT_EQ(log.Find(saved.str()).tag, kind);
    EXPECT_EQ(log.Count(ANDROID_LOG_INFO, folder.GetPath().string()) > 0, eng);
}

TEST_F(FrontEnd, CallsBackAndLogsPathsInEngineeringBuildsOnly) {
    for (bool const eng : {false, true}) {
        ExpectCallsAndLines<MKBitmapLoader>("MKBitmapLoader", eng);
        ExpectCallsAndLines<BitmapLoader>("BitmapLoader", eng);
    }
}

TEST_F(FrontEnd, DestroyedWhileCallingItWaitsForTheCall) {
    String const path = WritePicture("a.mki");
    Awaited<bool> entered, mayLeave;
    bool left = false; // not atomic: the destructor is what makes it visible
    MKBitmapLoader::Callback callback;
    callback.onLoad = [&](int, String const&, IMKBitmap&) {
        entered.Set(true);
        mayLeave.AwaitAtLeast(true);
        // Time for a destructor that does not wait.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        left = true;
    };
    auto loader = std::make_unique<MKBitmapLoader>("pad", &callback);
    loader->RequestLoad(1, path, queue.get());
    loader->RequestLoad(2, path, queue.get());
    entered.AwaitAtLeast(true);
    std::thread destroyer([&] {
        loader.reset();
        EXPECT_TRUE(left);
    });
    log.AwaitLines("] ~MKBitmapLoader");
    mayLeave.Set(true);
    destroyer.join();
}

TEST_F(FrontEnd, TheTwoKindsShareOneQueueAndOneThread) {
    auto onGpu = MakeCallback<MKBitmapLoader>(listener);
    auto onCpu = MakeCallback<BitmapLoader>(listener);
    MKBitmapLoader graphics("graphics", &onGpu);
    BitmapLoader cpu("cpu", &onCpu);
    String const path = WritePicture("a.mki");
    EXPECT_TRUE(MKBitmapLoader::startEventLoopBySelf());
    EXPECT_TRUE(BitmapLoader::startEventLoopBySelf());
    for (int id = 0; id < 4; id += 2) {
        graphics.RequestLoad(id, path, queue.get(), 3, 3);
        cpu.RequestLoad(id + 1, path, queue.get());
    }
    AwaitAll();
    EXPECT_EQ(listener.GetEvents(), (Events{"load 0 3x3", "load 1 5x4", "load 2 3x3", "load 3 5x4"}));
    int threads = 0;
    for (auto const& task : std::filesystem::directory_iterator("/proc/self/task"))
        threads += ReadBytes(task.path() / "comm") == "MokaBitmapLoade\n";
    EXPECT_EQ(threads, 1);
}

TEST_F(FrontEnd, BitmapsAreSavedAndTheLoaderFreesACpuBitmapsPixels) {
    Picture image = MakeAlphaPattern(20, 10);
    auto onGpu = MakeCallback<MKBitmapLoader>(listener);
    auto onCpu = MakeCallback<BitmapLoader>(listener);
    MKBitmapLoader graphics("graphics", &onGpu);
    BitmapLoader cpu("cpu", &onCpu);
    {
        auto const gpuBitmap = MakeBitmap(image);
        EXPECT_TRUE(graphics.RequestSave(1, Path("g.png"), *gpuBitmap, nullptr, 100));
        Bitmap cpuBitmap;
        cpuBitmap.Construct(NewPixels(image), 20, 10, 80, 1, false, true);
        EXPECT_TRUE(cpu.RequestSave(2, Path("c.png"), cpuBitmap, nullptr, 100));
        cpuBitmap.SetDeleteBuffer(false);
        Bitmap empty;
        EXPECT_FALSE(cpu.RequestSave(3, Path("e.png"), empty, nullptr, 100));
    }
    AwaitAll();
    EXPECT_TRUE(SaveImage(image, folder.Path("direct.png")));
    for (char const* name : {"g.png", "c.png"}) EXPECT_EQ(ReadBytes(name), ReadBytes("direct.png"));
    EXPECT_EQ(listener.GetEvents().size(), 2u);
}

} // namespace
} // namespace Moka::Testing
