// Random scenes of everything that a canvas draws. Each shape in a cell of its own, under clips and matrices, against
// the reference, on one strip and on several; and shapes on a pile that the renderer joins, against the same draws one
// by one.
#include "moka/renderer/RendererFactory.h"
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <limits>
#include <random>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 160;
constexpr int kHeight = 120;

constexpr float kHuge = std::numeric_limits<float>::max();
constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kStrange[] = {
    std::numeric_limits<float>::quiet_NaN(), kInfinity, -kInfinity, kHuge, -kHuge, 0};

class RandomScene {
public:
    RandomScene(unsigned seed, int top, bool isStrange = false)
        : mRandom(seed), mTop(top), mIsStrange(isStrange) {}

    void DrawPile(IMKCanvas& canvas, Scenes::SceneStage& stage) {
        RefPtr<IMKBitmap> const bitmaps[] = {MakeBitmap(stage, MakeAlphaPattern(12, 9)),
                                             MakeBitmap(stage, MakeGradient(20, 20))};
        for (int i = 0; i < 150; ++i) {
            if (Below(12) == 0) ChangeClip(canvas);
            if (Below(4) == 0) ChangeMatrix(canvas);
            ChangePaint();
            DrawShape(canvas, *bitmaps[Below(2)], {Between(0, kWidth), Between(0, kHeight)}, 40);
        }
    }

    void DrawCells(IMKCanvas& canvas, Scenes::SceneStage& stage) {
        RefPtr<IMKBitmap> const bitmap = MakeBitmap(stage, MakeGradient(20, 20));
        for (int i = 0; i < 12; ++i) {
            int const x = i % 4 * 40;
            int const y = mTop + i / 4 * 40;
            int const level = canvas.Save(IMKCanvasBase::SaveAll);
            int const clips = Below(4);
            for (int clip = 0; clip < clips; ++clip) {
                canvas.SetMatrix(Matrix3<float>());
                if (Flip())
                    canvas.PreRotate(Between(-10, 10), static_cast<float>(x) + 20,
                                     static_cast<float>(y) + 20);
                canvas.SetClipRect(x + Below(15), y + Below(15), 15 + Below(20), 15 + Below(20),
                                   static_cast<IMKCanvasBase::ClipOp>(Below(7)));
            }
            canvas.SetMatrix(Matrix3<float>());
            if (Flip()) canvas.PreTranslate(Between(-2, 2), Between(-2, 2));
            if (Flip())
                canvas.PreRotate(Between(-90, 90), static_cast<float>(x) + 20, static_cast<float>(y) + 20);
            ChangePaint();
            mPaint.SetXFermode(static_cast<MKPaint::XFermode>(Below(19)));
            mPaint.SetTileMode(static_cast<MKPaint::TileMode>(Below(3)));
            DrawShape(canvas, *bitmap,
                      {static_cast<float>(x) + Between(3, 10), static_cast<float>(y) + Between(3, 10)}, 24);
            canvas.Restore(level);
        }
    }

private:
    int Below(int end) { return std::uniform_int_distribution<int>(0, end - 1)(mRandom); }
    float Between(float low, float high) {
        if (mIsStrange && Below(5) == 0) return kStrange[Below(6)];
        float const value = std::uniform_real_distribution<float>(low, high)(mRandom);
        // Through pixel centres and corners as often as not.
        return Below(2) == 0 ? value : std::floor(value * 4) / 4;
    }
    bool Flip() { return Below(2) == 0; }

    void ChangeMatrix(IMKCanvas& canvas) {
        canvas.SetMatrix(Matrix3<float>());
        if (Flip()) canvas.PreTranslate(Between(-20, 20), Between(-20, 20));
        if (Flip()) canvas.PreRotate(Between(0, 90), kWidth / 2.0f, kHeight / 2.0f);
        if (Flip()) canvas.PreScale(Between(0.5f, 2), Between(0.5f, 2));
    }

    void ChangeClip(IMKCanvas& canvas) {
        if (mLevel >= 0) canvas.Restore(mLevel);
        mLevel = canvas.Save(IMKCanvasBase::SaveAll);
        if (Flip()) return;
        canvas.SetMatrix(Matrix3<float>());
        if (Flip()) canvas.PreRotate(Between(5, 40), kWidth / 2.0f, kHeight / 2.0f);
        canvas.SetClipRect(Below(40), Below(30), 60 + Below(60), 50 + Below(40),
                           Flip() ? IMKCanvasBase::Intersect : IMKCanvasBase::Replace);
    }

    void ChangePaint() {
        static constexpr MKPaint::XFermode kModes[] = {MKPaint::SrcOver, MKPaint::SrcOver, MKPaint::SrcAtop,
                                                       MKPaint::Darken};
        if (Below(10) == 0) mMode = kModes[Below(4)];
        mPaint = MKPaint();
        mPaint.SetXFermode(mMode);
        mPaint.SetColor(Between(0, 1), Between(0, 1), Between(0, 1), Flip() ? 1 : Between(0, 1));
        if (Below(5) == 0) mPaint.SetTintColor(Between(0, 1), Between(0, 1), Between(0, 1), Between(0, 1));
        mPaint.SetAntiAliasing(Flip());
        mPaint.SetStyle(static_cast<MKPaint::Style>(Below(3)));
        mPaint.SetLineWidth(Between(1, 6));
        mPaint.SetLineCapType(static_cast<MKPaint::LineCapType>(Below(3)));
        if (Flip()) mPaint.SetDashedLinePattern(Vector2<float>(Between(1, 8), Between(1, 8)));
    }

    void DrawShape(IMKCanvas& canvas, IMKBitmap& bitmap, PointF const& at, float largest) {
        float const x = at.x;
        float const y = at.y;
        RectF const box(x, y, x + Between(2, largest), y + Between(2, largest));
        switch (Below(7)) {
        case 0:
            return canvas.DrawRect(box, &mPaint);
        case 1:
            return canvas.DrawRoundRect(box, Between(1, 10), Between(1, 10), &mPaint);
        case 2:
            return canvas.DrawCircle(x + largest / 2, y + largest / 2, Between(1, largest / 2), &mPaint);
        case 3:
            return canvas.DrawLine(box.left, box.top, box.right, box.bottom, &mPaint);
        case 4:
            return canvas.DrawSimpleLine(box.left, box.top, box.right, box.bottom, &mPaint);
        case 5:
            return canvas.DrawSimpleLines({{x, y}, {x + 9, y + 4}, {x + largest, y}, {x, y + 20}, {1, 1}},
                                          &mPaint);
        default:
            return canvas.DrawBitmap(&bitmap, box, &mPaint);
        }
    }

    std::mt19937 mRandom;
    int const mTop; // of the cells
    bool const mIsStrange;
    MKPaint mPaint;
    int mLevel = -1; // below the clip
    MKPaint::XFermode mMode = MKPaint::SrcOver;
};

class RandomTest : public CanvasDrawing, public ::testing::WithParamInterface<unsigned> {};

TEST_P(RandomTest, ShapesInCellsLookAsTheReferenceDrawsThem) {
    kept = 1; // some are darker than what they are drawn over
    for (int const side : {kLarge, kWidth}) {
        UseLargestSide(side);
        int const top =
            side == kLarge ? 0 : kWidth - kHeight / 2; // the first strip ends in the middle of the shapes
        ExpectLikeReference({MakeBackdrop(kWidth, top + kHeight),
                             [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                 RandomScene(GetParam(), top).DrawCells(canvas, stage);
                             }},
                            "seed " + std::to_string(GetParam()) + " side " + std::to_string(side));
    }
}

TEST_P(RandomTest, JoinedDrawsAreTheSameAsOneByOne) {
    kept = 1; // some are darker than what they are drawn over
    int variants = 0;
    Drawing const drawing =
        Twice({MakeBackdrop(kWidth, kHeight), [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                   RandomScene(GetParam(), 0).DrawPile(canvas, stage);
                   unsigned char texel[4];
                   canvas.GetBitmap()->GetBitmapData(Rect(0, 0, 1, 1), texel); // flushes
                   variants = RendererFactory::GetStatistics().variants;
               }});
    Picture const single = Draw(drawing, Way::Immediate);
    RendererStatistics const before = RendererFactory::GetStatistics();
    Picture const merged = Draw(drawing);
    RendererStatistics const after = RendererFactory::GetStatistics();
    EXPECT_GT(variants, 0);
    EXPECT_LT(after.draws - before.draws, after.drawRequests - before.drawRequests);
    Slack const slack(kWidth, kHeight, 1);
    ExpectSame(single, merged, "merged", &slack);
}

// Nothing crashes, no GL error, and what is drawn next is right.
TEST_P(RandomTest, NumbersAndMatricesThatMakeNoSenseDisturbNothing) {
    kept = 1;
    auto const draw = [](bool isDisturbed) -> Drawing::Function {
        return [isDisturbed](IMKCanvas& canvas, Scenes::SceneStage& stage) {
            canvas.Save(IMKCanvasBase::SaveAll);
            if (isDisturbed) RandomScene(GetParam(), 0, true).DrawPile(canvas, stage);
            canvas.Restore(0);
            canvas.ClearAll(0x60203040);
            RandomScene(GetParam(), 0).DrawCells(canvas, stage);
        };
    };
    Picture const start = MakeBackdrop(kWidth, kHeight);
    Picture const expected = Draw({start, draw(false)});
    Slack const slack(kWidth, kHeight, 1);
    for (Way const way : {Way::Deferred, Way::RenderThread})
        ExpectSame(expected, Draw({start, draw(true)}, way), "after strange numbers", &slack);
}

INSTANTIATE_TEST_SUITE_P(Seeds, RandomTest, ::testing::Range(1u, 13u));

using CanvasTest = CanvasDrawing;

// Through a window of 90 x 80 units at (left, top): a mediump float of 16 bits overflows when a distance above 256 is
// squared, and tells places above 1024 apart to a whole unit only.
TEST_F(CanvasTest, EdgesAreAsFineFarFromTheOriginAndFarFromTheirCentre) {
    MKPaint paint;
    paint.SetColor(0.9f, 0.5f, 0.2f, 0.8f);
    paint.SetStyle(MKPaint::Stroke);
    paint.SetLineWidth(6);
    paint.SetLineCapType(MKPaint::Round);
    paint.SetAntiAliasing(true);
    MKPaint filled = paint, wide = paint, dashed = paint;
    filled.SetStyle(MKPaint::Fill);
    wide.SetLineWidth(560);
    dashed.SetDashedLinePattern(Vector2<float>(9.25f, 8));
    struct {
        char const* what;
        float left, top;
        std::function<void(IMKCanvas&)> draw;
    } const cases[] = {
        {"large circle", 1060, 980, [&](auto& c) { c.DrawCircle(700.25f, 1000.5f, 400, &filled); }},
        {"large ring", 1060, 980, [&](auto& c) { c.DrawCircle(700.25f, 1000.5f, 400, &paint); }},
        {"circle far away", 3000, 2000, [&](auto& c) { c.DrawCircle(3040.3f, 2040.7f, 30.25f, &filled); }},
        {"ring far away", 3000, 2000, [&](auto& c) { c.DrawCircle(3040.3f, 2040.7f, 30.25f, &paint); }},
        {"wide cap", 1745, 190, [&](auto& c) { c.DrawLine(400, 220, 1750, 500, &wide); }},
        {"dashes far from the start", 2920, 290, [&](auto& c) { c.DrawLine(4, 100.5f, 2990, 340, &dashed); }},
    };
    for (auto const& one : cases) {
        ExpectLikeReference({MakeBackdrop(90, 80),
                             [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                 canvas.PreTranslate(-one.left, -one.top);
                                 one.draw(canvas);
                             }},
                            one.what);
    }
}

TEST_F(CanvasTest, ABitmapIsDrawnOntoItselfAndOntoItsClone) {
    kept = 2; // a texture and its frame buffer
    for (bool const clone : {false, true}) {
        ExpectLikeReference({MakeBackdrop(40, 40),
                             [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                 IMKBitmap* const target = canvas.GetBitmap();
                                 auto const source = clone ? RefPtr<IMKBitmap>::Adopt(target->Clone())
                                                           : RefPtr<IMKBitmap>::Share(target);
                                 MKPaint paint;
                                 paint.SetXFermode(MKPaint::Src);
                                 canvas.DrawBitmap(source.Get(), RectF(0, 0, 20, 30), RectF(7, 5, 27, 35),
                                                   &paint);
                             }},
                            clone ? "onto its clone" : "onto itself");
    }
}

} // namespace
} // namespace Moka::Testing
