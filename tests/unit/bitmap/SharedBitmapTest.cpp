// Shared bitmaps: one image under several bitmaps, in whatever order they come and go.
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

using SharedBitmap = BitmapFixture;
using BitmapPtr = RefPtr<IMKBitmap>;

Pixels ReadAll(BitmapPtr const& bitmap) {
    Rect const r = bitmap->GetBitmapRect();
    Pixels pixels(static_cast<std::size_t>(r.GetWidth() * r.GetHeight() * 4));
    bitmap->GetBitmapData(r, pixels.data());
    return pixels;
}

TEST_F(SharedBitmap, ACloneMadeBeforeAnythingRanShowsTheImage) {
    int const h = 2 * kMaxSide + 1;
    Pixels const pixels = UniquePixels(4, h);
    auto const parent = BitmapPtr::Adopt(Create(4, h, pixels.data()));
    parent->SetTag("named");
    auto const clone = BitmapPtr::Adopt(parent->Clone());
    ASSERT_EQ(queue.GetRunCount(), 0);
    EXPECT_EQ(clone->GetTag(), std::string("named"));
    EXPECT_EQ(clone->GetTextureBitmap()->GetSubBitmapCount(), 3);
    EXPECT_EQ(ReadAll(clone), pixels);
    EXPECT_EQ(CountOf(clone.Get()), 1);
    EXPECT_EQ(CountOf(parent.Get()), 2) << "the clone holds its parent";
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(CountOf(parent->GetTextureBitmap()->GetSubBitmap(i)), 1);
        EXPECT_EQ(CountOf(clone->GetTextureBitmap()->GetSubBitmap(i)), 1);
    }
}

TEST_F(SharedBitmap, WritingIntoEitherShowsInBothAndSamplingIsEachOnesOwn) {
    auto const parent = BitmapPtr::Adopt(Create(4, 4));
    auto const clone = BitmapPtr::Adopt(parent->Clone());
    Pixels const pixels = UniquePixels(4, 4);
    clone->GetTextureBitmap()->UpdateBitmap(pixels.data(), 0);
    EXPECT_EQ(ReadAll(parent), pixels);
    clone->GetBitmapReadable()->SetTextureWrap(TextureWrapRepeat);
    queue.RunAll();
    ITextureObject* const own = parent->GetTextureBitmap()->GetSubBitmap(0)->GetTexture();
    EXPECT_NE(RecordingRenderer::GetParameter(own, TextureParamWrappingS), TextureWrapRepeat);
}

TEST_F(SharedBitmap, ReleasedInEitherOrderTheImageLivesToTheLast) {
    Pixels const pixels = UniquePixels(4, 4);
    for (bool parentFirst : {true, false}) {
        auto parent = BitmapPtr::Adopt(Create(4, 4, pixels.data()));
        auto clone = BitmapPtr::Adopt(parent->Clone());
        auto grandchild = BitmapPtr::Adopt(clone->Clone());
        BitmapPtr* const order[] = {parentFirst ? &parent : &grandchild, &clone};
        for (BitmapPtr* bitmap : order) *bitmap = {};
        queue.RunAll();
        EXPECT_EQ(ReadAll(parentFirst ? grandchild : parent), pixels);
        EXPECT_EQ(RendererFactory::GetStatistics().textures, 1) << "one storage";
    }
}

TEST_F(SharedBitmap, ReleasedBeforeItsTasksRanItStillCleansUp) {
    MKGraphicsFactory::ReleaseBitmap([this] {
        auto const parent = BitmapPtr::Adopt(Create(4, 2 * kMaxSide));
        return parent->Clone();
    }());
    EXPECT_GT(queue.GetPendingCount(), 0);
}

TEST_F(SharedBitmap, AParentWhoseTextureFailedGivesAnInertClone) {
    RecordingRenderer::FailCreations(ObjectKind::Texture);
    auto const parent = BitmapPtr::Adopt(Create(4, 4));
    auto const clone = BitmapPtr::Adopt(parent->Clone());
    queue.RunAll();
    RecordingRenderer::StopFailing();
    EXPECT_EQ(ReadAll(clone), Pixels(64));
    EXPECT_EQ(CountOf(clone->GetTextureBitmap()->GetSubBitmap(0)), 1);
}

TEST_F(SharedBitmap, ARefusedSharingLeaksItsReferencesAndShowsNothing) {
    auto parent = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&picky, 4, 4, nullptr, false, 1, false));
    picky.RunAll();
    refuse = true;
    auto clone = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&picky, parent.Get(), 1));
    refuse = false;
    IMKSubBitmap* const strip = clone->GetTextureBitmap()->GetSubBitmap(0);
    IMKSubBitmap* const model = parent->GetTextureBitmap()->GetSubBitmap(0);
    EXPECT_EQ(CountOf(clone.Get()), 2);
    EXPECT_EQ(CountOf(strip), 2);
    EXPECT_EQ(CountOf(model), 2);
    EXPECT_EQ(strip->GetTexture(), nullptr);
    strip->Unref(); // what the refusals have leaked, by design
    model->Unref();
    clone->Unref();
}

TEST_F(SharedBitmap, OnTheRenderThreadItIsMadeAtOnce) {
    OnRenderThread const here;
    Pixels const pixels = UniquePixels(4, 4);
    auto const parent =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 4, 4, pixels.data(), false, 0, false));
    auto const shared = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, parent.Get(), 0));
    EXPECT_EQ(ReadAll(shared), pixels);
    EXPECT_EQ(queue.GetPostedCount(), 0);
}

} // namespace
} // namespace Moka::Testing
