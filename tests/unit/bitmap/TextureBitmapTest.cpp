// Texture bitmaps: how they are cut, what reaches which strip, what they own.
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

using TextureBitmap = BitmapFixture;
using BitmapPtr = RefPtr<IMKBitmap>;

IMKTextureBitmap* StripsOf(BitmapPtr const& bitmap) { return bitmap->GetTextureBitmap(); }

std::vector<Rect> RectsOf(BitmapPtr const& bitmap) {
    std::vector<Rect> rects;
    for (int i = 0; i < StripsOf(bitmap)->GetSubBitmapCount(); ++i)
        rects.push_back(StripsOf(bitmap)->GetSubBitmap(i)->GetBitmapRect());
    return rects;
}

TEST_F(TextureBitmap, IsCutAtTheLargestTextureSide) {
    EXPECT_EQ(RectsOf(BitmapPtr::Adopt(Create(5, kMaxSide))), (std::vector<Rect>{Rect(0, 0, 5, 64)}));
    EXPECT_EQ(RectsOf(BitmapPtr::Adopt(Create(5, kMaxSide + 1))),
              (std::vector<Rect>{Rect(0, 0, 5, 64), Rect(0, 64, 5, 65)}));
    EXPECT_EQ(RectsOf(BitmapPtr::Adopt(Create(5, 3 * kMaxSide))).size(), 3u);
    auto const bitmap = BitmapPtr::Adopt(Create(5, 2 * kMaxSide));
    EXPECT_EQ(StripsOf(bitmap)->GetSubBitmap(2), nullptr);
    EXPECT_EQ(StripsOf(bitmap)->GetSubBitmap(-1), nullptr);
}

TEST_F(TextureBitmap, ReadsBackWhatWasUploadedOverStripsAndPartlyOutside) {
    int const w = 7;
    int const h = 2 * kMaxSide + 9;
    Pixels const pixels = UniquePixels(w, h);
    auto const bitmap = BitmapPtr::Adopt(Create(w, h, pixels.data()));
    Pixels all(pixels.size());
    bitmap->GetBitmapData(Rect(0, 0, w, h), all.data());
    EXPECT_EQ(all, pixels);

    // Hanging over on every side: what is outside stays as it was.
    Rect const r(-3, kMaxSide - 2, w + 2, h + 4);
    Pixels part(static_cast<std::size_t>(r.GetWidth() * r.GetHeight() * 4), 99);
    bitmap->GetBitmapData(r, part.data());
    for (int y = r.top; y < r.bottom; ++y)
        for (int x = r.left; x < r.right; ++x) {
            bool const inside = x >= 0 && x < w && y < h;
            ASSERT_EQ(PixelAt(part, r.GetWidth(), x - r.left, y - r.top),
                      inside ? PixelAt(pixels, w, x, y) : 0x63636363u)
                << x << "," << y;
        }
    EXPECT_EQ(bitmap->GetPixel(Point(3, 5)), PixelAt(pixels, w, 3, 5));
    EXPECT_EQ(bitmap->GetPixel(Point(w, 0)), 0u) << "no strip contains it";
}

TEST_F(TextureBitmap, ARegionGetsStripsOnlyWhereItIsAndTheyKeepTheirNumbers) {
    int const h = 3 * kMaxSide;
    Pixels const pixels = UniquePixels(10, h);
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, Rect(2, 70, 99, 140), 10, h, pixels.data(), 1));
    ASSERT_EQ(RectsOf(bitmap), (std::vector<Rect>{Rect(2, 70, 10, 128), Rect(2, 128, 10, 140)}));
    EXPECT_EQ(StripsOf(bitmap)->GetSubBitmap(0)->GetBitmapIndex(), 1);
    EXPECT_EQ(StripsOf(bitmap)->GetSubBitmap(1)->GetBitmapIndex(), 2);
    EXPECT_EQ(bitmap->GetBitmapRect(), Rect(0, 0, 10, h)) << "at its place in the whole";
    Pixels all(pixels.size());
    bitmap->GetBitmapData(Rect(0, 0, 10, h), all.data());
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < 10; ++x) {
            bool const inside = x >= 2 && y >= 70 && y < 140;
            ASSERT_EQ(PixelAt(all, 10, x, y), inside ? PixelAt(pixels, 10, x, y) : 0u) << x << "," << y;
        }
    auto const shared = BitmapPtr::Adopt(bitmap->Clone());
    EXPECT_EQ(StripsOf(shared)->GetSubBitmap(0)->GetBitmapIndex(), 0) << "positions, in a shared bitmap";
}

TEST_F(TextureBitmap, OwnedPixelsAreFreedBehindTheUploads) {
    Pixels const pixels = UniquePixels(4, 2 * kMaxSide);
    auto* const owned = new unsigned char[pixels.size()];
    std::memcpy(owned, pixels.data(), pixels.size());
    auto const bitmap =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 4, 2 * kMaxSide, owned, true, 1, false));
    EXPECT_EQ(queue.GetPendingCount(), 3) << "two uploads, then the deletion";
    Pixels all(pixels.size());
    bitmap->GetBitmapData(Rect(0, 0, 4, 2 * kMaxSide), all.data());
    EXPECT_EQ(all, pixels);

    OnRenderThread const here;
    auto* const now = new unsigned char[4]();
    MKGraphicsFactory::ReleaseBitmap(MKGraphicsFactory::CreateBitmap(&queue, 1, 1, now, true, 0, false));
}

TEST_F(TextureBitmap, AnAsynchronousReadCallsBackOnceAfterTheLastStrip) {
    int const h = 3 * kMaxSide;
    Pixels const pixels = UniquePixels(3, h);
    auto const bitmap = BitmapPtr::Adopt(Create(3, h, pixels.data()));
    struct Result {
        Pixels all;
        int calls = 0;
        bool complete = false;
        Pixels const* expected;
    } result{Pixels(pixels.size()), 0, false, &pixels};
    bitmap->GetBitmapDataAsync(Rect(0, 0, 3, h), result.all.data(), &result,
                               [](Rect const&, void*, void* data) {
                                   auto* const r = static_cast<Result*>(data);
                                   ++r->calls;
                                   r->complete = r->all == *r->expected;
                               });
    EXPECT_EQ(result.calls, 0);
    queue.RunAll();
    EXPECT_EQ(result.calls, 1);
    EXPECT_TRUE(result.complete);
}

TEST_F(TextureBitmap, UpdatesReachTheStripsTheyTouch) {
    auto const bitmap = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
    queue.RunAll();
    Pixels const pixels = UniquePixels(4, 3);
    RecordingRenderer::TakeCalls();
    bitmap->GetTextureBitmap()->UpdateBitmap(Rect(0, 10, 4, 13), pixels.data(), 16);
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::CountCalls("Replace"), 1);
    for (int x = 0; x < 4; ++x) EXPECT_EQ(bitmap->GetPixel(Point(x, 11)), PixelAt(pixels, 4, x, 1));
    RecordingRenderer::TakeCalls();
    Pixels const all = UniquePixels(4, kMaxSide);
    bitmap->GetTextureBitmap()->UpdateBitmap(all.data(), 0);
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::CountCalls("Replace"), 2) << "each strip, the same pixels";
}

TEST_F(TextureBitmap, CanvasesHoldItAndItsFrameBuffers) {
    auto const bitmap = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
    IMKBitmapCanvasAttachable* const attachable = bitmap->GetBitmapCanvasAttachable();
    attachable->AttachToCanvas();
    EXPECT_EQ(CountOf(bitmap.Get()), 2);
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 2);
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

TEST_F(TextureBitmap, SamplingOperationsOnTheRenderThreadIgnoreTheirReleaseArgument) {
    auto const bitmap = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
    queue.RunAll();
    OnRenderThread const here;
    IMKBitmapReadable* const readable = bitmap->GetBitmapReadable();
    readable->SetTextureFilterRT(TextureFilterNearest, true);
    readable->SetTextureFilterRT(TextureParamFilteringMin, TextureFilterLinear, true);
    readable->SetTextureWrapRT(TextureWrapRepeat, true);
    readable->SetTextureWrapRT(TextureParamWrappingS, TextureWrapMirroredRepeat, true);
    EXPECT_EQ(CountOf(bitmap.Get()), 1);
    for (int i = 0; i < 2; ++i) {
        ITextureObject* const texture = StripsOf(bitmap)->GetSubBitmap(i)->GetTexture();
        EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamFilteringMag), TextureFilterNearest);
        EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingS), TextureWrapMirroredRepeat);
    }
    bitmap->Ref();
    readable->ActivateTextureRT(0, true);
    EXPECT_EQ(CountOf(bitmap.Get()), 1);
    EXPECT_EQ(RecordingRenderer::GetBoundTexture(0),
              RecordingRenderer::NameOf(StripsOf(bitmap)->GetSubBitmap(0)->GetTexture()));
}

TEST_F(TextureBitmap, DrawingOperationsReachTheFirstStripAndClearsAll) {
    auto const bitmap = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
    bitmap->GetBitmapCanvasAttachable()->AttachToCanvas();
    IMKBitmapWritable* const writable = bitmap->GetBitmapWritable();
    writable->ActivateFrameBuffer();
    writable->DeactivateFrameBuffer(DiscardFramebufferNone);
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::CountCalls("Activate"), 1);
    {
        OnRenderThread const here;
        for (int i = 0; i < 4; ++i) bitmap->Ref();
        writable->ActivateFrameBufferRT(true);
        bitmap->GetTextureBitmap()->AttachStencilBufferRT(true);
        EXPECT_EQ(RendererFactory::GetStatistics().depthStencilBuffers, 1);
        writable->ClearColorRT(1, 0, 0, 1);
        writable->ClearDepthStencilRT(true, 1, true, 0);
        bitmap->GetTextureBitmap()->DetachStencilBufferRT(true);
        writable->DeactivateFrameBufferRT(true, DiscardFramebufferNone);
        EXPECT_EQ(CountOf(bitmap.Get()), 2);
    }
    EXPECT_EQ(bitmap->GetPixel(Point(0, 0)), 0xFF0000FFu);
    Pixels below(16);
    bitmap->GetBitmapData(Rect(0, kMaxSide, 4, kMaxSide + 1), below.data());
    EXPECT_EQ(PixelAt(below, 4, 3, 0), 0xFF0000FFu);
    bitmap->GetBitmapCanvasAttachable()->DetachFromCanvas();
}

TEST_F(TextureBitmap, AnEmptyBitmapDoesNothingAndSurvivesEverything) {
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, reinterpret_cast<TextureObject const*>(this), 1));
    EXPECT_EQ(bitmap->GetBitmapRect(), Rect());
    EXPECT_EQ(StripsOf(bitmap)->GetSubBitmapCount(), 0);
    EXPECT_EQ(bitmap->GetPixel(Point(0, 0)), 0u);
    bool called = false;
    bitmap->GetBitmapDataAsync(Rect(0, 0, 1, 1), &called, &called,
                               [](Rect const&, void*, void* flag) { *static_cast<bool*>(flag) = true; });
    bitmap->GetBitmapWritable()->ActivateFrameBuffer();
    bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterLinear);
    bitmap->GetBitmapCanvasAttachable()->AttachToCanvas();
    bitmap->GetBitmapCanvasAttachable()->DetachFromCanvas();
    EXPECT_EQ(bitmap->GetBitmapWritable()->GetProjectionMatrix(), Matrix4<float>());
    EXPECT_EQ(queue.RunAll(), 0);
    EXPECT_FALSE(called);
}

TEST_F(TextureBitmap, TheTagReachesEveryStripAndIsCut) {
    auto const bitmap = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
    bitmap->SetTag(std::string(200, 't').c_str());
    EXPECT_EQ(bitmap->GetTag(), std::string(126, 't'));
    bitmap->SetTag(nullptr);
    EXPECT_EQ(bitmap->GetTag(), std::string(126, 't'));
    bitmap->SetTag("short");
    queue.RunAll();
    EXPECT_EQ(bitmap->GetTag(), std::string("short"));
    for (int i = 0; i < 2; ++i)
        EXPECT_EQ(LabelOf(StripsOf(bitmap)->GetSubBitmap(i)->GetTexture()), std::string("short"));
}

TEST_F(TextureBitmap, AWidthTheDeviceRefusesLeavesItInert) {
    Pixels untouched(16, 7);
    auto const bitmap = BitmapPtr::Adopt(Create(kMaxSide + 1, 4));
    bitmap->GetBitmapData(Rect(0, 0, 4, 1), untouched.data());
    EXPECT_EQ(untouched, Pixels(16, 7));
    EXPECT_EQ(bitmap->GetPixel(Point(0, 0)), 0u);
}

} // namespace
} // namespace Moka::Testing
