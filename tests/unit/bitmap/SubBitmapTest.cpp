// Strips: what they post, what they hold, what they read.
#include "moka/graphics/bitmap/MKSubBitmap.h"
#include "moka/graphics/bitmap/MKSubBitmapRT.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

using SubBitmap = BitmapFixture;

RefPtr<IMKSubBitmap> MakeStrip(IGLMsgQueue* queue, Rect const& rect, Pixels const* pixels = nullptr) {
    return RefPtr<IMKSubBitmap>::Adopt(
        new MKSubBitmap(queue, 0, rect, rect.right, rect.bottom, pixels ? pixels->data() : nullptr, false));
}

TEST_F(SubBitmap, EveryPostedOperationHoldsOneReferenceUntilItRan) {
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4));
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
    EXPECT_EQ(strip->GetTexture(), nullptr);
    EXPECT_EQ(CountOf(strip.Get()), 17) << "with the construction's";
    queue.RunOne();
    auto const get = [&](int id) { return RendererTrace::GetParameter(strip->GetTexture(), id); };
    EXPECT_EQ(get(TextureParamFilteringMin), TextureFilterLinear);
    EXPECT_EQ(get(TextureParamFilteringMag), TextureFilterLinear);
    EXPECT_EQ(queue.RunAll(), 15);
    EXPECT_EQ(CountOf(strip.Get()), 1);
    EXPECT_EQ(get(TextureParamFilteringMin), TextureFilterLinear);
    EXPECT_EQ(get(TextureParamFilteringMag), TextureFilterNearest);
    EXPECT_EQ(get(TextureParamWrappingS), TextureWrapMirroredRepeat);
    EXPECT_EQ(get(TextureParamWrappingT), TextureWrapRepeat);
}

// A strip measures against its size, inclusive, and not against its edges: see docs/compatibility.md, pixel-bounds.
TEST_F(SubBitmap, ReadsAPixelByItsOwnOddBounds) {
    constexpr Point kOutside(-1, -1); // reads 0
    struct {
        Rect strip;
        Point asked, read;
    } const cases[] = {
        {Rect(0, 0, 6, 5), Point(0, 0), Point(0, 0)},
        {Rect(0, 0, 6, 5), Point(6, 5), Point(5, 4)}, // the size itself reads the last pixel
        {Rect(0, 0, 6, 5), Point(6, 0), Point(5, 0)},
        {Rect(0, 0, 6, 5), Point(-1, 0), kOutside},
        {Rect(0, 0, 6, 5), Point(7, 0), kOutside},
        {Rect(0, 0, 6, 5), Point(0, 6), kOutside},
        {Rect(2, 3, 8, 10), Point(4, 5), Point(4, 5)}, // off the origin
        {Rect(2, 3, 8, 10), Point(5, 6), Point(5, 6)},
        {Rect(2, 3, 8, 10), Point(1, 5), kOutside},
        {Rect(0, 10, 4, 20), Point(1, 12), kOutside}, // rows of a lower strip
        {Rect(0, 10, 4, 20), Point(1, 10), kOutside},
    };
    for (auto const& [rect, asked, read] : cases) {
        Pixels const pixels = UniquePixels(rect.right, rect.bottom);
        auto strip = MakeStrip(&queue, rect, &pixels);
        int const waits = queue.GetWaitCount();
        unsigned int const expected = read.x < 0 ? 0 : PixelAt(pixels, rect.right, read.x, read.y);
        EXPECT_EQ(strip->GetPixel(asked), expected) << asked.x << ", " << asked.y;
        EXPECT_EQ(queue.GetWaitCount(), waits + 1);
        EXPECT_EQ(CountOf(strip.Get()), 1);
    }
    Pixels const pixels = UniquePixels(4, 20);
    Pixels row(16);
    MakeStrip(&queue, Rect(0, 10, 4, 20), &pixels)->GetBitmapData(Rect(0, 12, 4, 13), row.data());
    EXPECT_EQ(row, Pixels(pixels.begin() + 12 * 16, pixels.begin() + 13 * 16)) << "rectangles know better";
}

TEST_F(SubBitmap, ProjectionMapsItsRectangleWithRowZeroFirst) {
    Matrix4<float> const m = MakeStrip(&queue, Rect(10, 20, 50, 60))->GetProjectionMatrix();
    EXPECT_EQ(m, Matrix4<float>(0.05f, 0, 0, 0, 0, 0.05f, 0, 0, 0, 0, -1.0f / 32767, 0, -1.5f, -2, -0.0f, 1));
}

// With a frame buffer on the source the clone loses its own, without one it keeps it; callers rely on that.
TEST_F(SubBitmap, ACloneKeepsItsFrameBufferOnlyWhenTheSourceHasNone) {
    Pixels const pixels = UniquePixels(4, 4);
    auto strip = MakeStrip(&queue, Rect(0, 0, 4, 4), &pixels);
    strip->SetTag("original");
    auto keeps = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    Pixels const later(64);
    strip->UpdateBitmap(later.data(), 0); // which the clone does not see
    queue.RunAll();
    EXPECT_EQ(RendererTrace::GetTexels(keeps->GetTexture()), pixels);
    EXPECT_EQ(LabelOf(keeps->GetTexture()), "original");
    EXPECT_EQ(CountOf(strip.Get()) + CountOf(keeps.Get()), 2);
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 1);
    strip->CreateFrameBuffer();
    queue.RunAll();
    auto loses = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    queue.RunAll();
    EXPECT_EQ(RendererFactory::GetStatistics().renderTargets, 2) << "the source's and the first clone's";
}

class FrameBuffer : public BitmapFixture {
protected:
    static int Targets() { return RendererFactory::GetStatistics().renderTargets; }
    static int Buffers() { return RendererFactory::GetStatistics().depthStencilBuffers; }

    OnRenderThread const here;
    RefPtr<MKSubBitmapRT> strip =
        RefPtr<MKSubBitmapRT>::Adopt(new MKSubBitmapRT(&queue, 0, Rect(0, 0, 4, 4), 4, 4, nullptr, false));
};

TEST_F(FrameBuffer, LivesFromTheFirstCanvasToTheLast) {
    strip->CreateFrameBufferRT(false);
    strip->CreateFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Targets(), 0);
    strip->ReleaseFrameBufferRT(false); // one too many
    Pixels pixels(4 * 4 * 4);
    strip->GetBitmapData(Rect(0, 0, 4, 4), pixels.data());
    strip->GetPixel(Point(1, 1));
    EXPECT_EQ(Targets(), 0) << "reading gives back what it takes";
    strip->CreateFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
}

TEST_F(FrameBuffer, DepthAndStencilShareOneBufferAndOneCount) {
    strip->AttachDepthBuffer();
    EXPECT_EQ(Buffers(), 0) << "nothing to attach to yet, and nothing counted";
    strip->CreateFrameBufferRT(false);
    strip->DetachDepthBuffer();
    strip->AttachDepthBuffer();
    strip->AttachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 1);
    strip->DetachDepthBuffer();
    EXPECT_EQ(Buffers(), 1);
    strip->DetachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 0);
}

// After that the request is still counted: another one finds no buffer, and the last detach has nothing to
// delete.
TEST_F(FrameBuffer, TheLastCanvasTakesTheBufferAlongAndOpenRequestsStayCounted) {
    strip->CreateFrameBufferRT(false);
    strip->AttachStencilBufferRT(false);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Buffers() + Targets(), 0);
    strip->CreateFrameBufferRT(false);
    strip->AttachDepthBuffer();
    EXPECT_EQ(Buffers(), 0);
    strip->DetachDepthBuffer();
    strip->DetachStencilBufferRT(false);
    strip->AttachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 1) << "counted from zero again, so a buffer is made";
    strip->ReleaseFrameBufferRT(false);
    strip->CreateFrameBufferRT(false);
    strip = {}; // with the request open and its buffer gone
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
}

TEST_F(FrameBuffer, DiscardFlagsAreTheTwoBits) {
    strip->CreateFrameBufferRT(false);
    RendererTrace::TakeCalls();
    for (int discard : {0, 1, 2, 3})
        strip->DeactivateFrameBufferRT(false, static_cast<DiscardFramebufferType>(discard));
    EXPECT_EQ(RendererTrace::TakeCalls(),
              (std::vector<std::string>{"target 1 Deactivate 0 0", "target 1 Deactivate 1 0",
                                        "target 1 Deactivate 0 1", "target 1 Deactivate 1 1"}));
}

} // namespace
} // namespace Moka::Testing
