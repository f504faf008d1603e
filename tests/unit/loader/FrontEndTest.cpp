// The two front ends: what they log and call, and what happens when they are cancelled or destroyed.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"

#include <chrono>
#include <sstream>
#include <type_traits>

namespace Moka::Testing {
namespace {

class FrontEnd : public LoaderFixture {
protected:
    void AwaitAll() {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
        MKBitmapLoader::WaitUntilMsgQueueRequired();
    }

    RecordingListener listener;
};

template <class L>
class EitherFrontEnd : public FrontEnd {
protected:
    static constexpr char const* kName =
        std::is_same_v<L, MKBitmapLoader> ? "MKBitmapLoader" : "BitmapLoader";

    // A line of the front end named "pad".
    static std::string Line(L const& loader, std::string const& rest) {
        std::ostringstream line;
        line << kName << '[' << &loader << ":pad] " << rest;
        return line.str();
    }
};
using FrontEnds = ::testing::Types<MKBitmapLoader, BitmapLoader>;
TYPED_TEST_SUITE(EitherFrontEnd, FrontEnds, );

TYPED_TEST(EitherFrontEnd, CallsBackAndLogsPathsInEngineeringBuildsOnly) {
    Picture const image = MakeGradient(5, 4);
    String const path = this->WritePicture("a.mki");
    for (bool const eng : {false, true}) {
        System::SetBuildTypeEngMode(eng);
        RecordingListener told;
        auto callback = MakeCallback<TypeParam>(told);
        TypeParam loader("pad", &callback);
        this->log.Clear();
        EXPECT_TRUE(loader.RequestLoad(2, this->Path("missing.mki"), this->queue.get(), 3, 2));
        EXPECT_TRUE(loader.RequestSave(3, path, this->NewPixels(image), 5, 4, nullptr, 100));
        EXPECT_FALSE(loader.RequestSave(4, path, nullptr, 5, 4, nullptr, 100));
        EXPECT_TRUE(
            loader.RequestSave(5, this->Path("bad.unknown"), this->NewPixels(image), 5, 4, nullptr, 100));
        this->AwaitAll();
        EXPECT_EQ(told.GetEvents(), (Events{"error 2", "save 3", "save error 5"}));
        std::string const saved = eng ? "OnSave(" + path.ToUtf8() + ")" : "OnSave";
        EXPECT_EQ(this->log.Find(this->Line(loader, saved)).tag, this->kName);
        EXPECT_EQ(this->log.Count(ANDROID_LOG_INFO, this->folder.GetPath().string()) > 0, eng);
    }
}

TYPED_TEST(EitherFrontEnd, DestroyedWhileCallingItWaitsForTheCall) {
    String const path = this->WritePicture("a.mki");
    Awaited<bool> entered, mayLeave;
    bool left = false; // not atomic: the destructor is what makes it visible
    auto callback = MakeCallback<TypeParam>(this->listener);
    callback.onLoad = [&](int, String const&, auto&) {
        entered.Set(true);
        mayLeave.AwaitAtLeast(true);
        // Time for a destructor that does not wait.
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        left = true;
    };
    auto loader = std::make_unique<TypeParam>("pad", &callback);
    loader->RequestLoad(1, path, this->queue.get());
    loader->RequestLoad(2, path, this->queue.get());
    entered.AwaitAtLeast(true);
    std::string const line = this->Line(*loader, std::string("~") + this->kName);
    std::thread destroyer([&] {
        loader.reset();
        EXPECT_TRUE(left);
    });
    this->log.AwaitLines(line);
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
        // While the render thread reads the tag.
        for (int i = 0; i < 100; ++i) gpuBitmap->SetTag(i % 2 == 0 ? "a page" : "another one");
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
