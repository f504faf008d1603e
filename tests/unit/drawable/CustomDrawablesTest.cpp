// The four custom drawables: their life between two threads, their references, and what they draw.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "tests/unit/bitmap/BitmapFixture.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <functional>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::MatchesRegex;

class CustomDrawablesTest : public BitmapFixture {
protected:
    using Maker = std::function<IMKCustomDrawable*(IGLMsgQueue*)>;

    CustomDrawablesTest() {
        queue.RunAll();
        OnRenderThread const here;
        RendererFactory::SetDeferred(true);
        paint.SetTileMode(MKPaint::Repeat);
    }

    MKBlendedBitmapDrawable* NewBlended(IGLMsgQueue* q, float width, float height) {
        first->Ref();
        second->Ref();
        return new (std::nothrow) MKBlendedBitmapDrawable(q, first.Get(), second.Get(), RectF(10, 5, 30, 15),
                                                          RectF(1, 2, 3, 4), width, height);
    }
    template <class Drawable, class... Bitmaps>
    static Drawable* New(IGLMsgQueue* q, Bitmaps... bitmaps) {
        auto* const drawable = new (std::nothrow) Drawable(q);
        if constexpr (sizeof...(bitmaps) > 0) drawable->SetBitmap(bitmaps...);
        return drawable;
    }
    // One of each, with its bitmaps.
    std::vector<Maker> Makers() {
        IMKBitmap* const a = first.Get();
        IMKBitmap* const b = second.Get();
        return {[this](IGLMsgQueue* q) { return NewBlended(q, 8, 8); },
                [=](IGLMsgQueue* q) { return New<MKNonPremultipliedColorDrawable>(q, a, b); },
                [=](IGLMsgQueue* q) { return New<MKTextMaskBitmapDrawable>(q, a); },
                [=](IGLMsgQueue* q) { return New<MKGaussianBlurDrawable>(q, a); }};
    }
    template <class Drawable>
    RefPtr<Drawable> Constructed(Drawable* drawable) {
        queue.RunAll();
        return RefPtr<Drawable>::Adopt(drawable);
    }

    // Whether anything was drawn; if not, nothing at all was done.
    bool Draws(IMKCustomDrawable& drawable) {
        OnRenderThread const here;
        RendererTrace::TakeCalls();
        RendererTrace::TakeEvents();
        drawable.DrawRT(projection, paint);
        bool const draws = !RendererTrace::TakeEvents().empty();
        EXPECT_NE(RendererTrace::TakeCalls().empty(), draws);
        return draws;
    }
    // One draw, with the states and the tiling that all have in common.
    TracedDraw Draw(IMKCustomDrawable& drawable) {
        OnRenderThread const here;
        ForceOtherStates();
        RendererTrace::TakeEvents();
        drawable.DrawRT(projection, paint);
        std::vector<TracedDraw> const draws = RendererTrace::GetDraws();
        EXPECT_EQ(draws.size(), 1u);
        if (draws.empty()) return {};
        EXPECT_FALSE(draws[0].state.depthStencil.IsStencil());
        EXPECT_EQ(draws[0].state.blend.GetColorEquation().destination, BlendingFactor::SrcAlpha);
        EXPECT_EQ(draws[0].textures.at(0), RendererTrace::NameOf(TextureOf(first)));
        for (int axis : {TextureParamWrappingS, TextureParamWrappingT})
            EXPECT_EQ(RendererTrace::GetParameter(TextureOf(first), axis), TextureWrapRepeat);
        return draws[0];
    }
    static ITextureObject* TextureOf(BitmapPtr const& bitmap) { return StripOf(bitmap)->GetTexture(); }

    Matrix4<float> const projection{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0, -1, 0.5f, 0, 1};
    MKPaint paint = CommonPaint();
    BitmapPtr first = NewBitmap(40, 20);
    BitmapPtr second = NewBitmap(8, 8);
};

TEST_F(CustomDrawablesTest, GpuObjectsAreMadeAndReleasedByTasksInOrder) {
    for (Maker const& make : Makers()) {
        int const posted = queue.GetPostedCount();
        IMKCustomDrawable* const drawable = make(&queue);
        EXPECT_EQ(queue.GetPostedCount(), posted + 1);
        EXPECT_FALSE(Draws(*drawable)); // too early
        queue.RunAll();
        EXPECT_TRUE(Draws(*drawable));

        EXPECT_EQ(drawable->Unref(), 0);
        EXPECT_EQ(CountOf(first.Get()) + CountOf(second.Get()), 2);
        for (char const* kind : {"graphics", "blend", "depthstencil", "program"}) {
            RendererTrace::TakeCalls();
            EXPECT_TRUE(queue.RunOne());
            EXPECT_THAT(RendererTrace::TakeCalls().at(0),
                        MatchesRegex(kind + std::string(" [0-9]+ Release")));
        }
        EXPECT_EQ(queue.GetPendingCount(), 0);

        // The construction task is the last to let go when the creator does before.
        EXPECT_EQ(make(&queue)->Unref(), 1);
        queue.RunAll();
    }
}

TEST_F(CustomDrawablesTest, SettersTakeReferencesAndAConstructorAdoptsThem) {
    auto const drawable = Constructed(NewBlended(&queue, 8, 8));
    EXPECT_EQ(CountOf(first.Get()), 2);
    drawable->SetBitmapFirst(first.Get()); // the same: nothing changes
    EXPECT_EQ(CountOf(first.Get()), 2);
    drawable->SetBitmapFirst(second.Get());
    EXPECT_EQ(CountOf(first.Get()), 1);
    EXPECT_EQ(CountOf(second.Get()), 3);
    drawable->SetBitmapSecond(nullptr);
    EXPECT_EQ(CountOf(second.Get()), 2);
    EXPECT_FALSE(Draws(*drawable));

    auto const over = Constructed(New<MKNonPremultipliedColorDrawable>(&queue, first.Get(), nullptr));
    EXPECT_FALSE(Draws(*over));
    over->SetBitmap(nullptr, first.Get());
    EXPECT_FALSE(Draws(*over));
    EXPECT_EQ(CountOf(first.Get()), 2);
    EXPECT_FALSE(Draws(*Constructed(New<MKTextMaskBitmapDrawable>(&queue))));
    EXPECT_FALSE(Draws(*Constructed(New<MKGaussianBlurDrawable>(&queue))));
}

TEST_F(CustomDrawablesTest, EachDrawsItsRectangleWithItsUniforms) {
    using Names = std::vector<std::string>; // of uniforms, the projection's first
    auto const expect = [&](IMKCustomDrawable& drawable, char const* shader,
                            std::vector<float> const& vertices, Names const& uniforms,
                            std::string const& values) {
        SCOPED_TRACE(shader);
        TracedDraw const draw = Draw(drawable);
        EXPECT_EQ(draw.shader, shader);
        bool const isStrip = draw.count == 4;
        EXPECT_EQ(draw.primitive, isStrip ? PrimitiveType::TriangleStrip : PrimitiveType::TriangleList);
        EXPECT_EQ(draw.vertices, vertices);
        EXPECT_EQ(Values(draw, uniforms), "2 0 0 0 0 3 0 0 0 0 1 0 -1 0.5 0 1 | " + values);
        return draw;
    };
    auto const blend = Constructed(NewBlended(&queue, 0, 0));
    TracedDraw draw =
        expect(*blend, "MKBlenderBitmapsShader",
               {1, 2, 1, 0.25f, 0.25f, 1, 4, 1, 0.25f, 0.75f, 3, 2, 1, 0.75f, 0.25f,
                3, 2, 1, 0.75f, 0.25f, 1, 4, 1, 0.25f, 0.75f, 3, 4, 1, 0.75f, 0.75f},
               {"uProjectionMatrix", "uFactor", "uSrcTexture1", "uSrcTexture2", "uHasTintColor"},
               "0.75 | 0 | 1 | 1");
    EXPECT_EQ(draw.textures.at(1), RendererTrace::NameOf(TextureOf(second)));

    auto const over = Constructed(New<MKNonPremultipliedColorDrawable>(&queue, first.Get(), second.Get()));
    draw =
        expect(*over, "MKNonPremultipliedColorShader", {0, 0, 0, 0, 0, 20, 0, 1, 40, 0, 1, 0, 40, 20, 1, 1},
               {"projectionMatrix", "srcTexture", "dstTexture"}, "0 | 1");
    EXPECT_EQ(draw.textures.at(1), RendererTrace::NameOf(TextureOf(second)));

    auto const mask = Constructed(New<MKTextMaskBitmapDrawable>(&queue, first.Get()));
    mask->SetDstPosition(2.5f, -3);
    expect(*mask, "MKTextMaskBitmapShader", {2.5f,  -3, 0, 0, 2.5f, 17, 0, 1, 42.5f, -3, 1, 0,
                                             42.5f, -3, 1, 0, 2.5f, 17, 0, 1, 42.5f, 17, 1, 1},
           {"uProjectionMatrix", "uMaskColor", "uSrcTexture"}, "0.5 0.25 0.125 0.75 | 0");

    auto const blur = Constructed(New<MKGaussianBlurDrawable>(&queue, first.Get()));
    Names const names = {"projectionMatrix", "isHorizontal", "blurAmount", "uTintColor", "uHasTintColor"};
    EXPECT_EQ(Values(Draw(*blur), {"isHorizontal", "blurAmount"}), "1 | 1");
    blur->SetHorizotalDirection(false);
    blur->SetBlurAmount(2.5f);
    blur->SetOffset(20, -5);
    expect(*blur, "MKGaussianBlurShader",
           {0, 0, -0.5f, 0.25f, 0, 20, -0.5f, 1.25f, 40, 0, 0.5f, 0.25f, 40, 20, 0.5f, 1.25f}, names,
           "0 | 2.5 | 1 0 0.5 0.25 | 1");
}

TEST_F(CustomDrawablesTest, ABlendKeepsTheSizeOfItsFirstDraw) {
    auto const drawable = Constructed(NewBlended(&queue, 0, 0));
    std::vector<float> const whole = Draw(*drawable).vertices;
    std::swap(first, second);
    drawable->SetBitmapFirst(first.Get());
    EXPECT_EQ(Draw(*drawable).vertices, whole);
    drawable->SetSize(80, 0); // taken as it is, also when only one side is 0
    EXPECT_THAT(VerticesOf(Draw(*drawable)).front(), ElementsAre(1, 2, 1, 0.125f, kInfinity));

    for (RectF const& empty : {RectF(1, 1, 1, 5), RectF(5, 5, 1, 9), RectF(0, 0, kNaN, 5)}) {
        drawable->SetRects(empty, RectF(0, 0, 5, 5));
        EXPECT_FALSE(Draws(*drawable));
        drawable->SetRects(RectF(0, 0, 5, 5), empty);
        EXPECT_FALSE(Draws(*drawable));
    }
}

} // namespace
} // namespace Moka::Testing
