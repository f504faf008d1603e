// Shared bitmaps: one image under several bitmaps, in whatever order they come and go.
#include "moka/graphics/bitmap/MKSharedTextureBitmap.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <string>
#include <type_traits>

namespace Moka::Testing {
namespace {

using SharedBitmap = BitmapFixture;

static_assert(!std::is_final_v<MKSharedTextureBitmap>);

TEST_F(SharedBitmap, ACloneMadeBeforeAnythingRanShowsTheImage) {
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
    clone->GetBitmapReadable()->SetTextureWrap(TextureWrapRepeat); // sampling is each one's own
    queue.RunAll();
    EXPECT_NE(RendererTrace::GetParameter(StripOf(parent)->GetTexture(), TextureParamWrappingS),
              TextureWrapRepeat);
}

TEST_F(SharedBitmap, ReleasedInEitherOrderTheImageLivesToTheLast) {
    Pixels const pixels = UniquePixels(4, 4);
    for (bool parentFirst : {true, false}) {
        auto parent = NewBitmap(4, 4, pixels.data());
        auto clone = BitmapPtr::Adopt(parent->Clone());
        auto grandchild = BitmapPtr::Adopt(clone->Clone());
        (parentFirst ? parent : grandchild) = {};
        clone = {};
        queue.RunAll();
        EXPECT_EQ(ReadAll(parentFirst ? grandchild : parent), pixels);
        EXPECT_EQ(RendererFactory::GetStatistics().textures, 1) << "one storage";
    }
}

TEST_F(SharedBitmap, ReleasedBeforeItsTasksRanItStillCleansUp) {
    MKGraphicsFactory::ReleaseBitmap([this] {
        auto const parent = NewBitmap(4, 2 * kMaxSide);
        return parent->Clone();
    }());
    EXPECT_GT(queue.GetPendingCount(), 0);
}

TEST_F(SharedBitmap, ARefusedSharingLeaksItsReferencesAndShowsNothing) {
    auto const parent = NewPickyBitmap(4, 4);
    picky.RunAll();
    refuse = true;
    auto clone = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&picky, parent.Get(), 1));
    refuse = false;
    IMKSubBitmap* const strip = StripOf(clone);
    IMKSubBitmap* const model = StripOf(parent);
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
    auto const parent =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 4, 4, nullptr, false, 0, false));
    auto const shared = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, parent.Get(), 0));
    EXPECT_EQ(ReadAll(shared), Pixels(64));
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 1);
    EXPECT_EQ(queue.GetPostedCount(), 0);
}

} // namespace
} // namespace Moka::Testing
