// Scroll.cpp: a roll of paper that goes on and on, with a braid of coloured ribbons and its length written
// beside it every 1000 pixels, so that a strip in the wrong place is seen at once.
#include "apps/samples/Ink.h"
#include "apps/samples/Pictures.h"

namespace Moka::Samples {
namespace {

constexpr int kWidth = 512;
constexpr int kHeight = 20000;
constexpr float kLineGap = 50;
constexpr int kMarkGap = 1000;

struct Ribbon {
    float phase;
    float wave; // pixels from one bend to the next
    float reach;
    unsigned color;
};
constexpr Ribbon kRibbons[] = {{0.0f, 900, 96, 0xE4574C},
                               {2.1f, 1250, 80, 0xF2B134},
                               {4.2f, 1010, 104, 0x2E9C8F},
                               {1.0f, 1560, 66, 0x3D6FB6}};

Color Paper(int, int y) {
    float const down = static_cast<float>(y) / kHeight;
    Color const color = Mix(FromHex(0xFFF9EC), FromHex(0xE6EEF7), down);
    float const line = std::abs(std::remainder(static_cast<float>(y) + 0.5f, kLineGap));
    return Mix(color, FromHex(0x9DB8D6), 0.5f * Cover(line - 0.8f));
}

Stroke Bend(Ribbon const& ribbon) {
    Stroke stroke;
    for (int y = -40; y <= kHeight + 40; y += 4) {
        float const t = static_cast<float>(y);
        float const swing = std::sin(t * 6.2832f / ribbon.wave + ribbon.phase);
        float const drift = 30 * std::sin(t * 6.2832f / 6100 + ribbon.phase * 2);
        stroke.push_back(
            {{330 + ribbon.reach * swing + drift, t}, 11 + 6 * std::cos(t * 0.011f + ribbon.phase)});
    }
    return stroke;
}

void WriteMarks(Picture& picture) {
    for (int y = kMarkGap; y < kHeight; y += kMarkGap) {
        Pen const pen{FromHex(0x22304F), 3.4f, 26, 0.2f, static_cast<unsigned>(y)};
        float const baseline = static_cast<float>(y) - 3;
        float const end = Write(picture, std::to_string(y), {40, baseline}, pen);
        DrawStroke(picture, SmoothThrough({{34, baseline + 12}, {end + 10, baseline + 10}}, 2.4f),
                   FromHex(0xB4382F));
    }
}

} // namespace

Picture PaintScroll() {
    Picture picture(kWidth, kHeight);
    picture.BlendEach(0, 0, kWidth, kHeight, Paper);
    for (Ribbon const& ribbon : kRibbons) {
        Stroke shadow = Bend(ribbon);
        for (InkPoint& point : shadow) point = {{point.at.x + 4, point.at.y + 5}, point.width + 2};
        DrawStroke(picture, shadow, {0, 0, 0.1f, 0.16f});
        DrawStroke(picture, Bend(ribbon), FromHex(ribbon.color, 0.92f));
    }
    WriteMarks(picture);
    Write(picture, "the top", {60, 97}, {FromHex(0x2F6B55), 4, 30, 0.2f, 3});
    Write(picture, "the end", {60, kHeight - 53.0f}, {FromHex(0x2F6B55), 4, 30, 0.2f, 4});
    return picture;
}

} // namespace Moka::Samples
