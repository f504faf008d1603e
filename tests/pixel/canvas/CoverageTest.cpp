// Edges far from the origin. Scenes and RandomTest draw all the others.
#include "tests/pixel/canvas/CanvasDrawing.h"

namespace Moka::Testing {
namespace {

MKPaint MakePaint(MKPaint::Style style, float width) {
    MKPaint paint;
    paint.SetColor(0.9f, 0.5f, 0.2f, 0.8f);
    paint.SetStyle(style);
    paint.SetLineWidth(width);
    paint.SetAntiAliasing(true);
    return paint;
}

using CoverageTest = CanvasDrawing;

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
        MKPaint const paint = MakePaint(style, 6);
        expect("large circle", 1060, 980, [&](IMKCanvas& canvas, Scenes::SceneStage&) {
            canvas.DrawCircle(700.25f, 1000.5f, 400, &paint);
        });
        expect("small circle far away", 3000, 2000, [&](IMKCanvas& canvas, Scenes::SceneStage&) {
            canvas.DrawCircle(3040.3f, 2040.7f, 30.25f, &paint);
        });
    }
    MKPaint wide = MakePaint(MKPaint::Fill, 560);
    wide.SetLineCapType(MKPaint::Round);
    expect("wide cap", 1745, 190,
           [&](IMKCanvas& canvas, Scenes::SceneStage&) { canvas.DrawLine(400, 220, 1750, 500, &wide); });
    MKPaint dashed = MakePaint(MKPaint::Fill, 5);
    dashed.SetDashedLinePattern(Vector2<float>(9.25f, 8));
    dashed.SetLineCapType(MKPaint::Round);
    expect("dashes far from the start", 2920, 290,
           [&](IMKCanvas& canvas, Scenes::SceneStage&) { canvas.DrawLine(4, 100.5f, 2990, 340, &dashed); });
}

} // namespace
} // namespace Moka::Testing
