// Behaviour of docs/compatibility.md that no other test sees.
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "tests/unit/canvas/CanvasFixture.h"
#include <cstdint>
#include <cstring>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using Compatibility = CanvasFixture;

TEST_F(Compatibility, ABatchUsesTheFirstStrips) {
    Use(NewBitmap(60, kMaxSide + 36));
    auto const source = NewBitmap(10, 10);
    canvas->DrawBitmaps(source.Get(), {RectF(1, 2, 3, 4), RectF(0, 70, 9, 80)}, &paint);
    TracedDraw const draw = TakeDraw();
    EXPECT_EQ(draw.target, "target 1");
    EXPECT_EQ(draw.count, 12) << "also the one that lies on the second strip";
}

TEST_F(Compatibility, StrokesUnderOneDrawNothingButCircles) {
    Use(NewBitmap(60, 60));
    paint.SetStyle(MKPaint::Stroke);
    paint.SetLineWidth(0.9f);
    canvas->DrawRect(5, 5, 30, 30, &paint);
    canvas->DrawRoundRect(5, 5, 30, 30, 4, 4, &paint);
    canvas->DrawLine(5, 5, 30, 30, &paint);
    for (TracedDraw const& draw : TakeDraws()) EXPECT_EQ(draw.vertices, Numbers());
    canvas->DrawCircle(20, 20, 12, &paint);
    EXPECT_FALSE(TakeDraw().vertices.empty());
}

TEST_F(Compatibility, AShorterTagOfACanvasKeepsTheEndOfALongerOne) {
    Use(NewBitmap(8, 8));
    canvas->SetTag(std::string(200, 'x').c_str());
    canvas->SetTag("abc");
    EXPECT_EQ(canvas->GetTag(), "abc" + std::string(123, 'x'));
}

TEST_F(Compatibility, SamplingOfATextureBitmapDropsNoReference) {
    auto const bitmap = NewBitmap(4, 4);
    queue.RunAll();
    OnRenderThread const here;
    bitmap->GetBitmapReadable()->SetTextureFilterRT(TextureFilterNearest, true);
    bitmap->GetBitmapReadable()->SetTextureWrapRT(TextureWrapRepeat, true);
    EXPECT_EQ(CountOf(bitmap.Get()), 1);
}

// Where a virtual function stands in its table: in the Itanium ABI a pointer to one holds its offset plus
// one.
template <class F>
std::size_t SlotOf(F function) {
    static_assert(sizeof(function) == 2 * sizeof(std::uintptr_t));
    std::uintptr_t words[2];
    std::memcpy(words, &function, sizeof words);
#if defined(__aarch64__)
    return words[0] / sizeof(void*);
#else
    return (words[0] - 1) / sizeof(void*);
#endif
}

TEST(VirtualOrder, CallersFindEachFunctionInItsSlot) {
    EXPECT_EQ(SlotOf(&IGLMsgQueue::Post), 2u);
    EXPECT_EQ(SlotOf(&IGLMsgQueue::WaitForTasks), 3u);
    EXPECT_EQ(SlotOf(&ITask::run), 2u);
    EXPECT_EQ(SlotOf(&ITask::isGlobalLockAllowed), 3u);
    EXPECT_EQ(SlotOf(&IRendererDeviceCaps::GetMaxTextureSize), 2u);
    using T = IRenderTarget;
    std::size_t const slots[] = {
        SlotOf(&T::Activate),           SlotOf(&T::Deactivate),
        SlotOf(&T::ReadPixels),         SlotOf(&T::Release),
        SlotOf(&T::ClearColor),         SlotOf(&T::AttachDepthStencil),
        SlotOf(&T::DetachDepthStencil), SlotOf(&T::ClearDepthStencil),
    };
    for (std::size_t i = 0; i < 8; ++i) EXPECT_EQ(slots[i], i);
}

} // namespace
} // namespace Moka::Testing
