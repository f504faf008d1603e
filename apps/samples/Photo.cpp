// Photo.cpp: hills behind hills at sunset, over a lake.
#include "apps/samples/Pictures.h"

namespace Moka::Samples {
namespace {

constexpr int kWidth = 1800;
constexpr int kHeight = 1200;
constexpr float kShore = 0.72f; // everything in units of the height
constexpr Spot kSun{0.98f, 0.53f};

struct Ridge {
    float level;  // where it stands on average
    float relief; // how high its tops rise above that
    float wave;   // tops per unit
    unsigned seed;
    unsigned color;
};
constexpr Ridge kRidges[] = {{0.60f, 0.17f, 2.2f, 11, 0xB98A9B},
                             {0.645f, 0.15f, 3.1f, 12, 0x8C6A8C},
                             {0.685f, 0.12f, 4.2f, 13, 0x5C4A74},
                             {0.715f, 0.09f, 5.6f, 14, 0x37304F}};

Color Sky(float x, float y) {
    Color const low = FromHex(0xFFD9A0);
    Color const middle = FromHex(0xF29E8E);
    Color const high = FromHex(0x3F5D94);
    Color color =
        y > 0.42f ? Mix(middle, low, Smooth(0.42f, 0.66f, y)) : Mix(high, middle, Smooth(-0.05f, 0.42f, y));
    float const streaks = Clouds(x * 1.6f + y, y * 9, 6, 3);
    float const lit = 1 - std::abs(y - 0.4f);
    color = Mix(color, FromHex(0xFFE3CF), Smooth(0.5f, 0.75f, streaks) * 0.55f * lit);
    float const away = std::hypot(x - kSun.x, y - kSun.y);
    color = Mix(color, FromHex(0xFFE9B8), 0.75f * std::exp(-away * 5));
    return Mix(color, FromHex(0xFFFBEA), Smooth(0.062f, 0.056f, away));
}

Color Land(float x, float y) {
    Color color = Sky(x, y);
    for (Ridge const& ridge : kRidges) {
        float const top = ridge.level - ridge.relief * (Clouds(x * ridge.wave, 0, 7, ridge.seed) - 0.35f);
        Color slope = Mix(FromHex(ridge.color), FromHex(0xFFC9A4), 0.35f * Smooth(0.02f, 0.16f, y - top));
        slope = Mix(slope, FromHex(0x201A30), 0.14f * Clouds(x * 60, y * 60, 4, ridge.seed + 50));
        color = Mix(color, slope, Cover((top - y) * kHeight));
    }
    return color;
}

// Mirrored, shaken by waves that grow towards the viewer, and darker.
Color Lake(float x, float y) {
    float const depth = (y - kShore) / (1 - kShore);
    float const scale = 1 / (0.02f + depth);
    float const wave = Clouds(x * 9 * std::sqrt(scale), depth * 90 / (0.35f + depth), 4, 31) - 0.5f;
    float const mirrored = kShore - (y - kShore) * 1.15f - wave * 0.09f * std::sqrt(depth);
    Color const color = Land(x + wave * 0.03f * depth, mirrored);
    float const light = 0.9f - 0.35f * depth;
    Color const dimmed{color.r * light * 0.94f, color.g * light * 0.9f, color.b * light, 1};
    float const glint = Smooth(0.60f, 0.72f, wave + 0.5f) * std::exp(-8 * std::abs(x - kSun.x));
    float const sun = Smooth(0.8f, 0.9f, color.b);
    return Mix(dimmed, FromHex(0xFFE4B5), 0.8f * std::max(glint, sun));
}

// Reeds in the foreground: thin, leaning, dark.
float Reeds(float x, float y) {
    float cover = 0;
    for (int i = 0; i < 90; ++i) {
        float const root = Hash(i, 1, 7) < 0.5f ? 0.34f * Hash(i, 2, 7) : 1.5f - 0.22f * Hash(i, 2, 7);
        float const height = 0.12f + 0.22f * Hash(i, 3, 7);
        float const up = (1.02f - y) / height;
        if (up < 0 || up > 1) continue;
        float const stem = root + (Hash(i, 4, 7) - 0.5f) * 0.12f * up * up;
        float const bud = (up - 0.87f) / 0.09f;
        bool const isCattail = std::abs(bud) < 1 && Hash(i, 5, 7) < 0.4f;
        float const head = isCattail ? 0.0042f * std::sqrt(1 - bud * bud) : 0;
        float const half = 0.0022f * (1 - up) + 0.0006f + head;
        cover = std::max(cover, Cover((std::abs(x - stem) - half) * kHeight));
    }
    return cover;
}

} // namespace

Picture PaintPhoto() {
    Picture picture(kWidth, kHeight);
    picture.BlendEach(0, 0, kWidth, kHeight, [](int column, int row) {
        float const x = (static_cast<float>(column) + 0.5f) / kHeight;
        float const y = (static_cast<float>(row) + 0.5f) / kHeight;
        Color color = y < kShore ? Land(x, y) : Lake(x, y);
        color = Mix(color, FromHex(0x15131F), Reeds(x, y));
        float const corner = std::hypot(x - 0.75f, y - 0.5f);
        float const light = 1 - 0.3f * Smooth(0.45f, 1.0f, corner);
        float const grain = (Hash(column, row, 1) + Hash(column, row, 2) - 1) * 0.035f;
        return Color{color.r * light + grain, color.g * light + grain, color.b * light + grain, 1};
    });
    return picture;
}

} // namespace Moka::Samples
