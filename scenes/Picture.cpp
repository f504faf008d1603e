#include "scenes/Picture.h"

#include <algorithm>
#include <cstdint>

namespace Moka::Scenes {
namespace {

// A colour with straight alpha (not premultiplied), 0 ... 255.
struct Texel {
    int r = 0;
    int g = 0;
    int b = 0;
    int a = 255;
};

int Mix(int from, int to, int part, int whole) {
    return whole <= 0 ? from : from + (to - from) * part / whole;
}
Texel Mix(Texel const& from, Texel const& to, int part, int whole) {
    return {Mix(from.r, to.r, part, whole), Mix(from.g, to.g, part, whole), Mix(from.b, to.b, part, whole),
            Mix(from.a, to.a, part, whole)};
}

// Returns a pseudo-random number for a pixel, 0 ... 255.
int Noise(int x, int y) {
    std::uint32_t n = static_cast<std::uint32_t>(x) * 374761393u + static_cast<std::uint32_t>(y) * 668265263u;
    n = (n ^ n >> 13) * 1274126177u;
    return static_cast<int>((n ^ n >> 16) & 0xFF);
}

struct Place {
    int x;
    int y;
    int width;
    int height;
};

Texel Gradient(Place const& p) {
    return {Mix(0, 255, p.x, p.width - 1), Mix(0, 255, p.y, p.height - 1), 128, 255};
}

Texel Checker(Place const& p) {
    bool const isLight = ((p.x / 8 + p.y / 8) & 1) == 0;
    return isLight ? Texel{236, 239, 244, 255} : Texel{76, 102, 140, 255};
}

// Returns the height of a mountain's edge above the lower border, in 1/1000 of the image's height: a zigzag
// line.
int Ridge(int x, int width, int period, int low, int high) {
    int const at = x * 1000 / width % period;
    int const up = std::min(at, period - at) * 2;
    return low + (high - low) * up / period;
}

Texel Photo(Place const& p) {
    int const v = p.y * 1000 / p.height;
    int const grain = Noise(p.x, p.y) / 24 - 5;
    Texel t = Mix({62, 108, 184, 255}, {250, 206, 150, 255}, v, 640);
    // The sun, in half pixels: its edge is soft over one pixel.
    int const dx = 2 * p.x + 1 - p.width * 14 / 10;
    int const dy = 2 * p.y + 1 - p.height * 6 / 10;
    int const radius = std::max(1, std::min(p.width, p.height) * 2 / 9);
    long long const inside = 1LL * radius * radius - 1LL * dx * dx - 1LL * dy * dy;
    auto const part = static_cast<int>(std::clamp(inside + 2LL * radius, 0LL, 4LL * radius));
    t = Mix(t, {255, 244, 200, 255}, part, 4 * radius);
    if (v > 1000 - Ridge(p.x + p.width / 5, p.width, 620, 380, 610)) t = {104, 112, 150, 255};
    if (v > 1000 - Ridge(p.x, p.width, 450, 270, 430)) t = {64, 88, 104, 255};
    if (v > 780) t = Mix({58, 112, 78, 255}, {30, 58, 44, 255}, v - 780, 220);
    for (int* const channel : {&t.r, &t.g, &t.b}) *channel = std::clamp(*channel + grain, 0, 255);
    return t;
}

// Adds grain of three sizes, down to single pixels.
Texel Grain(Place const& p) {
    constexpr int kWeights[] = {5, 3, 1};
    int grain = 0;
    for (int i = 0; i < 3; ++i) grain += kWeights[i] * (Noise((p.x >> i) + 97 * i, p.y >> i) - 128);
    Texel t = Photo(p);
    for (int* const channel : {&t.r, &t.g, &t.b}) *channel = std::clamp(*channel + grain / 5, 0, 255);
    return t;
}

// Bitmaps of letters, five columns and seven rows each: top row first, the highest bit is the leftmost
// column.
constexpr int kGlyphF[7] = {0b11111, 0b10000, 0b10000, 0b11110, 0b10000, 0b10000, 0b10000};
constexpr int kGlyphR[7] = {0b11110, 0b10001, 0b10001, 0b11110, 0b10100, 0b10010, 0b10001};

// Divides the image into thirteen columns (margin, F, gap, R, margin) and nine rows.
Texel Letters(Place const& p) {
    int const column = p.x * 13 / p.width - 1;
    int const row = p.y * 9 / p.height - 1;
    if (row < 0 || row > 6 || column < 0 || column > 10 || column == 5) return {0, 0, 0, 0};
    bool const isF = column < 5;
    int const bits = isF ? kGlyphF[row] : kGlyphR[row];
    if ((bits >> (4 - column % 6) & 1) == 0) return {0, 0, 0, 0};
    return isF ? Texel{28, 86, 168, 255} : Texel{206, 62, 44, 255};
}

Texel Veil(Place const& p) {
    constexpr Texel kColors[4] = {
        {214, 56, 46, 255}, {240, 178, 40, 255}, {52, 150, 84, 255}, {48, 92, 190, 255}};
    Texel t = kColors[p.y * 4 / p.height];
    t.a = Mix(0, 255, p.x, p.width - 1);
    return t;
}

// Distances are in half pixels from the centre. The edge is soft over a fifth of the radius.
Texel Disc(Place const& p) {
    int const dx = 2 * p.x + 1 - p.width;
    int const dy = 2 * p.y + 1 - p.height;
    int const radius = std::min(p.width, p.height);
    long long const inside = 1LL * radius * radius - 1LL * dx * dx - 1LL * dy * dy;
    long long const soft = std::max(1LL, 1LL * radius * radius / 5);
    return {255, 255, 255, static_cast<int>(std::clamp(inside * 255 / soft, 0LL, 255LL))};
}

struct Kind {
    char const* name;
    Texel (*texel)(Place const&);
};

constexpr Kind kKinds[] = {
    {"gradient", Gradient}, {"checker", Checker}, {"photo", Photo}, {"letters", Letters},
    {"veil", Veil},         {"disc", Disc},       {"grain", Grain},
};

unsigned char Premultiply(int channel, int alpha) {
    return static_cast<unsigned char>((channel * alpha + 127) / 255);
}

} // namespace

std::vector<std::string> const& GetPictureNames() {
    static std::vector<std::string> const kNames = [] {
        std::vector<std::string> names;
        for (Kind const& kind : kKinds) names.emplace_back(kind.name);
        return names;
    }();
    return kNames;
}

Picture MakePicture(std::size_t index, int width, int height) {
    Picture picture(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            Texel const t = kKinds[index].texel({x, y, width, height});
            unsigned char* const to = picture.At(x, y);
            to[0] = Premultiply(t.r, t.a);
            to[1] = Premultiply(t.g, t.a);
            to[2] = Premultiply(t.b, t.a);
            to[3] = static_cast<unsigned char>(t.a);
        }
    }
    return picture;
}

} // namespace Moka::Scenes
