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

class BlendTest : public CanvasDrawing {};

// Both look at what is there: a copy, which a scissor must not cut short.
TEST_F(BlendTest, DarkenAndLightenSeeTheDestinationUnderEveryClipAndStrip) {
    for (int const side : {64, kLarge}) {
        UseLargestSide(side);
        for (MKPaint::XFermode const mode : {MKPaint::Darken, MKPaint::Lighten}) {
            MKPaint const paint = MakePaint(mode);
            ExpectLikeReference({MakeBackdrop(60, 150),
                                 [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                     auto const bitmap = MakeBitmap(stage, MakeSource());
                                     canvas.DrawBitmap(bitmap.Get(), 3, 5, &paint);
                                     canvas.SetClipRect(10, 20, 30, 100, IMKCanvasBase::Intersect);
                                     canvas.DrawBitmap(bitmap.Get(), 3, 14, &paint);
                                     canvas.DrawBitmap(bitmap.Get(), 12, 56, &paint);
                                     canvas.SetClipRect(14, 60, 30, 4, IMKCanvasBase::Difference);
                                     canvas.DrawBitmap(bitmap.Get(), 20, 58, &paint);
                                     canvas.DrawBitmap(bitmap.Get(), 12, 120, &paint);
                                 }},
                                "mode " + std::to_string(mode) + " side " + std::to_string(side));
        }
    }
}

// What their programs discard, inside a stroke and around a corner, keeps the destination in every mode.
TEST_F(BlendTest, AReplacingStrokeLeavesWhatItEncloses) {
    MKPaint paint = MakePaint(MKPaint::Src);
    paint.SetColor(0.9f, 0.5f, 0.2f, 0.8f);
    paint.SetStyle(MKPaint::Stroke);
    paint.SetLineWidth(3);
    ExpectLikeReference({MakeBackdrop(90, 60),
                         [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                             canvas.DrawRoundRect(6, 6, 46, 50, 16, 12, &paint);
                             canvas.DrawCircle(68, 28, 15, &paint);
                         }},
                        "replacing strokes");
}

TEST_F(BlendTest, ColoursBeyondTheirRangeAreCutOff) {
    MKPaint paint;
    paint.SetColor(2, -1, 0.5f, 1.5f);
    MKPaint tinted;
    tinted.SetColor(0, 0, 0, 0.5f);
    tinted.SetTintColor(1, 0.5f, 0.25f, 0.5f);
    ExpectLikeReference({MakeBackdrop(32, 32),
                         [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                             canvas.DrawRect(2, 2, 14, 14, &paint);
                             canvas.DrawRect(16, 2, 30, 14, &tinted);
                             canvas.DrawRect(2, 16, 14, 30, nullptr);
                             canvas.DrawCircle(22, 22, 7, &tinted);
                         }},
                        "colours");
}

} // namespace
} // namespace Moka::Testing
