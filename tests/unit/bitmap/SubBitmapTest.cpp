// Strips: what they post, what they hold, what they read.
#include "moka/graphics/bitmap/MKSubBitmap.h"
#include "moka/graphics/bitmap/MKSubBitmapRT.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <cstdint>
#include <string>

namespace Moka::Testing {
namespace {

using SubBitmap = BitmapFixture;

RefPtr<IMKSubBitmap> MakeStrip(IGLMsgQueue* queue, Rect const& rect, Pixels const* pixels = nullptr) {
    return RefPtr<IMKSubBitmap>::Adopt(
        new MKSubBitmap(queue, 0, rect, rect.right, rect.bottom, pixels ? pixels->data() : nullptr, false));
}

TEST_F(SubBitmap, ConstructionPostsOneTaskThatMakesTheTextureAndGivesItsReferenceBack) {
    Pixels const pixels = UniquePixels(8, 6);
    auto strip = MakeStrip(&queue, Rect(0, 2, 8, 6), &pixels);
    EXPECT_EQ(queue.GetPendingCount(), 1);
    EXPECT_EQ(CountOf(strip.Get()), 2);
    EXPECT_EQ(strip->GetTexture(), nullptr);
    queue.RunAll();
    EXPECT_EQ(CountOf(strip.Get()), 1);
    ITextureObject* const texture = strip->GetTexture();
    ASSERT_NE(texture, nullptr);
    EXPECT_EQ(RecordingRenderer::GetTexels(texture), Pixels(pixels.begin() + 8 * 2 * 4, pixels.end()))
        << "the strip takes its own rows out of the whole image";
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamFilteringMin), TextureFilterLinear);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamFilteringMag), TextureFilterLinear);
}

TEST_F(SubBitmap, EveryPostedOperationHoldsOneReferenceUntilItRan) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    queue.RunAll();
    Pixels pixels(64);
    Rect const r(0, 0, 2, 2);
    strip->CreateFrameBuffer();
    strip->ActivateFrameBuffer();
    strip->DeactivateFrameBuffer(DiscardFramebufferBoth);
    strip->AttachDepthBuffer();
    strip->DetachDepthBuffer();
    strip->SetTextureFilter(TextureFilterNearest);
    strip->SetTextureFilter(TextureParamFilteringMin, TextureFilterLinear);
    strip->SetTextureWrap(TextureWrapRepeat);
    strip->SetTextureWrap(TextureParamWrappingS, TextureWrapMirroredRepeat);
    strip->UpdateBitmap(pixels.data(), 0);
    strip->UpdateBitmap(r, pixels.data(), 0);
    strip->GetPixelAsync(Point(0, 0), nullptr, nullptr);
    strip->GetBitmapDataAsync(r, pixels.data(), nullptr, nullptr);
    strip->SetTag("tag");
    strip->ReleaseFrameBuffer();
    EXPECT_EQ(CountOf(strip.Get()), 16);
    EXPECT_EQ(queue.RunAll(), 15);
    EXPECT_EQ(CountOf(strip.Get()), 1);
    ITextureObject* const texture = strip->GetTexture();
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamFilteringMin), TextureFilterLinear);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamFilteringMag), TextureFilterNearest);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingS), TextureWrapMirroredRepeat);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingT), TextureWrapRepeat);
}

TEST_F(SubBitmap, ARefusedPostKeepsTheReferenceAndDropsTheRequest) {
    auto strip = MakeStrip(&picky, Rect(0, 0, 4, 4));
    picky.RunAll();
    refuse = true;
    strip->CreateFrameBuffer();
    strip->SetTag("never seen");
    EXPECT_EQ(strip->GetPixel(Point(0, 0)), 0u);
    EXPECT_EQ(picky.GetWaitCount(), 1) << "a refused read still waits for the queue";
    EXPECT_EQ(CountOf(strip.Get()), 4);
    refuse = false;
    for (int i = 0; i < 3; ++i) strip->Unref(); // what the refusals have leaked, by design
    picky.RunAll();
    EXPECT_EQ(LabelOf(strip->GetTexture()), std::string());
}

TEST_F(SubBitmap, ItsGpuObjectsDieOnTheRenderThreadInOrder) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    strip->CreateFrameBuffer();
    strip->AttachDepthBuffer();
    queue.RunAll();
    RecordingRenderer::TakeCalls();
    strip = {};
    EXPECT_EQ(queue.GetPendingCount(), 4);
    EXPECT_TRUE(RecordingRenderer::TakeCalls().empty());
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::TakeCalls(),
              (std::vector<std::string>{"target 1 DetachDepthStencil buffer 1", "buffer 1 Release",
                                        "target 1 Release", "texture 1 Release"}));
}

TEST_F(SubBitmap, ADeletionThatIsRefusedLeaksTheObjectAndNothingElse) {
    auto strip = MakeStrip(&picky, Rect(0, 0, 4, 4));
    picky.RunAll();
    ITextureObject* const texture = strip->GetTexture();
    refuse = true;
    strip = {};
    refuse = false;
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 1);
    OnRenderThread const here;
    delete texture;
}

TEST_F(SubBitmap, ReadsAPixelByItsOwnOddBounds) {
    Pixels const pixels = UniquePixels(6, 5);
    auto strip = MakeStrip(&queue, Rect(0, 0, 6, 5), &pixels);
    for (int y = 0; y < 5; ++y)
        for (int x = 0; x < 6; ++x) ASSERT_EQ(strip->GetPixel(Point(x, y)), PixelAt(pixels, 6, x, y));
    EXPECT_EQ(strip->GetPixel(Point(6, 5)), PixelAt(pixels, 6, 5, 4))
        << "the size itself reads the last pixel";
    EXPECT_EQ(strip->GetPixel(Point(6, 0)), PixelAt(pixels, 6, 5, 0));
    int const waits = queue.GetWaitCount();
    EXPECT_EQ(strip->GetPixel(Point(-1, 0)), 0u);
    EXPECT_EQ(strip->GetPixel(Point(0, -1)), 0u);
    EXPECT_EQ(strip->GetPixel(Point(7, 0)), 0u);
    EXPECT_EQ(strip->GetPixel(Point(0, 6)), 0u);
    EXPECT_EQ(queue.GetWaitCount(), waits + 4);
    EXPECT_EQ(CountOf(strip.Get()), 1);
}

// Where the odd bounds let a lower strip's row through, it is the right one.
TEST_F(SubBitmap, AStripOffTheOriginReadsItsOwnPixels) {
    Pixels const pixels = UniquePixels(8, 10);
    auto strip = MakeStrip(&queue, Rect(2, 3, 8, 10), &pixels);
    EXPECT_EQ(strip->GetPixel(Point(4, 5)), PixelAt(pixels, 8, 4, 5));
    EXPECT_EQ(strip->GetPixel(Point(5, 6)), PixelAt(pixels, 8, 5, 6));
    EXPECT_EQ(strip->GetPixel(Point(1, 5)), 0u);
}

TEST_F(SubBitmap, OpaqueRedReadsAsRgbaBytes) {
    Pixels const red = {255, 0, 0, 255};
    auto strip = MakeStrip(&queue, Rect(0, 0, 1, 1), &red);
    EXPECT_EQ(strip->GetPixel(Point(0, 0)), 0xFF0000FFu);
}

// A strip further down measures against its size, so its own rows are out of bounds; callers rely on it.
TEST_F(SubBitmap, RowsOfALowerStripReadZero) {
    Pixels const pixels = UniquePixels(4, 20);
    auto strip = MakeStrip(&queue, Rect(0, 10, 4, 20), &pixels);
    EXPECT_EQ(strip->GetPixel(Point(1, 12)), 0u);
    EXPECT_EQ(strip->GetPixel(Point(1, 10)), 0u);
    Pixels row(16);
    strip->GetBitmapData(Rect(0, 12, 4, 13), row.data());
    EXPECT_EQ(row, Pixels(pixels.begin() + 12 * 16, pixels.begin() + 13 * 16)) << "rectangles know better";
}

struct Seen {
    int calls = 0;
    unsigned int pixel = 1;
    Rect rect;
    void* destination = nullptr;
    static void OnPixel(unsigned int pixel, void* seen) {
        auto* const self = static_cast<Seen*>(seen);
        ++self->calls;
        self->pixel = pixel;
    }
    static void OnData(Rect const& r, void* destination, void* seen) {
        auto* const self = static_cast<Seen*>(seen);
        ++self->calls;
        self->rect = r;
        self->destination = destination;
    }
};

TEST_F(SubBitmap, AsynchronousReadsCallBackEvenWhenThereIsNothingToRead) {
    RecordingRenderer::FailCreations(ObjectKind::Texture);
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    Seen pixel;
    Seen data;
    Pixels untouched(64, 9);
    strip->GetPixelAsync(Point(1, 1), &pixel, Seen::OnPixel);
    strip->GetBitmapDataAsync(Rect(0, 0, 4, 4), untouched.data(), &data, Seen::OnData);
    EXPECT_EQ(pixel.calls + data.calls, 0);
    queue.RunAll();
    EXPECT_EQ(pixel.calls, 1);
    EXPECT_EQ(pixel.pixel, 0u);
    EXPECT_EQ(data.calls, 1);
    EXPECT_EQ(data.rect, Rect(0, 0, 4, 4));
    EXPECT_EQ(data.destination, untouched.data());
    EXPECT_EQ(untouched, Pixels(64, 9));
    EXPECT_EQ(CountOf(strip.Get()), 1);
    RecordingRenderer::StopFailing();
}

TEST_F(SubBitmap, TheTagIsCutAt126AndAShortOneReplacesALongOne) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    strip->SetTag(nullptr);
    EXPECT_EQ(queue.GetPendingCount(), 1) << "null posts nothing";
    strip->SetTag(std::string(200, 'x').c_str());
    queue.RunAll();
    EXPECT_EQ(LabelOf(strip->GetTexture()), std::string(126, 'x'));
    strip->SetTag("short");
    queue.RunAll();
    EXPECT_EQ(LabelOf(strip->GetTexture()), std::string("short"));
}

TEST_F(SubBitmap, ProjectionMapsItsRectangleWithRowZeroFirst) {
    auto strip = MakeStrip(&queue, Rect(10, 20, 50, 60));
    Matrix4<float> const m = strip->GetProjectionMatrix();
    auto const x = [&](float px) { return m[0] * px + m[12]; };
    auto const y = [&](float py) { return m[5] * py + m[13]; };
    EXPECT_FLOAT_EQ(x(10), -1);
    EXPECT_FLOAT_EQ(x(50), 1);
    EXPECT_FLOAT_EQ(y(20), -1);
    EXPECT_FLOAT_EQ(y(60), 1);
    std::uint32_t bits = 0;
    float const depth = m[10];
    std::memcpy(&bits, &depth, 4);
    EXPECT_EQ(bits, 0xB8000100u);
    EXPECT_TRUE(m[14] == 0.0f && std::signbit(m[14]));
}

TEST_F(SubBitmap, ACloneHasItsOwnCopyAndItsSourcesTag) {
    Pixels const pixels = UniquePixels(4, 4);
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4), &pixels);
    strip->SetTag("original");
    auto clone = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::GetTexels(clone->GetTexture()), pixels);
    EXPECT_EQ(LabelOf(clone->GetTexture()), std::string("original"));
    Pixels const white(64, 255);
    clone->UpdateBitmap(white.data(), 0);
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::GetTexels(strip->GetTexture()), pixels);
    EXPECT_EQ(CountOf(strip.Get()), 1);
    EXPECT_EQ(CountOf(clone.Get()), 1);
}

// With a frame buffer on the source the clone loses its own, without one it keeps it; callers rely on that.
TEST_F(SubBitmap, ACloneKeepsItsFrameBufferOnlyWhenTheSourceHasNone) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    queue.RunAll();
    auto keeps = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 1);
    strip->CreateFrameBuffer();
    queue.RunAll();
    auto loses = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 2) << "the source's and the first clone's";
}

TEST_F(SubBitmap, ACloneWhoseFrameBufferFailsDrawsIntoNobodyElses) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
    queue.RunAll();
    RecordingRenderer::FailCreations(ObjectKind::RenderTarget);
    auto clone = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    queue.RunAll();
    EXPECT_EQ(RecordingRenderer::CountCalls("DrawToCurrent"), 0);
    RecordingRenderer::StopFailing();
}

TEST_F(SubBitmap, TheRenderThreadFlavourDoesEverythingAtOnceAndCountsNothing) {
    OnRenderThread const here;
    Pixels const pixels = UniquePixels(4, 4);
    {
        auto strip = RefPtr<IMKSubBitmap>::Adopt(
            new MKSubBitmapRT(&queue, 0, Rect(0, 0, 4, 4), 4, 4, pixels.data(), false));
        ASSERT_NE(strip->GetTexture(), nullptr);
        EXPECT_EQ(strip->GetPixel(Point(2, 3)), PixelAt(pixels, 4, 2, 3));
        Seen seen;
        strip->GetPixelAsync(Point(1, 1), &seen, Seen::OnPixel);
        EXPECT_EQ(seen.pixel, PixelAt(pixels, 4, 1, 1)) << "called before the return";
        Pixels all(64);
        strip->GetBitmapDataAsync(Rect(0, 0, 4, 4), all.data(), &seen, Seen::OnData);
        EXPECT_EQ(seen.calls, 2);
        EXPECT_EQ(all, pixels);
        strip->CreateFrameBuffer();
        strip->AttachDepthBuffer();
        strip->SetTag(std::string(200, 'y').c_str());
        EXPECT_EQ(strip->GetTexture()->GetLabel(), std::string(126, 'y'));
        Pixels const white(64, 255);
        strip->UpdateBitmap(Rect(0, 0, 2, 2), white.data(), 8);
        EXPECT_EQ(strip->GetPixel(Point(1, 1)), 0xFFFFFFFFu);
        auto clone = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
        EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 1) << "the source's, not the clone's";
        EXPECT_EQ(RecordingRenderer::GetTexels(clone->GetTexture()),
                  RecordingRenderer::GetTexels(strip->GetTexture()));
        EXPECT_EQ(CountOf(strip.Get()), 1);
        EXPECT_EQ(CountOf(clone.Get()), 1);
    }
    EXPECT_EQ(queue.GetPostedCount(), 0);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
}

} // namespace
} // namespace Moka::Testing
