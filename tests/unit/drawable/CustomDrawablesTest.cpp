// The four custom drawables: their life between two threads, their references, and what they draw.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/renderer/IDepthStencilState.h"
#include "tests/unit/bitmap/BitmapFixture.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <functional>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

class CustomDrawablesTest : public BitmapFixture {
protected:
    using Maker = std::function<IMKCustomDrawable*(IGLMsgQueue*)>;

    void SetUp() override {
        BitmapFixture::SetUp();
        first = RefPtr<IMKBitmap>::Adopt(Create(40, 20));
        second = RefPtr<IMKBitmap>::Adopt(Create(8, 8));
        queue.RunAll();
        paint = CommonPaint();
        paint.SetTileMode(MKPaint::Repeat);
    }
    void TearDown() override {
        first = {};
        second = {};
        BitmapFixture::TearDown();
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
        RecordingRenderer::TakeCalls();
        RecordingRenderer::TakeEvents();
        drawable.DrawRT(projection, paint);
        bool const draws = !RecordingRenderer::TakeEvents().empty();
        EXPECT_NE(RecordingRenderer::TakeCalls().empty(), draws);
        return draws;
    }
    // One draw, with the states, tiling and projection that all have in common.
    RecordedDraw Draw(IMKCustomDrawable& drawable, char const* projectionName) {
        OnRenderThread const here;
        ForceStencil();
        RecordingRenderer::TakeEvents();
        drawable.DrawRT(projection, paint);
        std::vector<RecordedDraw> const draws = RecordingRenderer::GetDraws();
        if (draws.size() != 1) {
            ADD_FAILURE() << draws.size() << " draws";
            return {};
        }
        EXPECT_FALSE(draws[0].state.depthStencil.IsStencil());
        EXPECT_EQ(draws[0].state.blend.GetColorEquation().destination, BlendingFactor::SrcAlpha);
        EXPECT_EQ(Values(draws[0], {projectionName}), "2 0 0 0 0 3 0 0 0 0 1 0 -1 0.5 0 1");
        EXPECT_EQ(draws[0].textures.at(0), RecordingRenderer::NameOf(TextureOf(first)));
        EXPECT_EQ(RecordingRenderer::GetParameter(TextureOf(first), TextureParamWrappingS),
                  TextureWrapRepeat);
        EXPECT_EQ(RecordingRenderer::GetParameter(TextureOf(first), TextureParamWrappingT),
                  TextureWrapRepeat);
        return draws[0];
    }
    static ITextureObject* TextureOf(RefPtr<IMKBitmap> const& bitmap) {
        return bitmap->GetTextureBitmap()->GetSubBitmap(0)->GetTexture();
    }

    Matrix4<float> const projection{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0, -1, 0.5f, 0, 1};
    MKPaint paint;
    RefPtr<IMKBitmap> first;
    RefPtr<IMKBitmap> second;
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
            RecordingRenderer::TakeCalls();
            EXPECT_TRUE(queue.RunOne());
            RecordedCall const call = RecordingRenderer::GetCalls().at(0);
            EXPECT_EQ(call.object.substr(0, call.object.find(' ')) + " " + call.operation,
                      std::string(kind) + " Release");
        }
        EXPECT_EQ(queue.GetPendingCount(), 0);

        // The construction task is the last to let go when the creator does before.
        EXPECT_EQ(make(&queue)->Unref(), 1);
        queue.RunAll();
    }
}

TEST_F(CustomDrawablesTest, ARefusedConstructionLeavesADrawableThatDrawsNothingAndLivesOn) {
    refuse = true;
    for (Maker const& make : Makers()) {
        IMKCustomDrawable* const drawable = make(&picky);
        EXPECT_FALSE(Draws(*drawable));
        EXPECT_EQ(drawable->Unref(), 1); // the task's reference stays
        EXPECT_EQ(drawable->Unref(), 0);
        IMKCustomDrawable* const orphan = make(nullptr);
        EXPECT_FALSE(Draws(*orphan));
        EXPECT_EQ(orphan->Unref(), 0);
    }
    EXPECT_EQ(picky.GetRefusedCount(), 4);
}

TEST_F(CustomDrawablesTest, WhatTheRendererRefusedIsNeitherDrawnWithNorReleased) {
    for (ObjectKind kind :
         {ObjectKind::GraphicsObject, ObjectKind::BlendState, ObjectKind::DepthStencilState}) {
        for (Maker const& make : Makers()) {
            RecordingRenderer::FailCreations(kind);
            auto drawable = Constructed(make(&queue));
            RecordingRenderer::StopFailing();
            EXPECT_FALSE(Draws(*drawable));
            drawable = {};
            EXPECT_EQ(queue.RunAll(), 3);
        }
    }
}

TEST_F(CustomDrawablesTest, ARefusedReleaseLeaksThatObjectAndNothingElse) {
    RefusingQueue refusesTheProgram({5}); // after the construction and three releases
    refusesTheProgram.SetAroundRun([] { RecordingRenderer::DeclareRenderThread(); },
                                   [] { RecordingRenderer::DeclareNoRenderThread(); });
    int const alive = RecordingRenderer::CountLiveObjects();
    Makers()[2](&refusesTheProgram)->Unref();
    refusesTheProgram.RunAll();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), alive + 1 + 3); // with its parameters

    OnRenderThread const here;
    ShaderManager& manager = *ShaderManager::GetInstance();
    auto* const leaked = manager.GetShader<MKTextMaskBitmapShader>();
    manager.ReleaseShader(leaked);
    manager.ReleaseShader(leaked);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), alive);
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

TEST_F(CustomDrawablesTest, ABlendMixesTwoBitmapsByThePaintsAlpha) {
    auto const drawable = Constructed(NewBlended(&queue, 0, 0));
    RecordedDraw draw = Draw(*drawable, "uProjectionMatrix");
    EXPECT_EQ(draw.shader, "MKBlenderBitmapsShader");
    EXPECT_EQ(draw.primitive, PrimitiveType::TriangleList);
    std::vector<Vertex> const whole = {{1, 2, 1, 0.25f, 0.25f}, {1, 4, 1, 0.25f, 0.75f},
                                       {3, 2, 1, 0.75f, 0.25f}, {3, 2, 1, 0.75f, 0.25f},
                                       {1, 4, 1, 0.25f, 0.75f}, {3, 4, 1, 0.75f, 0.75f}};
    EXPECT_EQ(VerticesOf(draw), whole);
    EXPECT_EQ(Values(draw, {"uFactor", "uSrcTexture1", "uSrcTexture2", "uHasTintColor"}), "0.75 | 0 | 1 | 1");
    EXPECT_EQ(draw.textures.at(1), RecordingRenderer::NameOf(TextureOf(second)));

    // The size of the first draw stays; one that is set is taken as it is, also when only one side is 0.
    std::swap(first, second);
    drawable->SetBitmapFirst(first.Get());
    EXPECT_EQ(VerticesOf(Draw(*drawable, "uProjectionMatrix")), whole);
    drawable->SetSize(80, 0);
    EXPECT_THAT(VerticesOf(Draw(*drawable, "uProjectionMatrix")).front(),
                ElementsAre(1, 2, 1, 0.125f, kInfinity));

    for (RectF const& empty : {RectF(1, 1, 1, 5), RectF(5, 5, 1, 9), RectF(0, 0, kNaN, 5)}) {
        drawable->SetRects(empty, RectF(0, 0, 5, 5));
        EXPECT_FALSE(Draws(*drawable));
        drawable->SetRects(RectF(0, 0, 5, 5), empty);
        EXPECT_FALSE(Draws(*drawable));
    }
}

TEST_F(CustomDrawablesTest, NonPremultipliedColorIsTheWholeSourceAtTheOrigin) {
    auto const drawable =
        Constructed(New<MKNonPremultipliedColorDrawable>(&queue, first.Get(), second.Get()));
    RecordedDraw const draw = Draw(*drawable, "projectionMatrix");
    EXPECT_EQ(draw.shader, "MKNonPremultipliedColorShader");
    EXPECT_EQ(draw.primitive, PrimitiveType::TriangleStrip);
    EXPECT_THAT(VerticesOf(draw), ElementsAre(Vertex{0, 0, 0, 0}, Vertex{0, 20, 0, 1}, Vertex{40, 0, 1, 0},
                                              Vertex{40, 20, 1, 1}));
    EXPECT_EQ(Values(draw, {"srcTexture", "dstTexture"}), "0 | 1");
    EXPECT_EQ(draw.textures.at(1), RecordingRenderer::NameOf(TextureOf(second)));
}

TEST_F(CustomDrawablesTest, ATextMaskIsPaintedInTheColourAtItsPosition) {
    auto const drawable = Constructed(New<MKTextMaskBitmapDrawable>(&queue, first.Get()));
    EXPECT_THAT(VerticesOf(Draw(*drawable, "uProjectionMatrix")).front(), ElementsAre(0, 0, 0, 0));
    drawable->SetDstPosition(2.5f, -3);
    RecordedDraw const draw = Draw(*drawable, "uProjectionMatrix");
    EXPECT_EQ(draw.shader, "MKTextMaskBitmapShader");
    EXPECT_EQ(draw.primitive, PrimitiveType::TriangleList);
    EXPECT_THAT(VerticesOf(draw),
                ElementsAre(Vertex{2.5f, -3, 0, 0}, Vertex{2.5f, 17, 0, 1}, Vertex{42.5f, -3, 1, 0},
                            Vertex{42.5f, -3, 1, 0}, Vertex{2.5f, 17, 0, 1}, Vertex{42.5f, 17, 1, 1}));
    EXPECT_EQ(Values(draw, {"uMaskColor", "uSrcTexture"}), "0.5 0.25 0.125 0.75 | 0");
}

TEST_F(CustomDrawablesTest, ABlurIsOneDirectionShiftedByItsOffset) {
    auto const drawable = Constructed(New<MKGaussianBlurDrawable>(&queue, first.Get()));
    RecordedDraw draw = Draw(*drawable, "projectionMatrix");
    EXPECT_EQ(draw.shader, "MKGaussianBlurShader");
    EXPECT_EQ(draw.primitive, PrimitiveType::TriangleStrip);
    EXPECT_EQ(Values(draw, {"isHorizontal", "blurAmount", "uTintColor", "uHasTintColor", "srcTexture"}),
              "1 | 1 | 1 0 0.5 0.25 | 1 | 0");
    drawable->SetHorizotalDirection(false);
    drawable->SetBlurAmount(2.5f);
    drawable->SetOffset(20, -5);
    draw = Draw(*drawable, "projectionMatrix");
    EXPECT_THAT(VerticesOf(draw), ElementsAre(Vertex{0, 0, -0.5f, 0.25f}, Vertex{0, 20, -0.5f, 1.25f},
                                              Vertex{40, 0, 0.5f, 0.25f}, Vertex{40, 20, 0.5f, 1.25f}));
    EXPECT_EQ(Values(draw, {"isHorizontal", "blurAmount"}), "0 | 2.5");
}

} // namespace
} // namespace Moka::Testing
