// Edges: at fractions of a pixel, at corners, under scaled and turned matrices, one pixel's worth by hand.
#include "tests/pixel/canvas/CanvasDrawing.h"

namespace Moka::Testing {
namespace {

constexpr float kQuarters[] = {0, 0.25f, 0.5f, 0.75f};

MKPaint MakePaint(MKPaint::Style style, float width, bool antiAliased) {
    MKPaint paint;
    paint.SetColor(0.9f, 0.5f, 0.2f, 0.8f);
    paint.SetStyle(style);
    paint.SetLineWidth(width);
    paint.SetAntiAliasing(antiAliased);
    return paint;
}

std::string Name(std::string const& what, int style, float width, bool antiAliased) {
    return what + " style " + std::to_string(style) + " width " + std::to_string(width) +
           (antiAliased ? " soft" : " hard");
}

class CoverageTest : public CanvasDrawing {
protected:
    // In every style, by a function of the canvas and the paint.
    template <class Function>
    void ExpectInEveryStyle(Picture const& start, std::string const& what, Function const& draw) {
        for (int const style : {0, 1, 2}) {
            for (float const width : {1.0f, 2.5f, 4.0f}) {
                for (bool const antiAliased : {false, true}) {
                    if (style == 0 && width > 1) continue;
                    MKPaint const paint = MakePaint(static_cast<MKPaint::Style>(style), width, antiAliased);
                    Drawing const drawing{
                        start, [&](IMKCanvas& canvas, Scenes::SceneStage&) { draw(canvas, paint); }};
                    ExpectLikeReference(drawing, Name(what, style, width, antiAliased));
                }
            }
        }
    }
};

TEST_F(CoverageTest, ACornerTakesTheLesserOfItsTwoRamps) {
    MKPaint paint;
    paint.SetAntiAliasing(true);
    Picture const picture = Draw({Picture(20, 20), [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                      canvas.DrawRect(3.25f, 4.5f, 12, 12.75f, &paint);
                                  }});
    auto const alpha = [&](int x, int y) { return int{picture.GetColor(x, y)[3]}; };
    EXPECT_NEAR(alpha(3, 8), 0.75 * 255, 1);
    EXPECT_NEAR(alpha(8, 4), 0.5 * 255, 1);
    EXPECT_NEAR(alpha(3, 4), 0.5 * 255, 1);
    EXPECT_NEAR(alpha(3, 12), 0.75 * 255, 1);
    EXPECT_NEAR(alpha(12, 12), 0, 1);
    EXPECT_NEAR(alpha(11, 12), 0.75 * 255, 1);
    EXPECT_EQ(alpha(2, 8), 0);
    EXPECT_EQ(alpha(7, 7), 255);
}

TEST_F(CoverageTest, RectanglesAtQuarterPixels) {
    ExpectInEveryStyle(MakeBackdrop(96, 96), "quarters", [](IMKCanvas& canvas, MKPaint const& paint) {
        for (int i = 0; i < 16; ++i) {
            int const column = i % 4;
            int const row = i / 4;
            float const x = 6 + 24.0f * static_cast<float>(column) + kQuarters[column];
            float const y = 6 + 24.0f * static_cast<float>(row) + kQuarters[row];
            canvas.DrawRect(x, y, x + 11 + kQuarters[row], y + 12.5f, &paint);
        }
    });
}

TEST_F(CoverageTest, FringesScaleAndTurnWithTheMatrix) {
    Matrix3f const perspective(1.1f, 0.1f, 0.002f, -0.2f, 0.9f, 0.001f, 8, 4, 1);
    Matrix3f const skewed(1.4f, 0.3f, 0, -0.6f, 0.8f, 0, 20, -4, 1);
    Matrix3f const large(3.5f, 0, 0, 0, 2, 0, -70.25f, -30, 1);
    Matrix3f const small(0.3f, 0, 0, 0, 0.4f, 0, 20, 20.5f, 1);
    Matrix3f const mirrored(-1, 0, 0, 0, 1, 0, 80, 0.125f, 1);
    Matrix3f turned;
    turned.setRotate(33, 40, 40);
    int number = 0;
    for (Matrix3f const& matrix : {perspective, skewed, large, small, mirrored, turned}) {
        ExpectInEveryStyle(MakeBackdrop(80, 80), "matrix " + std::to_string(++number),
                           [&](IMKCanvas& canvas, MKPaint const& paint) {
                               canvas.SetMatrix(matrix);
                               canvas.DrawRect(24.25f, 22, 50, 52.5f, &paint);
                           });
    }
}

TEST_F(CoverageTest, EllipticCornersAndCirclesUnderMatrices) {
    Matrix3f turned;
    turned.setRotate(21, 50, 40);
    turned.preScale(1.2f, 0.7f);
    for (Matrix3f const& matrix : {Matrix3f(), turned}) {
        ExpectInEveryStyle(MakeBackdrop(110, 90), matrix.isIdentity() ? "round" : "round turned",
                           [&](IMKCanvas& canvas, MKPaint const& paint) {
                               canvas.SetMatrix(matrix);
                               canvas.DrawRoundRect(8, 8, 48, 38, 9, 6.5f, &paint);
                               canvas.DrawRoundRect(60.25f, 8.5f, 98, 30, 40, 14, &paint);
                               canvas.DrawRoundRect(8, 50, 48, 80, 0, 5, &paint);
                               canvas.DrawCircle(76.3f, 60.7f, 14.25f, &paint);
                               canvas.DrawCircle(100, 50, 0.75f, &paint);
                           });
    }
}

TEST_F(CoverageTest, LinesInEveryCapAndDashAtQuarterPixels) {
    for (int const cap : {0, 1, 2, 7}) {
        for (bool const dashed : {false, true}) {
            MKPaint paint = MakePaint(MKPaint::Fill, 5, true);
            paint.SetLineCapType(static_cast<MKPaint::LineCapType>(cap));
            if (dashed) paint.SetDashedLinePattern(Vector4<float>(9, 8, 3.5f, 7));
            Drawing const drawing{MakeBackdrop(100, 100), [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                      for (float const q : kQuarters) {
                                          canvas.DrawLine(12 + q, 10 + 40 * q, 80 + 10 * q, 10 + 41 * q,
                                                          &paint);
                                          canvas.DrawLine(20 + 80 * q, 54, 14 + 70 * q, 90 + q, &paint);
                                      }
                                  }};
            ExpectLikeReference(drawing, "cap " + std::to_string(cap) + (dashed ? " dashed" : ""));
        }
    }
}

// Through a window of 90 x 80 units at (left, top): a mediump float of 16 bits overflows when a distance above
// 256 is squared, and tells places above 1024 apart to a whole unit only.
TEST_F(CoverageTest, EdgesAreAsFineFarFromTheOriginAndFarFromTheirCentre) {
    auto const expect = [this](char const* what, float left, float top, auto const& draw) {
        ExpectLikeReference({MakeBackdrop(90, 80),
                             [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                 canvas.PreTranslate(-left, -top);
                                 draw(canvas, stage);
                             }},
                            what);
    };
    for (auto const style : {MKPaint::Fill, MKPaint::Stroke}) {
        MKPaint const paint = MakePaint(style, 6, true);
        expect("large circle", 1060, 980, [&](IMKCanvas& canvas, Scenes::SceneStage&) {
            canvas.DrawCircle(700.25f, 1000.5f, 400, &paint);
        });
        expect("small circle far away", 3000, 2000, [&](IMKCanvas& canvas, Scenes::SceneStage&) {
            canvas.DrawCircle(3040.3f, 2040.7f, 30.25f, &paint);
        });
    }
    MKPaint wide = MakePaint(MKPaint::Fill, 560, true);
    wide.SetLineCapType(MKPaint::Round);
    expect("wide cap", 1745, 190,
           [&](IMKCanvas& canvas, Scenes::SceneStage&) { canvas.DrawLine(400, 220, 1750, 500, &wide); });
    MKPaint dashed = MakePaint(MKPaint::Fill, 5, true);
    dashed.SetDashedLinePattern(Vector2<float>(9.25f, 8));
    dashed.SetLineCapType(MKPaint::Round);
    expect("dashes far from the start", 2920, 290,
           [&](IMKCanvas& canvas, Scenes::SceneStage&) { canvas.DrawLine(4, 100.5f, 2990, 340, &dashed); });
}

TEST_F(CoverageTest, SimpleLinesAreSoftAlongTheirSidesOnly) {
    for (float const width : {1.0f, 3.25f}) {
        for (bool const antiAliased : {false, true}) {
            MKPaint const paint = MakePaint(MKPaint::Fill, width, antiAliased);
            Drawing const drawing{
                MakeBackdrop(80, 80), [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                    canvas.DrawSimpleLines({{5.1f, 5.2f}, {70, 12}, {70, 20}, {8, 60.3f}, {1, 1}}, &paint);
                    canvas.DrawSimpleLine(12.25f, 20.1f, 12.25f, 70.4f, &paint);
                }};
            ExpectLikeReference(drawing, Name("simple lines", 0, width, antiAliased));
        }
    }
}

TEST_F(CoverageTest, WidthsUnderOneDrawNothingButCircles) {
    MKPaint const paint = MakePaint(MKPaint::Stroke, 0.9f, true);
    Picture const start = MakeBackdrop(40, 40);
    ExpectSame(start,
               Draw({start,
                     [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                         canvas.DrawRect(5, 5, 30, 30, &paint);
                         canvas.DrawRoundRect(5, 5, 30, 30, 4, 4, &paint);
                         canvas.DrawLine(5, 5, 30, 30, &paint);
                         canvas.DrawSimpleLine(5, 5, 30, 30, &paint);
                         canvas.DrawSimpleLines({{5, 5}, {30, 30}}, &paint);
                     }}),
               "thin");
    ExpectLikeReference(
        {start, [&](IMKCanvas& canvas, Scenes::SceneStage&) { canvas.DrawCircle(20, 20, 12.3f, &paint); }},
        "thin circle");
}

} // namespace
} // namespace Moka::Testing
