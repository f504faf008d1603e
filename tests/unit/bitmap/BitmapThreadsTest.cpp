// Bitmaps from many threads at once, over a real queue and its thread. Meant for the thread sanitizer.
#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/bitmap/MKGraphicsFactory.h"
#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RecordingRenderer.h"
#include "tests/support/TestImages.h"

#include <atomic>
#include <cstring>
#include <gtest/gtest.h>
#include <random>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
constexpr int kMaxSide = 16;

// A render thread without GL: the recording renderer's.
class RecordingThread final : public TaskQueue {
public:
    RecordingThread() {
        RecordingRenderer::Reset();
        RecordingRenderer::SetMaxTextureSize(kMaxSide);
        mThread = std::thread([this] {
            RendererFactory::AttachContext();
            mReady = true;
            Run([] {});
            RendererFactory::DetachContext();
        });
        while (!mReady) std::this_thread::yield();
    }
    ~RecordingThread() override {
        RequestStop();
        mThread.join();
    }

private:
    std::atomic<bool> mReady{false};
    std::thread mThread;
};

// One random step in the life of the bitmaps a thread works with.
void Step(IGLMsgQueue* queue, std::mt19937& random, std::vector<BitmapPtr>& bitmaps, TestImage const& image) {
    auto const pick = [&](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
    if (bitmaps.empty() || pick(5) == 0) {
        bitmaps.push_back(BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(
            queue, image.width, image.height, image.pixels.data(), false, 1, false)));
        return;
    }
    auto const index = static_cast<std::size_t>(pick(static_cast<int>(bitmaps.size())));
    BitmapPtr const bitmap = bitmaps[index];
    switch (pick(7)) {
    case 0:
        bitmaps.push_back(BitmapPtr::Adopt(bitmap->Clone()));
        break;
    case 1:
        bitmap->GetTextureBitmap()->UpdateBitmap(image.pixels.data(), image.GetStride());
        break;
    case 2:
        bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterNearest);
        break;
    case 3: {
        std::vector<unsigned char> pixels(image.pixels.size());
        bitmap->GetBitmapData(bitmap->GetBitmapRect(), pixels.data());
        break;
    }
    case 4:
        if (IMKSubBitmap* const strip = bitmap->GetTextureBitmap()->GetSubBitmap(0)) {
            strip->SetTag("strip");
            RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
        }
        break;
    default:
        bitmaps.erase(bitmaps.begin() + static_cast<std::ptrdiff_t>(index));
        break;
    }
}

TEST(BitmapThreads, RandomLivesOnFourThreadsLeaveNothingBehind) {
    TestImage const image = MakeGradient(5, 3 * kMaxSide + 1);
    {
        RecordingThread queue;
        std::vector<std::thread> threads;
        for (unsigned seed = 0; seed < 4; ++seed)
            threads.emplace_back([&, seed] {
                std::mt19937 random(seed);
                std::vector<BitmapPtr> bitmaps;
                for (int i = 0; i < 300; ++i) Step(&queue, random, bitmaps, image);
            });
        for (std::thread& thread : threads) thread.join();
    }
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_TRUE(RecordingRenderer::GetViolations().empty());
}

TEST(BitmapThreads, OneBitmapReadAndSharedByEightThreads) {
    TestImage const image = MakeGradient(5, 2 * kMaxSide);
    std::atomic<int> wrong{0};
    {
        RecordingThread queue;
        auto const bitmap = BitmapPtr::Adopt(
            MKGraphicsFactory::CreateBitmap(&queue, 5, 2 * kMaxSide, image.pixels.data(), false, 1, false));
        std::vector<std::thread> threads;
        for (int t = 0; t < 8; ++t)
            threads.emplace_back([&] {
                for (int i = 0; i < 20; ++i) {
                    auto const clone = BitmapPtr::Adopt(bitmap->Clone());
                    std::vector<unsigned char> pixels(image.pixels.size());
                    clone->GetBitmapData(clone->GetBitmapRect(), pixels.data());
                    if (pixels != image.pixels) ++wrong;
                }
            });
        for (std::thread& thread : threads) thread.join();
    }
    EXPECT_EQ(wrong, 0);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
}

} // namespace
} // namespace Moka::Testing
