// Sticker.cpp: a cup with a face, cut out with a white border, over a soft shadow.
#include "apps/samples/Pictures.h"

namespace Moka::Samples {
namespace {

constexpr int kSide = 640;

// Signed distances, in pixels.
float Round(Spot p, Spot centre, float halfWidth, float halfHeight, float corner) {
    float const dx = std::abs(p.x - centre.x) - halfWidth + corner;
    float const dy = std::abs(p.y - centre.y) - halfHeight + corner;
    return std::hypot(std::max(dx, 0.0f), std::max(dy, 0.0f)) + std::min(std::max(dx, dy), 0.0f) - corner;
}
float Ring(Spot p, Spot centre, float radius, float width) {
    return std::abs(std::hypot(p.x - centre.x, p.y - centre.y) - radius) - width / 2;
}
// True near the edge only.
float Oval(Spot p, Spot centre, float halfWidth, float halfHeight) {
    float const x = (p.x - centre.x) / halfWidth;
    float const y = (p.y - centre.y) / halfHeight;
    float const r = std::hypot(x, y);
    return r * (r - 1) / std::max(std::hypot(x / halfWidth, y / halfHeight), 0.0001f);
}

float Body(Spot p) { return Round(p, {290, 390}, 150 - (p.y - 390) * 0.16f, 130, 74); }
float Handle(Spot p) { return std::max(Ring(p, {430, 372}, 62, 34), -Body(p) - 12); }
float Saucer(Spot p) { return Oval(p, {300, 536}, 214, 34); }
float Steam(Spot p) {
    float nearest = 1000;
    for (float const x : {226.0f, 294.0f, 362.0f}) {
        float const shift = 18 * std::sin(p.y * 0.055f + x);
        float const along = std::clamp(p.y, 118.0f, 206.0f);
        nearest = std::min(nearest, std::hypot(p.x - x - shift, p.y - along) - 11);
    }
    return nearest;
}
// A pill for the saucer: borders and shadows ask far from the edge.
float Whole(Spot p) { return std::min({Body(p), Handle(p), Round(p, {300, 536}, 214, 34, 34), Steam(p)}); }

void Lay(Color& under, Color const& over, float coverage) {
    float const a = over.a * coverage;
    float const alpha = a + under.a * (1 - a);
    if (alpha <= 0) return;
    float const t = a / alpha;
    under = {Mix(under.r, over.r, t), Mix(under.g, over.g, t), Mix(under.b, over.b, t), alpha};
}

void LayFace(Color& color, Spot p) {
    Color const dark = FromHex(0x4A2A2E);
    for (float const x : {236.0f, 344.0f}) {
        Lay(color, dark, Cover(Oval(p, {x, 392}, 15, 19)));
        Lay(color, FromHex(0xFFFFFF), Cover(Oval(p, {x + 5, 385}, 5, 6)));
        Lay(color, FromHex(0xFF8FA3, 0.75f),
            Smooth(6, -16, Oval(p, {x + (x < 290 ? -26.0f : 26.0f), 428}, 24, 15)));
    }
    float const smile = std::max(Ring(p, {290, 412}, 27, 9), 420 - p.y);
    Lay(color, dark, Cover(smile));
}

Color Paint(Spot p) {
    float const edge = Whole(p) - 22; // the white border
    Color color{0.1f, 0.08f, 0.16f, 0};
    Lay(color, {0.1f, 0.08f, 0.16f, 0.45f}, Smooth(26, -14, Whole({p.x - 4, p.y - 16}) - 22));
    Lay(color, FromHex(0xFFFFFF), Cover(edge));
    Lay(color, Mix(FromHex(0xB9E2F5), FromHex(0xE6F6FD), Smooth(240, 110, p.y)), Cover(Steam(p)));
    Lay(color, Mix(FromHex(0xF7B267), FromHex(0xE58A4B), Smooth(60, 540, p.x)), Cover(Saucer(p)));
    Lay(color, FromHex(0xC9703A, 0.6f), Smooth(8, -8, Oval(p, {296, 524}, 120, 13)) * Cover(Saucer(p)));
    Lay(color, FromHex(0xE4574C), Cover(Handle(p)));
    Color const glaze = Mix(FromHex(0xFF7B6B), FromHex(0xD9433F), Smooth(150, 450, p.x + 0.3f * (p.y - 380)));
    Lay(color, glaze, Cover(Body(p)));
    float const rim = Oval(p, {290, 282}, 132, 27);
    Lay(color, FromHex(0xFFD9CF), Cover(rim));
    Lay(color, Mix(FromHex(0x5B3222), FromHex(0x8A5236), Smooth(180, 400, p.x)), Cover(rim + 8));
    Lay(color, FromHex(0xFFFFFF, 0.55f), Smooth(5, -9, Oval(p, {186, 380}, 13, 58)) * Cover(Body(p)));
    LayFace(color, p);
    return color;
}

} // namespace

Picture PaintSticker() {
    Picture picture(kSide, kSide);
    picture.BlendEach(0, 0, kSide, kSide, [](int x, int y) {
        return Paint({static_cast<float>(x) + 0.5f, static_cast<float>(y) + 0.5f});
    });
    return picture;
}

} // namespace Moka::Samples
