// Screen bitmaps: which frame buffer, which rows, and the references of both flavours.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/MKScreenBitmap.h"
#include "moka/graphics/bitmap/MKScreenBitmapRT.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <gmock/gmock.h>

#include <limits>

namespace Moka::Testing {
namespace {

using ::testing::Contains;
using ::testing::Each;
using ::testing::ElementsAre;

class ScreenBitmap : public BitmapFixture {
protected:
    using BitmapPtr = RefPtr<IMKBitmap>;

    BitmapPtr NewScreen(int x, int y, int width, int height, int useDefault = 1) {
        return BitmapPtr::Adopt(
            MKGraphicsFactory::CreateScreenBitmap(&queue, x, y, width, height, useDefault, 1));
    }
    BitmapPtr NewScreenRT(int x, int y, int width, int height, int useDefault = 1) {
        return BitmapPtr::Adopt(
            MKGraphicsFactory::CreateScreenBitmap(&queue, x, y, width, height, useDefault, 0));
    }
    // Clears the frame buffer to black but for one red pixel.
    static void PaintHost(int x, int y) {
        OnRenderThread const here;
        auto const screen =
            BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(nullptr, 0, 0, 20, 10, 1, 0));
        IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
        screen->GetBitmapWritable()->ClearColorRT(0, 0, 0, 1);
        rasterizer->SetScissorRect({x, y, 1, 1});
        rasterizer->SetScissorEnabled(true);
        screen->GetBitmapWritable()->ClearColorRT(1, 0, 0, 1);
        rasterizer->SetScissorEnabled(false);
    }
    static constexpr unsigned kBlack = 0xFF000000u;
    static constexpr unsigned kRed = 0xFF0000FFu;

    LogCapture log;
};

void Store(unsigned pixel, void* userData) { *static_cast<unsigned*>(userData) = pixel; }
void Count(Rect const&, void*, void* userData) { ++*static_cast<int*>(userData); }

TEST_F(ScreenBitmap, AnEdgeBeyondTheRangeOfIntIsCutToIt) {
    constexpr int kMost = std::numeric_limits<int>::max();
    constexpr int kLeast = std::numeric_limits<int>::min();
    auto const screen = NewScreen(kMost - 1, kLeast, 20, -2);
    EXPECT_EQ(screen->GetBitmapRect(), Rect(kMost - 1, kLeast, kMost, kLeast));
}

TEST_F(ScreenBitmap, StandsForTheFrameBufferAskedForAndClonesForTheOther) {
    auto const usual = NewScreen(3, 4, 20, 10);
    auto const current = NewScreen(3, 4, 20, 10, 0);
    auto const clone = BitmapPtr::Adopt(usual->Clone());
    EXPECT_EQ(clone->GetBitmapRect(), Rect(3, 4, 23, 14));
    queue.RunAll();
    BitmapPtr directClone;
    {
        OnRenderThread const here;
        directClone = BitmapPtr::Adopt(NewScreenRT(3, 4, 20, 10, 0)->Clone());
    }
    EXPECT_EQ(queue.GetPendingCount(), 1) << "a clone is caller-side";
    queue.RunAll();
    std::vector<std::string> created;
    for (RecordedCall const& call : RecordingRenderer::GetCalls())
        if (call.operation == "Create") created.push_back(call.arguments.substr(0, call.arguments.find(' ')));
    EXPECT_THAT(created, ElementsAre("default", "current", "current", "current", "default"));
    EXPECT_EQ(CountOf(usual.Get()), 1);
    EXPECT_EQ(usual->GetBitmapReadable(), nullptr);
    EXPECT_EQ(usual->GetTextureBitmap(), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateScreenBitmap(nullptr, 0, 0, 1, 1, 1, 1), nullptr);
}

TEST_F(ScreenBitmap, TheProjectionTurnsRowsOverAndIgnoresThePlace) {
    auto const screen = NewScreen(3, 4, 20, 10);
    Matrix4<float> m = screen->GetBitmapWritable()->GetProjectionMatrix();
    Matrix4<float> expected(0.0f);
    expected[0] = 0.1f;
    expected[5] = -0.2f;
    std::uint32_t const depthBits = 0xB8000100u;
    std::memcpy(&expected[10], &depthBits, 4);
    expected[12] = -1;
    expected[13] = 1;
    expected[14] = -0.0f;
    expected[15] = 1;
    EXPECT_EQ(m, expected);
    m = NewScreen(0, 0, 0, 0)->GetBitmapWritable()->GetProjectionMatrix();
    EXPECT_TRUE(std::isnan(m[12]));
}

TEST_F(ScreenBitmap, APixelIsReadOneRowOffAndNeverReturnedOnTheCallersSide) {
    auto const screen = NewScreen(0, 0, 20, 10);
    auto const at = [&](int x, int y) {
        unsigned pixel = 1;
        screen->GetPixelAsync(Point(x, y), &pixel, Store);
        queue.RunAll();
        return pixel;
    };
    PaintHost(7, 6);
    EXPECT_EQ(at(7, 4), kRed) << "row 10 - 4";
    EXPECT_EQ(at(7, 3), kBlack);
    EXPECT_EQ(at(7, 0), 0u) << "row 10 is outside";
    EXPECT_EQ(screen->GetPixel(Point(7, 4)), 0u);
    EXPECT_EQ(queue.GetWaitCount(), 1);
    PaintHost(19, 1);
    EXPECT_EQ(at(19, 9), kRed);
    EXPECT_EQ(at(20, 10), kRed) << "inclusive: the same one";
    for (Point const& p : {Point(21, 5), Point(-1, 5), Point(5, 11), Point(5, -1)})
        EXPECT_EQ(at(p.x, p.y), 0u);
    EXPECT_EQ(CountOf(screen.Get()), 1);
    screen->GetPixelAsync(Point(1, 1), nullptr, nullptr);

    OnRenderThread const here;
    auto const direct = NewScreenRT(0, 0, 20, 10);
    EXPECT_EQ(direct->GetPixel(Point(19, 9)), kRed);
    unsigned pixel = 1;
    direct->GetPixelAsync(Point(19, 9), &pixel, Store);
    EXPECT_EQ(pixel, kRed);
    EXPECT_EQ(CountOf(direct.Get()), 1);
}

TEST_F(ScreenBitmap, ABlockIsReadUnturnedIntoItsPlaceInTheDestination) {
    auto const screen = NewScreen(2, 1, 18, 9);
    PaintHost(5, 3);
    std::vector<unsigned> pixels(20 * 12, 1);
    int calls = 0;
    auto const check = [&] {
        for (int y = 0; y < 12; ++y) {
            for (int x = 0; x < 20; ++x) {
                // From (2, 1), which lies at (3, 3), to the end of a target that is 18 wide and 9 high.
                bool const inside = x >= 3 && x < 19 && y >= 3 && y < 11;
                unsigned const expected = !inside ? 1 : x == 6 && y == 5 ? kRed : kBlack;
                ASSERT_EQ(pixels[static_cast<std::size_t>(y * 20 + x)], expected) << x << ' ' << y;
            }
        }
        pixels.assign(pixels.size(), 1);
    };
    Rect const asked(-1, -2, 19, 10);
    screen->GetBitmapData(asked, pixels.data());
    EXPECT_EQ(queue.GetWaitCount(), 1);
    check();
    screen->GetBitmapDataAsync(asked, pixels.data(), &calls, Count);
    queue.RunAll();
    check();
    screen->GetBitmapDataAsync(Rect(30, 30, 40, 40), pixels.data(), &calls, Count);
    queue.RunAll();
    EXPECT_EQ(calls, 2) << "also for nothing";
    EXPECT_THAT(pixels, Each(1u));
    EXPECT_EQ(CountOf(screen.Get()), 1);
    OnRenderThread const here;
    auto const direct = NewScreenRT(2, 1, 18, 9);
    direct->GetBitmapDataAsync(asked, pixels.data(), &calls, Count);
    EXPECT_EQ(calls, 3);
    check();
    direct->GetBitmapData(asked, pixels.data());
    check();
}

TEST_F(ScreenBitmap, ActivationIsPostedDeactivationIsNotAndAttachingOnlyCounts) {
    auto const screen = NewScreen(0, 0, 20, 10);
    IMKBitmapWritable* const writable = screen->GetBitmapWritable();
    IMKBitmapCanvasAttachable* const attachable = screen->GetBitmapCanvasAttachable();
    writable->ActivateFrameBuffer();
    EXPECT_EQ(CountOf(screen.Get()), 3);
    queue.RunAll();
    EXPECT_EQ(CountOf(screen.Get()), 1);
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "target 1");
    writable->DeactivateFrameBuffer(DiscardFramebufferBoth);
    EXPECT_EQ(queue.GetPendingCount(), 0);
    attachable->AttachToCanvas();
    EXPECT_EQ(CountOf(screen.Get()), 2);
    attachable->AttachToCanvasRT(true);
    EXPECT_EQ(CountOf(screen.Get()), 2);
    attachable->AttachToCanvasRT(false);
    screen->Ref();
    attachable->DetachFromCanvasRT(true);
    attachable->DetachFromCanvas();
    EXPECT_EQ(CountOf(screen.Get()), 1);

    OnRenderThread const here;
    writable->ClearDepthStencilRT(true, 1, true, 1);
    EXPECT_EQ(RecordingRenderer::CountCalls("ClearDepthStencil"), 0);
    screen->Ref();
    writable->DeactivateFrameBufferRT(true, DiscardFramebufferDepthStencil);
    EXPECT_EQ(CountOf(screen.Get()), 1);
    auto const direct = NewScreenRT(0, 0, 20, 10);
    direct->GetBitmapWritable()->ActivateFrameBuffer();
    direct->GetBitmapWritable()->DeactivateFrameBuffer(DiscardFramebufferColor);
    std::vector<std::string> const calls = RecordingRenderer::TakeCalls();
    EXPECT_THAT(calls, Contains("target 1 Deactivate 0 1"));
    EXPECT_THAT(calls, Contains("target 2 Deactivate 1 0"));
}

TEST_F(ScreenBitmap, AnUnknownTypeGivesOneErrorLineAndAnInertBitmap) {
    auto const type = static_cast<MKBitmap::FramebufferType>(5);
    auto const use = [&](IMKBitmap& screen) {
        unsigned pixel = 1;
        screen.GetPixelAsync(Point(1, 1), &pixel, Store);
        screen.GetBitmapWritable()->ActivateFrameBufferRT(false);
        screen.GetBitmapWritable()->ClearColorRT(0, 0, 0, 0);
        screen.GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
        queue.RunAll();
        EXPECT_EQ(pixel, 0u);
    };
    auto const posted = BitmapPtr::Adopt(new MKScreenBitmap(&queue, 0, 0, 4, 4, type));
    queue.RunAll();
    RecordingRenderer::DeclareRenderThread();
    auto const direct = BitmapPtr::Adopt(new MKScreenBitmapRT(&queue, 0, 0, 4, 4, type));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre("createRenderTargetRT Invalid framebuffer type",
                                                             "MKScreenBitmapRT Invalid framebuffer type"));
    EXPECT_EQ(log.GetLines()[0].tag, "mok_log");
    EXPECT_EQ(log.GetLines()[0].format, "%s Invalid framebuffer type");
    use(*posted.Get());
    use(*direct.Get());
}

TEST_F(ScreenBitmap, RefusedOperationsKeepTheirReference) {
    refuse = true;
    IMKBitmap* const screen = MKGraphicsFactory::CreateScreenBitmap(&picky, 0, 0, 4, 4, 1, 1);
    EXPECT_EQ(CountOf(screen), 2);
    EXPECT_EQ(screen->GetPixel(Point(1, 1)), 0u);
    unsigned pixels[16] = {};
    screen->GetBitmapData(Rect(0, 0, 4, 4), pixels);
    screen->GetBitmapWritable()->ActivateFrameBuffer();
    EXPECT_EQ(picky.GetWaitCount(), 2) << "waits all the same";
    EXPECT_EQ(CountOf(screen), 5);
    for (int i = 0; i < 5; ++i) screen->Unref(); // what the refusals leak, by design
}

} // namespace
} // namespace Moka::Testing
