// Transfer modes on bytes: every mode over a grid of source and destination, as rectangles and as bitmaps.
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

constexpr int kSide = 16;

// Alpha grows to the right in the one, downwards in the other: each pixel is a pair of its own.
Picture MakeSource() {
    Picture image(kSide, kSide);
    for (int y = 0; y < kSide; ++y) {
        for (int x = 0; x < kSide; ++x) {
            int const alpha = x * 17;
            auto const part = [&](int value) { return static_cast<unsigned char>(value * alpha / 255); };
            image.SetColor(x, y,
                           {part(255), part(y * 17), part(255 - x * 11), static_cast<unsigned char>(alpha)});
        }
    }
    return image;
}

Picture MakeDestination() {
    Picture const source = MakeSource();
    Picture image(kSide, kSide);
    for (int y = 0; y < kSide; ++y) {
        for (int x = 0; x < kSide; ++x) {
            Color const c = source.GetColor(y, x);
            image.SetColor(x, y, {c[2], c[0], c[1], c[3]});
        }
    }
    return image;
}

MKPaint MakePaint(int mode) {
    MKPaint paint;
    paint.SetXFermode(static_cast<MKPaint::XFermode>(mode));
    return paint;
}

class EveryMode : public CanvasDrawing, public ::testing::WithParamInterface<int> {};

TEST_P(EveryMode, BlendsRectanglesByItsEquation) {
    Picture const source = MakeSource();
    MKPaint paint = MakePaint(GetParam());
    ExpectLikeReference(
        {MakeDestination(),
         [&](IMKCanvas& canvas, Scenes::SceneStage&) {
             for (int y = 0; y < kSide; ++y) {
                 for (int x = 0; x < kSide; ++x) {
                     // Not premultiplied, as paints are.
                     auto const part = [&](int value) { return static_cast<float>(value) / 255.0f; };
                     paint.SetColor(part(255 - 9 * y), part(y * 17), part(255 - x * 11), part(x * 17));
                     auto const left = static_cast<float>(x);
                     auto const top = static_cast<float>(y);
                     canvas.DrawRect(left, top, left + 1, top + 1, &paint);
                 }
             }
         }},
        "rectangles in mode " + std::to_string(GetParam()));
}

TEST_P(EveryMode, BlendsBitmapsByItsEquation) {
    struct {
        float alpha;
        bool tinted;
    } const cases[] = {{1, false}, {0.6f, false}, {0.8f, true}};
    for (auto const& [alpha, tinted] : cases) {
        MKPaint paint = MakePaint(GetParam());
        paint.SetAlpha(alpha);
        if (tinted) paint.SetTintColor(0.2f, 0.9f, 0.5f, 0.7f);
        ExpectLikeReference({MakeDestination(),
                             [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                 auto const bitmap = MakeBitmap(stage, MakeSource());
                                 canvas.DrawBitmap(bitmap.Get(), 0, 0, &paint);
                             }},
                            "bitmaps in mode " + std::to_string(GetParam()) + (tinted ? " tinted" : ""));
    }
}

INSTANTIATE_TEST_SUITE_P(All, EveryMode, ::testing::Range(0, 20));

} // namespace
} // namespace Moka::Testing
