// The two front ends: what they log and call, and what happens when they are cancelled or destroyed.
#include "tests/unit/loader/LoaderFixture.h"

#include "moka/graphics/loader/BitmapLoader.h"

#include <chrono>
#include <cstdio>
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

    static std::string Format(char const* format, void const* address) {
        char text[64];
        std::snprintf(text, sizeof text, format, address);
        return text;
    }
    // A line of the front end named "pad".
    std::string Line(L const& loader, std::string const& rest) const {
        return kName + Format("[%p:pad] ", &loader) + rest;
    }
};
using FrontEnds = ::testing::Types<MKBitmapLoader, BitmapLoader>;
TYPED_TEST_SUITE(EitherFrontEnd, FrontEnds, );

TYPED_TEST(EitherFrontEnd, LogsAndCallsInBothKindsOfBuild) {
    Picture const image = MakeGradient(5, 4);
    String const path = this->WritePicture("a.mki");
    String const missing = this->Path("missing.mki");
    String const bad = this->Path("bad.unknown");
    for (bool const eng : {false, true}) {
        System::SetBuildTypeEngMode(eng);
        RecordingListener told;
        // The path, where the build shows it, between what stands around it.
        auto const with = [&](std::string const& before, String const& shown, std::string const& after) {
            return before + (eng ? shown.ToUtf8() : "") + after;
        };
        std::string const comma = eng ? ", " : "";
        void const* loaded = nullptr;
        auto callback = MakeCallback<TypeParam>(told);
        callback.onLoad = [&](int, String const&, auto& bitmap) { loaded = &bitmap; };
        auto loader = std::make_unique<TypeParam>("pad", &callback);
        this->log.Clear();
        unsigned char* const pixels = this->NewPixels(image);
        EXPECT_TRUE(loader->RequestLoad(1, path, this->queue.get()));
        this->AwaitAll();
        EXPECT_TRUE(loader->RequestLoad(2, missing, this->queue.get(), 3, 2));
        EXPECT_TRUE(loader->RequestSave(3, path, pixels, 5, 4, nullptr, 100));
        EXPECT_FALSE(loader->RequestSave(4, path, nullptr, 5, 4, nullptr, 100));
        EXPECT_TRUE(loader->RequestSave(5, bad, this->NewPixels(image), 5, 4, nullptr, 100));
        this->AwaitAll();
        loader->CancelLoadRequest(6);
        loader->CancelAllLoadRequest();
        EXPECT_EQ(told.GetEvents(), (Events{"error 2", "save 3", "save error 5"}));
        for (std::string const& text : {
                 with("RequestLoad(1" + comma, path, ") ret true"),
                 with("OnLoad(1" + comma, path, this->Format(", %p)", loaded)),
                 with("RequestLoad(2" + comma, missing, ") ret true"),
                 with("OnLoadError(2" + comma, missing, ")"),
                 with("RequestSave(", path, comma + this->Format("%p) ret true", pixels)),
                 with(eng ? "OnSave(" : "OnSave", path, eng ? ")" : ""),
                 with("RequestSave(", path, comma + this->Format("%p) ret false", nullptr)),
                 with(eng ? "OnSaveError(" : "OnSaveError", bad, eng ? ")" : ""),
                 std::string("CancelLoadRequest(6)"),
                 std::string("CancelAllLoadRequest()"),
             }) {
            LogLine const line = this->log.Find(this->Line(*loader, text));
            EXPECT_EQ(line.priority, ANDROID_LOG_INFO) << text;
            EXPECT_EQ(line.tag, this->kName) << text;
        }
        std::string const last = this->Line(*loader, std::string("~") + this->kName);
        loader.reset();
        EXPECT_TRUE(this->log.Has(last));
    }
}

TYPED_TEST(EitherFrontEnd, ListsAreHandedOn) {
    auto callback = MakeCallback<TypeParam>(this->listener);
    std::size_t count = 0;
    callback.onLoadList = [&](int, String const&, auto& bitmaps) { count = bitmaps.size(); };
    TypeParam loader("pad", &callback);
    std::vector<Bitmap*> cpu(3);
    std::vector<IMKBitmap*> graphics(3);
    for (bool const eng : {false, true}) {
        System::SetBuildTypeEngMode(eng);
        loader.OnLoadList(1, "p", cpu);
        loader.OnLoadList(1, "p", graphics);
        void const* const list =
            std::is_same_v<TypeParam, BitmapLoader> ? static_cast<void*>(&cpu) : &graphics;
        EXPECT_TRUE(this->log.Has(this->Line(loader, std::string("OnLoadList(1, ") + (eng ? "p, " : "") +
                                                         this->Format("%p, size3)", list))));
    }
    EXPECT_EQ(count, 3u);
    EXPECT_EQ(this->log.Count(ANDROID_LOG_INFO, "OnLoadList"), 2) << "only its own kind";
}

TYPED_TEST(EitherFrontEnd, WithoutANameOnlyThePairIsLogged) {
    {
        TypeParam loader(nullptr, nullptr);
        loader.RequestLoad(1, this->WritePicture("a.mki"), this->queue.get());
        loader.RequestLoad(2, this->Path("missing.mki"), this->queue.get());
        loader.CancelLoadRequest(3);
        this->AwaitAll();
    }
    EXPECT_EQ(this->LinesOf(this->kName), (Events{"OnCallbackPending", "OnCallbackCompleted",
                                                  "OnCallbackPending", "OnCallbackCompleted"}));
}

TYPED_TEST(EitherFrontEnd, DestroyedWhileDecodingItCallsNobodyAndDoesNotWait) {
    String const path = this->WritePicture("a.mki");
    auto callback = MakeCallback<TypeParam>(this->listener);
    CodecGate gate;
    {
        TypeParam loader("pad", &callback);
        loader.RequestLoad(1, path, this->queue.get());
        loader.RequestLoad(2, path, this->queue.get());
        gate.AwaitArrival();
    } // returns with the gate still closed
    gate.Open();
    this->AwaitAll();
    EXPECT_EQ(this->listener.GetEvents(), Events{});
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

TYPED_TEST(EitherFrontEnd, ACallbackMayRequestCancelAndDestroyOthers) {
    String const path = this->WritePicture("a.mki");
    auto callback = MakeCallback<TypeParam>(this->listener);
    TypeParam loader("pad", &callback);
    auto other = std::make_unique<TypeParam>("other", &callback);
    Awaited<bool> done;
    auto busy = MakeCallback<TypeParam>(this->listener);
    busy.onLoadError = [&](int, String const&) {
        other.reset();
        loader.CancelLoadRequest(1);
        EXPECT_TRUE(loader.RequestLoad(1, path, nullptr, 2, 2));
        EXPECT_TRUE(loader.RequestSave(3, this->Path("s.png"), new unsigned char[4](), 1, 1, nullptr, 100));
        loader.CancelAllLoadRequest();
        done.Set(true);
    };
    TypeParam acting("acting", &busy);
    CodecGate gate;
    acting.RequestLoad(0, this->Path("missing.mki"), this->queue.get());
    loader.RequestLoad(1, path, this->queue.get());
    other->RequestLoad(2, path, this->queue.get());
    gate.Open();
    done.AwaitAtLeast(true);
    this->AwaitAll();
    EXPECT_EQ(this->listener.GetEvents(), Events{"save 3"});
    loader.WaitForCallback();
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

TEST_F(FrontEnd, CallbacksAreCopiedAndMayThrow) {
    auto callback = MakeCallback<BitmapLoader>(listener);
    callback.onLoadError = [this](int id, String const& path) {
        listener.OnLoadError(id, path);
        throw id;
    };
    BitmapLoader loader("pad", &callback);
    callback = BitmapLoader::Callback();
    for (int id : {1, 2}) loader.RequestLoad(id, Path("missing.mki"), queue.get());
    AwaitAll();
    EXPECT_EQ(listener.GetEvents(), (Events{"error 1", "error 2"}));
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "OnLoadError threw something that is no std::exception"), 2);
    loader.WaitForCallback();
}

} // namespace
} // namespace Moka::Testing
