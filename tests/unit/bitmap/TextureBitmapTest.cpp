// Texture bitmaps: how they are cut, what reaches which strip, what they own.
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

using TextureBitmap = BitmapFixture;

TEST_F(TextureBitmap, ARegionGetsStripsOnlyWhereItIsAndTheyKeepTheirNumbers) {
    int const h = 3 * kMaxSide;
    Pixels const pixels = UniquePixels(10, h);
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, Rect(2, 70, 99, 140), 10, h, pixels.data(), 1));
    ASSERT_EQ(bitmap->GetTextureBitmap()->GetSubBitmapCount(), 2);
    EXPECT_EQ(StripOf(bitmap)->GetBitmapRect(), Rect(2, 70, 10, 128));
    EXPECT_EQ(StripOf(bitmap, 1)->GetBitmapRect(), Rect(2, 128, 10, 140));
    EXPECT_EQ(StripOf(bitmap)->GetBitmapIndex(), 1);
    EXPECT_EQ(StripOf(bitmap, 1)->GetBitmapIndex(), 2);
    EXPECT_EQ(bitmap->GetBitmapRect(), Rect(0, 0, 10, h)) << "at its place in the whole";
    Pixels const all = ReadAll(bitmap);
    for (Point const& p : {Point(2, 70), Point(9, 70), Point(2, 139), Point(9, 139), Point(5, 128)})
        EXPECT_EQ(PixelAt(all, 10, p.x, p.y), PixelAt(pixels, 10, p.x, p.y));
    for (Point const& p : {Point(1, 70), Point(2, 69), Point(9, 140)})
        EXPECT_EQ(PixelAt(all, 10, p.x, p.y), 0u);
    auto const shared = BitmapPtr::Adopt(bitmap->Clone());
    EXPECT_EQ(StripOf(shared)->GetBitmapIndex(), 0) << "positions, in a shared bitmap";
}

TEST_F(TextureBitmap, AnAsynchronousReadCallsBackOnceAfterTheLastStrip) {
    int const h = 3 * kMaxSide;
    Pixels const pixels = UniquePixels(3, h);
    auto const bitmap = NewBitmap(3, h, pixels.data());
    Pixels all(pixels.size());
    Seen seen;
    bitmap->GetBitmapDataAsync(Rect(0, 0, 3, h), all.data(), &seen, Seen::OnData);
    for (int i = 0; i < 3 + 2; ++i) queue.RunOne(); // three uploads, two of the reads
    EXPECT_EQ(seen.calls, 0);
    queue.RunAll();
    EXPECT_EQ(seen.calls, 1);
    EXPECT_EQ(all, pixels);
}

TEST_F(TextureBitmap, CanvasesHoldItAndItsFrameBuffers) {
    auto const bitmap = NewBitmap(4, 2 * kMaxSide);
    IMKBitmapCanvasAttachable* const attachable = bitmap->GetBitmapCanvasAttachable();
    attachable->AttachToCanvas();
    EXPECT_EQ(CountOf(bitmap.Get()), 2);
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 2);
    bitmap->GetTextureBitmap()->AttachDepthBuffer();
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().depthStencilBuffers, 2);
    attachable->DetachFromCanvas();
    EXPECT_EQ(CountOf(bitmap.Get()), 1);
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 0);

    OnRenderThread const here;
    attachable->AttachToCanvasRT(true);
    EXPECT_EQ(CountOf(bitmap.Get()), 1) << "one taken, the task's dropped";
    bitmap->Ref();
    bitmap->Ref();
    attachable->DetachFromCanvasRT(true);
    EXPECT_EQ(CountOf(bitmap.Get()), 1) << "the canvas's and the task's";
}

TEST_F(TextureBitmap, TheTagReachesEveryStripAndIsCut) {
    auto const bitmap = NewBitmap(4, 2 * kMaxSide);
    bitmap->SetTag(std::string(200, 't').c_str());
    EXPECT_EQ(bitmap->GetTag(), std::string(126, 't'));
    bitmap->SetTag("short");
    bitmap->SetTag(nullptr);
    queue.RunAll();
    EXPECT_EQ(bitmap->GetTag(), std::string("short"));
    for (int i = 0; i < 2; ++i) EXPECT_EQ(LabelOf(StripOf(bitmap, i)->GetTexture()), std::string("short"));
}

// Shared bitmaps: one image under several bitmaps, in whatever order they come and go.
TEST_F(TextureBitmap, ACloneMadeBeforeAnythingRanShowsTheImage) {
    int const h = 2 * kMaxSide + 1;
    Pixels const pixels = UniquePixels(4, h);
    auto const parent = NewBitmap(4, h, pixels.data());
    parent->SetTag("named");
    auto const clone = BitmapPtr::Adopt(parent->Clone());
    ASSERT_EQ(queue.GetRunCount(), 0);
    EXPECT_EQ(clone->GetTag(), std::string("named"));
    EXPECT_EQ(ReadAll(clone), pixels);
    EXPECT_EQ(CountOf(clone.Get()), 1);
    EXPECT_EQ(CountOf(parent.Get()), 2) << "the clone holds its parent";
    for (int i = 0; i < 3; ++i) EXPECT_EQ(CountOf(StripOf(parent, i)) + CountOf(StripOf(clone, i)), 2);
    Pixels const other(pixels.size(), 7);
    clone->GetTextureBitmap()->UpdateBitmap(other.data(), 0);
    EXPECT_EQ(ReadAll(parent), other);
    clone->GetBitmapReadable()->SetTextureWrap(TextureWrapRepeat); // sampling is each one's own
    queue.RunAll();
    EXPECT_NE(RendererTrace::GetParameter(StripOf(parent)->GetTexture(), TextureParamWrappingS),
              TextureWrapRepeat);
}

TEST_F(TextureBitmap, ReleasedBeforeItsTasksRanItStillCleansUp) {
    MKGraphicsFactory::ReleaseBitmap([this] {
        auto const parent = NewBitmap(4, 2 * kMaxSide);
        return parent->Clone();
    }());
    EXPECT_GT(queue.GetPendingCount(), 0);
}

} // namespace
} // namespace Moka::Testing
