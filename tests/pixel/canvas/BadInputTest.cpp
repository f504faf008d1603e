// Input that makes no sense: nothing crashes, no GL error, and the next draw is right.
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <limits>

namespace Moka::Testing {
namespace {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kHuge = std::numeric_limits<float>::max();
constexpr float kStrange[] = {kNaN, kInfinity, -kInfinity, kHuge, -kHuge, 0};

MKPaint MakePaint() {
    MKPaint paint;
    paint.SetColor(0.9f, 0.4f, 0.1f, 0.6f);
    paint.SetAntiAliasing(true);
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(3);
    return paint;
}

void DrawSomething(IMKCanvas& canvas) {
    MKPaint const paint = MakePaint();
    canvas.DrawRect(4.25f, 5, 30, 31.5f, &paint);
    canvas.DrawCircle(30, 30, 9, &paint);
    canvas.DrawLine(5, 40, 40, 42, &paint);
}

void DrawOneOfEach(IMKCanvas& canvas, Scenes::SceneStage& stage, float a, float b) {
    MKPaint const paint = MakePaint();
    auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
    canvas.DrawRect(a, 5, b, 30, &paint);
    canvas.DrawRoundRect(a, 5, b, 30, 4, 6, &paint);
    canvas.DrawRoundRect(4, 5, 40, 30, a, b, &paint);
    canvas.DrawCircle(a, b, 5, &paint);
    canvas.DrawCircle(20, 20, a, &paint);
    canvas.DrawLine(a, 5, b, 30, &paint);
    canvas.DrawSimpleLine(5, a, 20, b, &paint);
    canvas.DrawSimpleLines({{a, b}, {4, 5}, {b, a}}, &paint);
    canvas.DrawBitmap(bitmap.Get(), a, b, &paint);
    canvas.DrawBitmap(bitmap.Get(), RectF(a, 0, 10, b), RectF(b, 0, 20, 20), &paint);
    std::vector<PointF> points{{a, b}, {3, b}};
    canvas.DrawBitmaps(bitmap.Get(), points, &paint);
    canvas.DrawBitmaps(bitmap.Get(), RectF(0, a, 10, 10), {RectF(a, b, 5, 5), RectF(0, 0, a, b)}, &paint);
}

class BadInputTest : public CanvasDrawing {
protected:
    // What bad leaves behind on the target is cleared; what follows must not know of it.
    void ExpectNextDrawRight(Drawing::Function const& bad, std::string const& what) {
        auto const good = [](IMKCanvas& canvas) {
            canvas.ClearAll(0x60203040);
            DrawSomething(canvas);
        };
        Picture const start = MakeBackdrop(48, 48);
        Drawing const undisturbed{start, [&](IMKCanvas& canvas, Scenes::SceneStage&) { good(canvas); }};
        Drawing const disturbed{start, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                    canvas.Save(IMKCanvasBase::SaveAll);
                                    bad(canvas, stage);
                                    canvas.Restore(0);
                                    good(canvas);
                                }};
        Picture const expected = Draw(undisturbed);
        for (Way const way : {Way::Deferred, Way::RenderThread})
            ExpectSame(expected, Draw(disturbed, way), what);
    }
};

TEST_F(BadInputTest, StrangeNumbersMatricesAndClipsDisturbNothing) {
    for (float const a : kStrange) {
        for (float const b : kStrange) {
            ExpectNextDrawRight(
                [=](IMKCanvas& canvas, Scenes::SceneStage& stage) { DrawOneOfEach(canvas, stage, a, b); },
                std::to_string(a) + " and " + std::to_string(b));
        }
    }
    Matrix3f const singular(1, 2, 0, 2, 4, 0, 0, 0, 1);
    Matrix3f const behind(1, 0, -0.1f, 0, 1, -0.2f, 0, 0, 1);
    for (Matrix3f const& matrix : {singular, behind, Matrix3f(0.0f), Matrix3f(kNaN), Matrix3f(kHuge)}) {
        ExpectNextDrawRight(
            [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                canvas.SetMatrix(matrix);
                canvas.SetClipRect(1, 2, 30, 30, IMKCanvasBase::Union);
                DrawOneOfEach(canvas, stage, 3, 30);
                canvas.SetClipRect(2000000000, -2000000000, 2000000000, -5, IMKCanvasBase::Xor);
                DrawOneOfEach(canvas, stage, 3, 30);
            },
            "matrix of " + std::to_string(matrix[0]));
    }
}

TEST_F(BadInputTest, ABitmapIsDrawnOntoItselfAndOntoItsClone) {
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
