// Note.cpp: a page of a notebook: ruled paper, handwriting, a marker and a sketch.
#include "apps/samples/Ink.h"
#include "apps/samples/Pictures.h"

namespace Moka::Samples {
namespace {

constexpr int kWidth = 1280;
constexpr int kHeight = 800;
constexpr float kMargin = 26; // for the shadow
constexpr float kCorner = 22;
constexpr float kFirstLine = 156;
constexpr float kLineGap = 88;
constexpr int kLines = 7;
constexpr float kTextLeft = 176;

constexpr Color kInk = FromHex(0x22304F);

// To the edge of a rectangle with round corners.
float PageDistance(float x, float y) {
    float const dx = std::abs(x - kWidth / 2.0f) - (kWidth / 2.0f - kMargin - kCorner);
    float const dy = std::abs(y - kHeight / 2.0f) - (kHeight / 2.0f - kMargin - kCorner);
    float const outside = std::hypot(std::max(dx, 0.0f), std::max(dy, 0.0f));
    return outside + std::min(std::max(dx, dy), 0.0f) - kCorner;
}

Color Paper(float x, float y) {
    Color color = Mix(FromHex(0xFFFCF3), FromHex(0xF3EAD6), 0.5f * y / kHeight);
    float const line = std::abs(std::remainder(y - kFirstLine, kLineGap));
    bool const isRuled = y > kFirstLine - kLineGap / 2 && y < kFirstLine + kLineGap * (kLines - 0.5f);
    if (isRuled) color = Mix(color, FromHex(0x9DB8D6), 0.75f * Cover(line - 0.9f));
    return Mix(color, FromHex(0xE58C8C), 0.8f * Cover(std::abs(x - 138) - 1));
}

void PaintPage(Picture& picture) {
    picture.BlendEach(0, 0, kWidth, kHeight, [](int column, int row) {
        float const x = static_cast<float>(column) + 0.5f;
        float const y = static_cast<float>(row) + 0.5f;
        float const shadow = 0.34f * Smooth(20, -14, PageDistance(x, y - 6));
        float const page = Cover(PageDistance(x, y));
        if (page <= 0) return Color{0.08f, 0.09f, 0.13f, shadow};
        Color color = Paper(x, y);
        // Over its own shadow, so that the edge does not let light through.
        float const alpha = page + shadow * (1 - page);
        color = Mix(Color{0.08f, 0.09f, 0.13f, 1}, color, page / alpha);
        color.a = alpha;
        return color;
    });
}

void PaintHoles(Picture& picture) {
    for (int i = 0; i < 3; ++i) {
        Spot const centre{84, 160 + 240.0f * static_cast<float>(i)};
        picture.BlendEach(60, static_cast<int>(centre.y) - 24, 110, static_cast<int>(centre.y) + 26,
                          [&](int column, int row) {
                              float const dx = static_cast<float>(column) + 0.5f - centre.x;
                              float const dy = static_cast<float>(row) + 0.5f - centre.y;
                              float const away = std::hypot(dx, dy) - 15;
                              float const rim = std::hypot(dx, dy - 2) - 15;
                              Color color = Mix(FromHex(0x8B8474), FromHex(0xC4BCA9), Smooth(0, -9, rim));
                              color.a = Cover(away);
                              return color;
                          });
    }
}

void WriteText(Picture& picture) {
    auto const line = [](float n) { return kFirstLine + kLineGap * n - 3; };
    Pen const title{FromHex(0xB4382F), 5.2f, 40, 0.2f, 21};
    Pen const pen{kInk, 3.6f, 29, 0.22f, 4};
    Write(picture, "coffee on sunday", {kTextLeft, line(0)}, title);
    DrawStroke(
        picture,
        SmoothThrough(
            {{kTextLeft, line(0) + 17}, {380, line(0) + 11}, {600, line(0) + 16}, {790, line(0) + 10}}, 3.4f),
        title.color);
    DrawMarker(picture, {kTextLeft + 52, line(4) - 14}, {726, line(4) - 17}, 40, FromHex(0xFFE14D, 0.7f));
    DrawMarker(picture, {436, line(2) - 15}, {726, line(2) - 17}, 40, FromHex(0x8FE3B0, 0.62f));
    Write(picture, "1. water up to the valve", {kTextLeft, line(1)}, pen);
    Write(picture, "2. grind it not too fine", {kTextLeft, line(2)}, pen);
    Write(picture, "3. do not press it down", {kTextLeft, line(3)}, pen);
    Write(picture, "4. low flame, no hurry", {kTextLeft, line(4)}, pen);
    Write(picture, "5. off when it sings", {kTextLeft, line(5)}, pen);
    Write(picture, "milk for ida, none for me", {kTextLeft, line(6)},
          {FromHex(0x2F6B55), 3.2f, 26, 0.26f, 9});
}

void Sketch(Picture& picture, std::vector<Spot> const& points, float width) {
    // A second, thinner pass a little aside is how a hand sketches.
    std::vector<Spot> again;
    for (std::size_t i = 0; i < points.size(); ++i) {
        int const n = static_cast<int>(i);
        again.push_back(
            {points[i].x + 5 * (Hash(n, 0, 77) - 0.5f), points[i].y + 5 * (Hash(n, 1, 77) - 0.5f)});
    }
    DrawStroke(picture, SmoothThrough(points, width), kInk);
    Color faint = kInk;
    faint.a = 0.45f;
    DrawStroke(picture, SmoothThrough(again, width * 0.5f), faint);
}

void Hatch(Picture& picture, Spot from, Spot to, int count) {
    Color faint = kInk;
    faint.a = 0.38f;
    for (int i = 0; i < count; ++i) {
        float const t = static_cast<float>(i) / static_cast<float>(count);
        Spot const at{Mix(from.x, to.x, t), Mix(from.y, to.y, t)};
        DrawStroke(picture, SmoothThrough({{at.x, at.y}, {at.x - 14, at.y + 26 + 6 * Hash(i, 3, 8)}}, 1.7f),
                   faint);
    }
}

// Of the sketch, whose middle is at x = 0.
Spot OnSketch(float x, float y) { return {1010 + x, y - 48}; }

// The pot: a jug on a boiler, with a knob, a handle and steam.
void SketchPot(Picture& picture) {
    auto const p = OnSketch;
    Sketch(
        picture,
        {p(-62, 452), p(-74, 520), p(-84, 590), p(-92, 650), p(-60, 662), p(0, 666), p(64, 662), p(94, 650)},
        3.6f);
    Sketch(picture, {p(94, 650), p(86, 590), p(76, 520), p(64, 452)}, 3.6f);
    Sketch(picture, {p(-62, 452), p(0, 460), p(64, 452), p(62, 436), p(0, 444), p(-60, 436), p(-62, 452)},
           3.2f);
    Sketch(picture,
           {p(-60, 436), p(-72, 380), p(-88, 318), p(-112, 296), p(-84, 294), p(-40, 300), p(10, 302),
            p(70, 298), p(86, 294)},
           3.6f);
    Sketch(picture, {p(86, 294), p(80, 350), p(70, 400), p(62, 436)}, 3.6f);
    Sketch(picture, {p(-84, 294), p(-50, 272), p(0, 262), p(50, 270), p(84, 292)}, 3.4f);
    Sketch(picture, {p(-12, 262), p(-16, 246), p(0, 238), p(16, 246), p(12, 262)}, 3.4f);
    Sketch(picture, {p(84, 304), p(130, 300), p(142, 330), p(134, 390), p(120, 430)}, 4.2f);
    Sketch(picture, {p(83, 324), p(116, 320), p(122, 340), p(116, 390), p(106, 424), p(120, 430)}, 3.2f);
    for (float const edge : {-30.0f, 6.0f, 40.0f}) {
        Sketch(picture, {p(edge * 0.8f, 458), p(edge, 540), p(edge * 1.3f, 662)}, 2.2f);
        Sketch(picture, {p(edge * 0.9f, 302), p(edge * 0.85f, 370), p(edge * 0.8f, 440)}, 2.2f);
    }
    Hatch(picture, p(52, 312), p(48, 404), 9);
    Hatch(picture, p(66, 470), p(84, 622), 13);
    DrawStroke(picture, SmoothThrough({p(-66, 580), p(-58, 574), p(-52, 582), p(-60, 588), p(-66, 580)}, 3),
               kInk);
    Color steam = FromHex(0x5B6C8E, 0.7f);
    for (float const side : {-26.0f, 4.0f, 34.0f})
        DrawStroke(picture,
                   SmoothThrough({p(side - 90, 276), p(side - 104, 250), p(side - 84, 226),
                                  p(side - 100, 200), p(side - 86, 176)},
                                 2.8f),
                   steam);
}

void SketchFlame(Picture& picture) {
    auto const p = OnSketch;
    for (int i = -2; i <= 2; ++i) {
        float const x = 36.0f * static_cast<float>(i);
        DrawStroke(picture,
                   SmoothThrough({p(x - 8, 706), p(x - 9, 694), p(x, 676), p(x + 9, 694), p(x + 8, 706)}, 3),
                   FromHex(0xE07A2F));
    }
    DrawStroke(picture, SmoothThrough({p(-110, 716), p(0, 720), p(114, 715)}, 4), kInk);
}

// From the first line to the valve it speaks of.
void SketchArrow(Picture& picture) {
    auto const p = OnSketch;
    Color const color = FromHex(0xB4382F);
    DrawStroke(picture,
               SmoothThrough({p(-246, 282), p(-200, 330), p(-152, 440), p(-126, 530), p(-80, 578)}, 3),
               color);
    DrawStroke(picture, SmoothThrough({p(-104, 580), p(-78, 580), p(-84, 554)}, 3), color);
}

} // namespace

Picture PaintNote() {
    Picture picture(kWidth, kHeight);
    PaintPage(picture);
    PaintHoles(picture);
    WriteText(picture);
    SketchPot(picture);
    SketchFlame(picture);
    SketchArrow(picture);
    return picture;
}

} // namespace Moka::Samples
