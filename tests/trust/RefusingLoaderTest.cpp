// The loader over a queue that refuses at random: every accepted request calls back once, but for the saves
// whose read-back was refused, which never do.
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Faults.h"
#include "tests/trust/LeakLedger.h"

#include <algorithm>
#include <atomic>
#include <gtest/gtest.h>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

constexpr int kRequests = 2000;
constexpr int kWidth = 5;
constexpr int kHeight = 4;

// How often each id was called back, and how often all together.
struct Calls {
    std::vector<std::atomic<int>> counts = std::vector<std::atomic<int>>(kRequests);
    std::atomic<int> total{0};

    void Count(int id) {
        ++counts[static_cast<std::size_t>(id)];
        ++total;
    }
    template <class Loader>
    typename Loader::Callback MakeCallback() {
        typename Loader::Callback callback;
        callback.onLoad = [this](int id, String const&, auto&) { Count(id); };
        callback.onLoadError = [this](int id, String const&) { Count(id); };
        callback.onSave = [this](int id, String const&, void*) { Count(id); };
        callback.onSaveError = [this](int id, String const&, void*) { Count(id); };
        return callback;
    }
};

class RefusingLoaderTest : public ::testing::TestWithParam<int> {
protected:
    void SetUp() override {
        MKBitmapFactory_UseNativeDecoder();
        RendererTrace::Reset();
        RendererTrace::KeepRecords(false);
        ASSERT_TRUE(RendererFactory::AttachContext());
        RendererTrace::DeclareNoRenderThread();
        queue.SetAroundRun([] { RendererTrace::DeclareRenderThread(); },
                           [] { RendererTrace::DeclareNoRenderThread(); });
        ASSERT_TRUE(MKBitmapLoader::startEventLoopBySelf());
    }
    void TearDown() override {
        RendererTrace::DeclareRenderThread();
        RendererFactory::DetachContext();
    }

    String Path(char const* name) const { return String(folder.Path(name)); }
    RefPtr<IMKBitmap> MakeBitmap() {
        return RefPtr<IMKBitmap>::Adopt(
            MKGraphicsFactory::CreateBitmap(&queue, kWidth, kHeight, image.pixels.data(), false, 1, false));
    }
    unsigned char* NewPixels() const {
        auto* const pixels = new unsigned char[image.pixels.size()];
        std::copy(image.pixels.begin(), image.pixels.end(), pixels);
        return pixels;
    }
    void RequestAll(MKBitmapLoader& gpu, BitmapLoader& cpu) {
        for (int id = 0; id < kRequests; ++id) {
            switch (id % 5) {
            case 0:
                EXPECT_TRUE(gpu.RequestLoad(id, Path("a.mki"), &queue));
                break;
            case 1:
                EXPECT_TRUE(cpu.RequestLoad(id, Path("a.mki"), &queue));
                break;
            case 2:
                EXPECT_TRUE(gpu.RequestSave(id, Path("b.mki"), *MakeBitmap(), nullptr, 100));
                break;
            case 3:
                EXPECT_TRUE(cpu.RequestSave(id, Path("c.mki"), NewPixels(), kWidth, kHeight, nullptr, 100));
                break;
            default:
                EXPECT_TRUE(gpu.RequestLoad(id, Path("missing.mki"), &queue));
            }
            queue.RunAll();
            if (id % 50 == 0) log.Clear();
        }
    }
    // The refused tasks that read a strip back.
    int CountRefusedReadBacks() {
        int count = 0;
        for (auto const& [kind, refused] : queue.GetLedger().GetKinds())
            if (kind.find("(Moka::Rect const&, void*, void*,") != std::string::npos) count += refused;
        return count;
    }

    TempFolder const folder;
    TestImage image = MakeGradient(kWidth, kHeight);
    UnreliableQueue queue{5u, GetParam()};
    LogCapture log;
};

TEST_P(RefusingLoaderTest, EveryRequestCallsBackOnceButForRefusedReadBacks) {
    ASSERT_TRUE(SaveImage(image, folder.Path("a.mki")));
    Calls calls;
    auto gpuCallback = calls.MakeCallback<MKBitmapLoader>();
    auto cpuCallback = calls.MakeCallback<BitmapLoader>();
    {
        MKBitmapLoader gpu(nullptr, &gpuCallback);
        BitmapLoader cpu(nullptr, &cpuCallback);
        RequestAll(gpu, cpu);
        int const silent = CountRefusedReadBacks();
        while (calls.total < kRequests - silent) {
            queue.RunAll();
            std::this_thread::yield();
        }
        gpu.WaitForCallback();
        cpu.WaitForCallback();
        MKBitmapLoader::WaitUntilMsgQueueRequired();
        queue.RunAll();
        EXPECT_GT(silent, 0);
        EXPECT_EQ(std::count(calls.counts.begin(), calls.counts.end(), 1), kRequests - silent);
        for (int id = 0; id < kRequests; ++id) {
            if (id % 5 == 2) continue;
            EXPECT_EQ(calls.counts[static_cast<std::size_t>(id)], 1) << id;
        }
    }
    EXPECT_EQ(queue.CountOffered(), std::int64_t{queue.GetPostedCount()} + queue.GetRefusedCount());
    EXPECT_EQ(queue.GetLedger().CountEntries(), queue.GetRefusedCount());
    queue.SetReliable(true);
    RendererTrace::DeclareRenderThread();
    queue.GetLedger().Settle();
    RendererTrace::DeclareNoRenderThread();
    queue.RunAll();
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), 0);
    EXPECT_EQ(Faults::CountWrongFrees(), 0);
    EXPECT_TRUE(RendererTrace::GetViolations().empty());
}

INSTANTIATE_TEST_SUITE_P(PerCent, RefusingLoaderTest, ::testing::Values(1, 10, 50));

} // namespace
} // namespace Moka::Testing
