// Draws that the renderer joins against the same draws one by one: random scenes of everything that a canvas
// draws, in which neighbours differ in colour, size, matrix, integers, program, clip and blending.
#include "moka/renderer/RendererFactory.h"
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <random>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 160;
constexpr int kHeight = 120;

class RandomScene {
public:
    explicit RandomScene(unsigned seed) : mRandom(seed) {}

    void Draw(IMKCanvas& canvas, Scenes::SceneStage& stage) {
        RefPtr<IMKBitmap> const bitmaps[] = {MakeBitmap(stage, MakeAlphaPattern(12, 9)),
                                             MakeBitmap(stage, MakeGradient(20, 20))};
        for (int i = 0; i < 150; ++i) {
            if (Below(12) == 0) ChangeClip(canvas);
            if (Below(4) == 0) ChangeMatrix(canvas);
            ChangePaint();
            DrawShape(canvas, *bitmaps[Below(2)]);
        }
    }

private:
    int Below(int end) { return std::uniform_int_distribution<int>(0, end - 1)(mRandom); }
    float Between(float low, float high) {
        float const value = std::uniform_real_distribution<float>(low, high)(mRandom);
        // Through pixel centres and corners as often as not.
        return Below(2) == 0 ? value : std::floor(value * 2) / 2;
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
        if (Below(5) == 0) mPaint.SetTintColor(Between(0, 1), Between(0, 1), Between(0, 1), 1);
        mPaint.SetAntiAliasing(Flip());
        mPaint.SetStyle(static_cast<MKPaint::Style>(Below(3)));
        mPaint.SetLineWidth(Between(1, 6));
        mPaint.SetLineCapType(static_cast<MKPaint::LineCapType>(Below(3)));
        if (Flip()) mPaint.SetDashedLinePattern(Vector2<float>(Between(1, 8), Between(1, 8)));
    }

    void DrawShape(IMKCanvas& canvas, IMKBitmap& bitmap) {
        float const x = Between(0, kWidth);
        float const y = Between(0, kHeight);
        RectF const box(x, y, x + Between(2, 40), y + Between(2, 40));
        switch (Below(7)) {
        case 0:
            return canvas.DrawRect(box, &mPaint);
        case 1:
            return canvas.DrawRoundRect(box, Between(1, 10), Between(1, 10), &mPaint);
        case 2:
            return canvas.DrawCircle(x, y, Between(1, 20), &mPaint);
        case 3:
            return canvas.DrawLine(box.left, box.top, box.right, box.bottom, &mPaint);
        case 4:
            return canvas.DrawSimpleLine(box.left, box.top, box.right, box.bottom, &mPaint);
        case 5:
            return canvas.DrawSimpleLines({{x, y}, {x + 9, y + 4}, {y, x}, {x, y + 20}}, &mPaint);
        default:
            return canvas.DrawBitmap(&bitmap, box, &mPaint);
        }
    }

    std::mt19937 mRandom;
    MKPaint mPaint;
    int mLevel = -1; // below the clip
    MKPaint::XFermode mMode = MKPaint::SrcOver;
};

class MergedTest : public CanvasDrawing, public ::testing::WithParamInterface<unsigned> {};

TEST_P(MergedTest, RandomDrawsAreTheSameAsOneByOne) {
    kept = 1; // some are darker than what they are drawn over
    int variants = 0;
    Drawing const drawing =
        Twice({MakeBackdrop(kWidth, kHeight), [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                   RandomScene(GetParam()).Draw(canvas, stage);
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

INSTANTIATE_TEST_SUITE_P(Seeds, MergedTest, ::testing::Range(1u, 13u));

} // namespace
} // namespace Moka::Testing
