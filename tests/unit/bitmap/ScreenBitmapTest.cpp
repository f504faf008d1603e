// Screen bitmaps: which frame buffer, which rows, and the references of both flavours.
#include "moka/base/log/AndroidLog.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <gmock/gmock.h>

#include <algorithm>

namespace Moka::Testing {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;

class ScreenBitmap : public BitmapFixture {
protected:
    BitmapPtr NewScreen(int x, int y, int width, int height, int useDefault = 1, int useQueue = 1) {
        return BitmapPtr::Adopt(
            MKGraphicsFactory::CreateScreenBitmap(&queue, x, y, width, height, useDefault, useQueue));
    }
    BitmapPtr NewScreenRT(int x, int y, int width, int height, int useDefault = 1) {
        return NewScreen(x, y, width, height, useDefault, 0);
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

TEST_F(ScreenBitmap, StandsForTheFrameBufferAskedForAndClonesForTheOther) {
    auto const usual = NewScreen(3, 4, 20, 10);
    auto const current = NewScreen(3, 4, 20, 10, 0);
    auto const clone = BitmapPtr::Adopt(usual->Clone());
    EXPECT_EQ(clone->GetBitmapRect(), Rect(3, 4, 23, 14));
    queue.RunAll();
    EXPECT_THAT(
        RendererTrace::TakeCalls(),
        ElementsAre(HasSubstr("Create default"), HasSubstr("Create current"), HasSubstr("Create current")));
}

TEST_F(ScreenBitmap, APixelIsReadOneRowOffAndNeverReturnedOnTheCallersSide) {
    auto const screen = NewScreen(0, 0, 20, 10);
    struct {
        Point asked;
        unsigned read;
    } const cases[] = {
        {Point(19, 9), kRed},   {Point(20, 10), kRed},                    // inclusive: the same one
        {Point(19, 8), kBlack}, {Point(18, 9), kBlack}, {Point(7, 0), 0}, // row 10 is outside
        {Point(21, 5), 0},      {Point(-1, 5), 0},      {Point(5, 11), 0}, {Point(5, -1), 0},
    };
    PaintHost(19, 1);
    for (auto const& [asked, read] : cases) {
        Seen seen;
        screen->GetPixelAsync(asked, &seen, Seen::OnPixel);
        queue.RunAll();
        EXPECT_EQ(seen.pixel, read) << asked.x << ", " << asked.y;
    }
    EXPECT_EQ(screen->GetPixel(Point(19, 9)), 0u);
    EXPECT_EQ(queue.GetWaitCount(), 1);
    EXPECT_EQ(CountOf(screen.Get()), 1);
    screen->GetPixelAsync(Point(1, 1), nullptr, nullptr);

    OnRenderThread const here;
    auto const direct = NewScreenRT(0, 0, 20, 10);
    EXPECT_EQ(direct->GetPixel(Point(19, 9)), kRed);
    Seen seen;
    direct->GetPixelAsync(Point(19, 9), &seen, Seen::OnPixel);
    EXPECT_EQ(seen.pixel, kRed);
    EXPECT_EQ(CountOf(direct.Get()), 1);
}

TEST_F(ScreenBitmap, ABlockIsReadUnturnedIntoItsPlaceInTheDestination) {
    auto const screen = NewScreen(2, 1, 18, 9);
    PaintHost(5, 3);
    // From (2, 1), which lies at (3, 3), to the end of a target that is 18 wide and 9 high.
    std::vector<unsigned> expected(20 * 12, 1);
    for (std::size_t y = 3; y < 11; ++y) std::fill_n(&expected[y * 20 + 3], 16, kBlack);
    expected[5 * 20 + 6] = kRed;
    std::vector<unsigned> pixels(20 * 12, 1);
    screen->GetBitmapData(Rect(-1, -2, 19, 10), pixels.data());
    EXPECT_EQ(pixels, expected);
}

TEST_F(ScreenBitmap, ActivationIsPostedDeactivationIsNotAndAttachingOnlyCounts) {
    auto const screen = NewScreen(0, 0, 20, 10);
    IMKBitmapWritable* const writable = screen->GetBitmapWritable();
    IMKBitmapCanvasAttachable* const attachable = screen->GetBitmapCanvasAttachable();
    writable->ActivateFrameBuffer();
    EXPECT_EQ(CountOf(screen.Get()), 3);
    queue.RunAll();
    EXPECT_EQ(CountOf(screen.Get()), 1);
    EXPECT_EQ(RendererTrace::GetActiveTarget(), "target 1");
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
    screen->Ref();
    writable->DeactivateFrameBufferRT(true, DiscardFramebufferDepthStencil);
    EXPECT_EQ(CountOf(screen.Get()), 1);
    auto const direct = NewScreenRT(0, 0, 20, 10);
    direct->GetBitmapWritable()->ActivateFrameBuffer();
    direct->GetBitmapWritable()->DeactivateFrameBuffer(DiscardFramebufferColor);
    std::vector<std::string> const calls = RendererTrace::TakeCalls();
    EXPECT_THAT(calls, Contains("target 1 Deactivate 0 1"));
    EXPECT_THAT(calls, Contains("target 2 Deactivate 1 0"));
    EXPECT_THAT(calls, Not(Contains(HasSubstr("ClearDepthStencil"))));
}

} // namespace
} // namespace Moka::Testing
