// The library over the device without a driver: what an application's own tests can rely on.
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"
#include "tests/support/TestImages.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

Picture Read(IMKBitmap& bitmap) {
    Picture image(8, 40);
    bitmap.GetBitmapData(bitmap.GetBitmapRect(), image.pixels.data());
    return image;
}

TEST(NullDevice, ImagesAreRealAndDrawsAreCounted) {
    RenderThreadOptions options;
    options.limits.maxTextureSize = 16;
    auto const queue = RenderThread::Start(options, nullptr);
    ASSERT_TRUE(queue);
    EXPECT_EQ(queue->GetContextInfo().path, "no driver");
    EXPECT_EQ(queue->GetContextInfo().maxTextureSize, 16);
    {
        Picture const pattern = MakeGradient(8, 40); // several strips
        auto const bitmap = NewBitmap(*queue, 8, 40, pattern.pixels.data());
        auto const clone = RefPtr<IMKBitmap>::Adopt(bitmap->Clone());
        auto const canvas = NewCanvas(*queue, bitmap);
        canvas->DrawRect(RectF(1, 1, 5, 30), nullptr); // draws nothing
        EXPECT_EQ(Read(*clone), pattern);
        canvas->SetClipRect(2, 0, 3, 40, IMKCanvasBase::Intersect);
        canvas->Clear(1, 0, 0, 1);
        Color const red{255, 0, 0, 255};
        EXPECT_EQ(Read(*bitmap), pattern.With(2, 0, MakeChecker(3, 40, 1, red, red)));
    }
    queue->WaitForTasks();
    RendererStatistics statistics;
    queue->Call([&] { statistics = RendererFactory::GetStatistics(); });
    EXPECT_EQ(statistics.drawRequests, 2u); // the rectangle touches two strips
    EXPECT_EQ(statistics.textures + statistics.renderTargets + statistics.graphicsObjects, 0);
    EXPECT_EQ(statistics.errors, 0u);
}

} // namespace
} // namespace Moka::Testing
