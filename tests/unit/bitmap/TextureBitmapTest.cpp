// Texture bitmaps: how they are cut, what reaches which strip, what they own.
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

using TextureBitmap = BitmapFixture;

std::vector<Rect> RectsOf(BitmapPtr const& bitmap) {
    std::vector<Rect> rects;
    IMKTextureBitmap* const strips = bitmap->GetTextureBitmap();
    for (int i = 0; i < strips->GetSubBitmapCount(); ++i)
        rects.push_back(strips->GetSubBitmap(i)->GetBitmapRect());
    return rects;
}

TEST_F(TextureBitmap, IsCutAtTheLargestTextureSide) {
    EXPECT_EQ(RectsOf(NewBitmap(5, kMaxSide)), (std::vector<Rect>{Rect(0, 0, 5, 64)}));
    auto const bitmap = NewBitmap(5, kMaxSide + 1);
    EXPECT_EQ(RectsOf(bitmap), (std::vector<Rect>{Rect(0, 0, 5, 64), Rect(0, 64, 5, 65)}));
    EXPECT_EQ(StripOf(bitmap, 2), nullptr);
    EXPECT_EQ(StripOf(bitmap, -1), nullptr);
    EXPECT_EQ(bitmap->GetPixel(Point(5, 0)), 0u) << "no strip contains it";
}

TEST_F(TextureBitmap, ARegionGetsStripsOnlyWhereItIsAndTheyKeepTheirNumbers) {
    int const h = 3 * kMaxSide;
    Pixels const pixels = UniquePixels(10, h);
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, Rect(2, 70, 99, 140), 10, h, pixels.data(), 1));
    ASSERT_EQ(RectsOf(bitmap), (std::vector<Rect>{Rect(2, 70, 10, 128), Rect(2, 128, 10, 140)}));
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

// The walk over the strips goes on after the callback.
TEST_F(TextureBitmap, ACallbackMayDropTheLastReference) {
    struct Watched : MKTextureBitmap {
        using MKTextureBitmap::MKTextureBitmap;
        ~Watched() override { *gone = true; }
        static void DropIt(Rect const&, void*, void* bitmap) {
            auto* const self = static_cast<Watched*>(bitmap);
            bool const* const gone = self->gone;
            self->Unref();
            EXPECT_FALSE(*gone);
        }
        bool* gone = nullptr;
    };
    OnRenderThread const here;
    Pixels pixels(4 * 2 * kMaxSide * 4);
    bool gone = false;
    auto* const bitmap = new Watched(&queue, 4, 2 * kMaxSide, nullptr, false, true, false);
    bitmap->gone = &gone;
    bitmap->GetBitmapDataAsync(bitmap->GetBitmapRect(), pixels.data(), bitmap, Watched::DropIt);
    EXPECT_TRUE(gone);
}

TEST_F(TextureBitmap, UpdatesReachTheStripsTheyTouch) {
    auto const bitmap = NewBitmap(4, 2 * kMaxSide);
    EXPECT_EQ(ReadAll(bitmap), Pixels(4 * 2 * kMaxSide * 4)) << "transparent, whatever memory held";
    auto const countUploads = [&] {
        queue.RunAll();
        int const count = RendererTrace::CountCalls("Replace");
        RendererTrace::TakeCalls();
        return count;
    };
    Pixels const pixels = UniquePixels(4, kMaxSide);
    bitmap->GetTextureBitmap()->UpdateBitmap(Rect(0, 10, 4, 13), pixels.data(), 16);
    EXPECT_EQ(countUploads(), 1);
    bitmap->GetTextureBitmap()->UpdateBitmap(pixels.data(), 0);
    EXPECT_EQ(countUploads(), 2) << "each strip, the same pixels";
    EXPECT_EQ(RendererTrace::GetTexels(StripOf(bitmap, 1)->GetTexture()), pixels);
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

TEST_F(TextureBitmap, OnTheRenderThreadSamplingReachesEveryStripAndActivationTheFirst) {
    auto const bitmap = NewBitmap(4, 2 * kMaxSide);
    bitmap->GetBitmapCanvasAttachable()->AttachToCanvas();
    IMKBitmapReadable* const readable = bitmap->GetBitmapReadable();
    IMKBitmapWritable* const writable = bitmap->GetBitmapWritable();
    writable->ActivateFrameBuffer();
    writable->DeactivateFrameBuffer(DiscardFramebufferNone);
    queue.RunAll();
    EXPECT_EQ(RendererTrace::CountCalls("Activate"), 1);
    {
        OnRenderThread const here;
        // These ignore their release argument.
        readable->SetTextureFilterRT(TextureFilterNearest, true);
        readable->SetTextureFilterRT(TextureParamFilteringMin, TextureFilterLinear, true);
        readable->SetTextureWrapRT(TextureWrapRepeat, true);
        readable->SetTextureWrapRT(TextureParamWrappingS, TextureWrapMirroredRepeat, true);
        EXPECT_EQ(CountOf(bitmap.Get()), 2);
        for (int i = 0; i < 2; ++i) {
            ITextureObject* const texture = StripOf(bitmap, i)->GetTexture();
            EXPECT_EQ(RendererTrace::GetParameter(texture, TextureParamFilteringMag), TextureFilterNearest);
            EXPECT_EQ(RendererTrace::GetParameter(texture, TextureParamWrappingS), TextureWrapMirroredRepeat);
        }
        for (int i = 0; i < 5; ++i) bitmap->Ref();
        readable->ActivateTextureRT(0, true);
        writable->ActivateFrameBufferRT(true);
        bitmap->GetTextureBitmap()->AttachStencilBufferRT(true);
        EXPECT_EQ(RendererFactory::GetStatistics().depthStencilBuffers, 1);
        writable->ClearColorRT(1, 0, 0, 1);
        writable->ClearDepthStencilRT(true, 1, true, 0);
        bitmap->GetTextureBitmap()->DetachStencilBufferRT(true);
        writable->DeactivateFrameBufferRT(true, DiscardFramebufferNone);
        EXPECT_EQ(CountOf(bitmap.Get()), 2);
        EXPECT_EQ(RendererTrace::GetBoundTexture(0), RendererTrace::NameOf(StripOf(bitmap)->GetTexture()));
    }
    Pixels const pixels = ReadAll(bitmap);
    EXPECT_EQ(PixelAt(pixels, 4, 0, 0), 0xFF0000FFu) << "red, as bytes in the order RGBA";
    EXPECT_EQ(PixelAt(pixels, 4, 3, kMaxSide), 0xFF0000FFu);
    bitmap->GetBitmapCanvasAttachable()->DetachFromCanvas();
}

TEST_F(TextureBitmap, AnEmptyBitmapDoesNothingAndSurvivesEverything) {
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&queue, reinterpret_cast<TextureObject const*>(this), 1));
    EXPECT_EQ(bitmap->GetBitmapRect(), Rect());
    EXPECT_EQ(bitmap->GetPixel(Point(0, 0)), 0u);
    Seen seen;
    bitmap->GetBitmapDataAsync(Rect(0, 0, 1, 1), nullptr, &seen, Seen::OnData);
    bitmap->GetBitmapWritable()->ActivateFrameBuffer();
    bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterLinear);
    bitmap->GetBitmapCanvasAttachable()->AttachToCanvas();
    bitmap->GetBitmapCanvasAttachable()->DetachFromCanvas();
    EXPECT_EQ(bitmap->GetBitmapWritable()->GetProjectionMatrix(), Matrix4<float>());
    EXPECT_EQ(queue.RunAll(), 0);
    EXPECT_EQ(seen.calls, 0);
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

} // namespace
} // namespace Moka::Testing
