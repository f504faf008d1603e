// Bitmaps: texture coordinates, batches, and the copy of the destination that darken and lighten need.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/drawable/MKBitmapDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/support/Queues.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <array>
#include <optional>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::SizeIs;

class BitmapDrawableTest : public DrawableFixture {
protected:
    void SetUp() override {
        DrawableFixture::SetUp();
        bitmap =
            RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 8, 4, nullptr, false, 0, false));
        readable = bitmap->GetBitmapReadable();
        drawable.emplace(&queue);
        RendererTrace::TakeCalls();
    }
    void TearDown() override {
        drawable.reset();
        bitmap = {};
        EXPECT_EQ(queue.GetPostedCount(), 0);
        DrawableFixture::TearDown();
    }

    bool Draw(RectF const& dst, MKPaint const& paint, RectF const& target = {0, 0, 100, 50}) {
        return drawable->DrawBitmapRT(readable, RectF(0, 0, 8, 4), target, RectF(2, 1, 6, 3), dst, projection,
                                      paint);
    }
    bool DrawBatch(std::vector<RectF> const& dsts, MKPaint const& paint,
                   RectF const& target = {0, 0, 100, 50}) {
        return drawable->DrawBitmapsRT(readable, RectF(0, 0, 8, 4), target, RectF(2, 1, 6, 3), &dsts,
                                       projection, paint);
    }

    // What was done to textures other than the bitmap's own, without their parameters.
    static std::vector<std::string> TakeTextureCalls() {
        std::vector<std::string> calls;
        for (std::string const& call : RendererTrace::TakeCalls())
            if (call.rfind("texture", 0) == 0 && call.rfind("texture 1 ", 0) != 0 &&
                call.find("SetParameter") == std::string::npos)
                calls.push_back(call);
        return calls;
    }

    HandPumpedQueue queue;
    RefPtr<IMKBitmap> bitmap;
    IMKBitmapReadable* readable = nullptr;
    std::optional<MKBitmapDrawable> drawable;
};

// Its left edge is added on the right.
TEST_F(BitmapDrawableTest, ABitmapThatDoesNotLieAtTheOriginIsStretched) {
    RectF const bounds(10, 20, 18, 24);
    std::vector<RectF> const dsts = {RectF(0, 0, 5, 5)};
    EXPECT_TRUE(drawable->DrawBitmapRT(readable, bounds, bounds, RectF(12, 21, 16, 23), dsts[0], projection,
                                       MKPaint()));
    EXPECT_TRUE(drawable->DrawBitmapsRT(readable, bounds, bounds, RectF(12, 21, 16, 23), &dsts, projection,
                                        MKPaint()));
    for (TracedDraw const& shifted : TakeDraws()) {
        EXPECT_THAT(VerticesOf(shifted).front(), ElementsAre(0, 0, 1, 0.25f, 0.25f));
        EXPECT_THAT(VerticesOf(shifted).back(), ElementsAre(5, 5, 1, (16.0f + 10.0f) / 8.0f, 0.75f));
    }
}

TEST_F(BitmapDrawableTest, TheDrawUsesThePaintAndTheBitmapAndLeavesTheStencilAlone) {
    MKPaint paint = CommonPaint();
    ForceOtherStates();
    EXPECT_TRUE(Draw(RectF(0, 0, 5, 5), paint));
    EXPECT_TRUE(DrawBatch({RectF(0, 0, 5, 5)}, paint));
    std::vector<TracedDraw> const draws = TakeDraws();
    EXPECT_THAT(draws, SizeIs(2));
    for (TracedDraw const& draw : draws) {
        ExpectCommonState(draw);
        EXPECT_TRUE(draw.state.depthStencil.IsStencil());
        EXPECT_EQ(draw.textures.at(0), "texture 1");
        EXPECT_EQ(Values(draw, {"uSrcTexture"}), "0");
    }
}

TEST_F(BitmapDrawableTest, OnlyOneGpuGetsTheProgramThatClampsColors) {
    for (std::string const gpu : {"Mali-T830", "Mali-T830 MP2", "Mali-T83"}) {
        RendererTrace::SetGpuName(gpu.c_str());
        drawable.reset();
        drawable.emplace(&queue);
        EXPECT_TRUE(Draw(RectF(0, 0, 5, 5), CommonPaint()));
        EXPECT_TRUE(DrawBatch({RectF(0, 0, 5, 5)}, CommonPaint()));
        for (TracedDraw const& draw : TakeDraws()) {
            EXPECT_EQ(draw.shader, gpu == "Mali-T830" ? "MKBitmapShaderColorClamp" : "MKBitmapShader");
            ExpectCommonState(draw);
        }
    }
}

TEST_F(BitmapDrawableTest, EachAxisWrapsAsThePaintSaysAndAnUnknownModeLeavesItAlone) {
    ITextureObject const* const texture = bitmap->GetTextureBitmap()->GetSubBitmap(0)->GetTexture();
    auto const wrap = [&](int x, int y) {
        MKPaint paint;
        paint.SetTileMode(static_cast<MKPaint::TileMode>(x), static_cast<MKPaint::TileMode>(y));
        Draw(RectF(0, 0, 5, 5), paint);
        return std::array<int, 2>{RendererTrace::GetParameter(texture, 0),
                                  RendererTrace::GetParameter(texture, 1)};
    };
    EXPECT_THAT(wrap(2, 3), ElementsAre(3, 0));
    EXPECT_THAT(wrap(4, 0), ElementsAre(3, 1));
    EXPECT_THAT(wrap(3, -1), ElementsAre(0, 1));
    EXPECT_THAT(wrap(1, 2), ElementsAre(1, 3));
}

TEST_F(BitmapDrawableTest, DarkenAndLightenSampleACopyOfTheDestinationMadeOnceASize) {
    MKPaint paint = CommonPaint();
    paint.SetXFermode(MKPaint::Darken);
    std::string const tag = "MKBitmapDrawable::DrawBitmapRT mDstBitmapForAdvancedBlending";
    EXPECT_TRUE(Draw(RectF(0, 0, 5, 5), paint));
    EXPECT_THAT(TakeTextureCalls(), ElementsAre("texture 2 Create 100 50", "texture 2 SetLabel " + tag,
                                                "texture 2 CopyFromRenderTarget", "texture 2 Bind 1"));
    EXPECT_EQ(Values(TakeDraw(), {"uSrcTexture", "uDstTexture", "uDstTextureSize", "uBlendingMode"}),
              "0 | 1 | 100 50 | 1");

    // Only the size of the target counts, and both calls share the copy.
    paint.SetXFermode(MKPaint::Lighten);
    EXPECT_TRUE(DrawBatch({RectF(0, 0, 5, 5)}, paint, RectF(40, 30, 140, 80)));
    EXPECT_THAT(TakeTextureCalls(), ElementsAre("texture 2 CopyFromRenderTarget", "texture 2 Bind 1"));
    EXPECT_EQ(Values(TakeDraw(), {"uBlendingMode"}), "2");

    EXPECT_TRUE(DrawBatch({RectF(0, 0, 5, 5)}, paint, RectF(0, 0, 101, 50)));
    EXPECT_THAT(TakeTextureCalls(), ElementsAre("texture 2 Release", "texture 3 Create 101 50",
                                                "texture 3 SetLabel " + tag + " 1",
                                                "texture 3 CopyFromRenderTarget", "texture 3 Bind 1"));
}

} // namespace
} // namespace Moka::Testing
