// The library over the device without a driver: what an application's own tests can rely on.
#include "moka/base/RefPtr.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"

#include <gtest/gtest.h>

#include <array>
#include <thread>
#include <vector>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 8;
constexpr int kHeight = 40; // several strips
using Pixels = std::vector<std::uint32_t>;

RefPtr<IMKBitmap> MakeBitmap(IGLMsgQueue* queue, Pixels const* pixels) {
    return RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(
        queue, kWidth, kHeight, pixels ? pixels->data() : nullptr, false, 1, false));
}

Pixels Read(IMKBitmap& bitmap) {
    Pixels pixels(kWidth * kHeight);
    bitmap.GetBitmapData(bitmap.GetBitmapRect(), pixels.data());
    return pixels;
}

// One application thread: uploads, clones, clears, draws, reads back.
void Work(RenderThread& queue, std::uint32_t seed) {
    for (std::uint32_t round = 0; round < 20; ++round) {
        Pixels pattern(kWidth * kHeight);
        for (std::uint32_t i = 0; i < pattern.size(); ++i) {
            pattern[i] = seed * 1000003u + round * 7919u + i * 31u;
        }
        RefPtr<IMKBitmap> const bitmap = MakeBitmap(&queue, &pattern);
        RefPtr<IMKBitmap> const clone = RefPtr<IMKBitmap>::Adopt(bitmap->Clone());
        RefPtr<IMKCanvas> const canvas =
            RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, bitmap.Get(), 1));
        MKPaint const paint;
        canvas->DrawRect(RectF(1, 1, 5, 30), &paint); // draws nothing
        EXPECT_EQ(Read(*clone), pattern);
        canvas->SetClipRect(2, 0, 3, 40, IMKCanvasBase::Intersect);
        canvas->Clear(1, 0, 0, 1);
        Pixels expected = pattern;
        for (std::size_t i = 0; i < expected.size(); ++i) {
            if (i % kWidth >= 2 && i % kWidth < 5) expected[i] = 0xFF0000FFu;
        }
        EXPECT_EQ(Read(*bitmap), expected);
    }
}

TEST(NullDevice, ImagesOfManyThreadsAreRealAndDrawsAreCounted) {
    RenderThreadOptions options;
    options.limits.maxTextureSize = 16;
    std::string error;
    std::unique_ptr<RenderThread> const queue = RenderThread::Start(options, &error);
    ASSERT_TRUE(queue) << error;
    EXPECT_EQ(queue->GetContextInfo().path, "no driver");
    EXPECT_EQ(queue->GetContextInfo().maxTextureSize, 16);
    std::vector<std::thread> threads;
    for (std::uint32_t i = 0; i < 3; ++i) threads.emplace_back([&, i] { Work(*queue, i); });
    for (std::thread& thread : threads) thread.join();
    queue->WaitForTasks();
    RendererStatistics statistics;
    queue->Call([&] { statistics = RendererFactory::GetStatistics(); });
    EXPECT_EQ(statistics.drawRequests, 3u * 20u * 2u); // the rectangle touches two strips
    EXPECT_EQ(statistics.textures + statistics.renderTargets + statistics.graphicsObjects, 0);
    EXPECT_EQ(statistics.errors, 0u);
}

} // namespace
} // namespace Moka::Testing
