#include "scenes/NoteScene.h"

#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "scenes/Hand.h"
#include "scenes/SceneError.h"

#include <utility>

namespace Moka::Scenes {
namespace {

constexpr float kTextLeft = 176;
constexpr float kFirstLine = 153;
constexpr float kLineGap = 88;

Ink MakeInk(unsigned rgb, float width, float xHeight = 29, float slant = 0.22f, float alpha = 1) {
    auto const channel = [&](int shift) { return static_cast<float>(rgb >> shift & 0xFF) / 255 * alpha; };
    return {{channel(16), channel(8), channel(0), alpha}, width, xHeight, slant};
}

void WriteText(Hand& hand) {
    auto const line = [](float n) { return kFirstLine + kLineGap * n; };
    Ink const title = MakeInk(0xB4382F, 5.2f, 40, 0.2f);
    Ink const ink = MakeInk(0x22304F, 3.6f);
    hand.Write("coffee on sunday", kTextLeft, line(0), title);
    hand.Sketch("0 17 204 11 424 16 614 10", kTextLeft, line(0), MakeInk(0xB4382F, 3.4f));
    hand.Write("1. water up to the valve", kTextLeft, line(1), ink);
    hand.Write("2. grind it not too fine", kTextLeft, line(2), ink);
    hand.Write("3. do not press it down", kTextLeft, line(3), ink);
    hand.Write("4. low flame, no hurry", kTextLeft, line(4), ink);
    hand.Write("5. off when it sings", kTextLeft, line(5), ink);
    hand.Write("milk for ida, none for me", kTextLeft, line(6), MakeInk(0x2F6B55, 3.2f, 26, 0.26f));
}

// The lines of a coffee pot, with its middle at x = 0.
constexpr char const* kPot[] = {
    "-62 452 -74 520 -84 590 -92 650 -60 662 0 666 64 662 94 650",
    "94 650 86 590 76 520 64 452",
    "-62 452 0 460 64 452 62 436 0 444 -60 436 -62 452",
    "-60 436 -72 380 -88 318 -112 296 -84 294 -40 300 10 302 70 298 86 294",
    "86 294 80 350 70 400 62 436",
    "-84 294 -50 272 0 262 50 270 84 292",
    "-12 262 -16 246 0 238 16 246 12 262",
    "84 304 130 300 142 330 134 390 120 430",
    "83 324 116 320 122 340 116 390 106 424 120 430",
    "-24 458 -30 540 -39 662",
    "5 458 6 540 8 662",
    "32 458 40 540 52 662",
    "-27 302 -25 370 -24 440",
    "5 302 5 370 5 440",
    "36 302 34 370 32 440",
    "-66 580 -58 574 -52 582 -60 588 -66 580",
    "-110 716 0 720 114 715",
};

void SketchPot(Hand& hand, float x, float y) {
    Ink const ink = MakeInk(0x22304F, 3);
    Ink const faint = MakeInk(0x22304F, 1.7f, 29, 0.22f, 0.4f);
    for (char const* const part : kPot) {
        hand.Sketch(part, x, y, ink);
        hand.Sketch(part, x + 2, y + 1, faint); // a second, shifted line
    }
    for (int i = 0; i < 13; ++i) {
        auto const n = static_cast<float>(i);
        hand.Sketch("0 0 -14 28", x + 66 + 1.4f * n, y + 470 + 11.7f * n, faint);
        if (i < 9) hand.Sketch("0 0 -14 28", x + 52 - 0.4f * n, y + 312 + 10.2f * n, faint);
    }
    for (float const side : {-26.0f, 4.0f, 34.0f})
        hand.Sketch("-90 276 -104 250 -84 226 -100 200 -86 176", x + side, y,
                    MakeInk(0x5B6C8E, 2.8f, 29, 0, 0.7f));
    for (float const side : {-72.0f, -36.0f, 0.0f, 36.0f, 72.0f})
        hand.Sketch("-8 706 -9 694 0 676 9 694 8 706", x + side, y, MakeInk(0xE07A2F, 3));
    // An arrow from the first line of text to the valve.
    hand.Sketch("-246 282 -200 330 -152 440 -126 530 -80 578", x, y, MakeInk(0xB4382F, 3));
    hand.Sketch("-104 580 -78 580 -84 554", x, y, MakeInk(0xB4382F, 3));
}

} // namespace

void AddHandwriting(Scene& paper) {
    paper.needsGpu = paper.needsPen = true;
    paper.draw = [drawPaper = std::move(paper.draw)](IMKCanvas& canvas, SceneStage& stage) {
        if (!stage.GetQueue() || !stage.GetPen()) throw SceneError("note needs a GPU and a pen");
        drawPaper(canvas, stage);
        auto const pen = NewPenCanvas(*stage.GetQueue(), canvas.GetBitmap());
        if (!pen) throw SceneError("there is no room for a pen canvas");
        Hand hand(*stage.GetPen(), *pen);
        WriteText(hand);
        SketchPot(hand, 1010, -48);
    };
}

} // namespace Moka::Scenes
