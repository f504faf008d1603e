#include "scenes/Hand.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <sstream>

namespace Moka::Scenes {
namespace {

constexpr float kStep = 1.5f; // pixels between the points of a smooth line
constexpr float kTip = 4;     // the number of points over which the ends of a long stroke become thin

// Paths are pairs of numbers in hundredths of a small letter's height: x from the beginning of the letter, y
// up from the baseline.
struct Letter {
    char character;
    float advance;
    char const* body;   // joined to the neighbouring letters
    char const* accent; // dots and bars, drawn after the word
};

// clang-format off
constexpr Letter kLetters[] = {
    {'a', 105, "78 82 45 100 10 65 12 20 40 0 70 40 80 95 78 30 92 2", ""},
    {'b', 90, "10 40 40 130 47 185 34 198 22 150 18 50 30 2 62 15 70 60 52 92 62 75 85 78", ""},
    {'c', 80, "72 80 45 100 12 65 14 20 42 0 70 12", ""},
    {'d', 105, "72 82 42 100 8 65 12 20 40 0 70 40 86 140 90 195 82 100 78 30 94 2", ""},
    {'e', 78, "12 35 45 50 66 80 45 100 17 70 20 20 48 0 70 12", ""},
    {'f', 72, "12 30 45 110 60 180 46 200 33 150 28 40 22 -60 30 -92 44 -50 40 5 62 20", ""},
    {'g', 100, "78 82 45 100 10 65 12 20 40 2 70 45 80 95 76 10 66 -70 36 -98 18 -70 50 -25 90 10", ""},
    {'h', 102, "10 40 40 130 48 185 35 198 24 150 16 60 12 2 24 60 52 98 72 80 70 30 88 2", ""},
    {'i', 52, "10 40 26 98 24 40 40 2", "28 155 40 143"},
    {'k', 100, "10 40 40 130 48 185 35 198 24 150 16 60 12 2 22 50 50 98 64 80 26 50 50 30 82 2", ""},
    {'l', 55, "10 40 42 130 50 185 37 198 25 150 22 40 40 2", ""},
    {'m', 140, "8 60 20 98 18 40 15 2 26 65 48 98 60 70 57 2 68 65 90 98 104 70 103 25 120 2", ""},
    {'n', 100, "8 60 20 98 18 40 15 2 28 65 52 98 68 70 66 25 84 2", ""},
    {'o', 92, "62 88 40 100 10 65 12 20 40 0 68 30 66 75 50 95 62 78 86 80", ""},
    {'p', 95, "10 40 26 98 20 10 12 -95 20 10 32 75 55 100 76 70 70 20 42 2 80 6", ""},
    {'r', 82, "8 40 24 106 36 90 56 88 52 40 66 2", ""},
    {'s', 72, "8 30 36 100 44 70 56 30 34 0 16 10 50 6", ""},
    {'t', 66, "10 40 34 110 38 160 32 80 34 20 50 2", "8 116 40 120 70 124"},
    {'u', 100, "10 60 22 98 18 30 38 0 64 30 76 95 73 30 88 2", ""},
    {'v', 86, "6 70 18 96 28 40 40 2 60 50 62 95 80 84", ""},
    {'w', 120, "6 70 16 96 18 30 35 0 54 35 60 90 60 30 80 0 98 40 98 95 115 84", ""},
    {'y', 100, "10 60 22 98 18 35 38 5 64 35 76 95 73 10 64 -70 36 -98 18 -70 50 -25 90 10", ""},
    {',', 40, "", "14 6 18 -2 8 -30"},
    {'.', 40, "", "9 10 21 -2"},
    {'0', 95, "", "45 170 12 120 14 30 42 0 72 50 70 130 42 170"},
    {'1', 70, "", "12 120 40 170 36 100 34 0"},
    {'2', 95, "", "14 135 42 170 68 135 50 75 12 5 42 10 78 4"},
    {'3', 95, "", "16 150 45 170 64 135 36 95 68 60 55 8 12 15"},
    {'4', 95, "", "45 170 14 70 40 62 78 66 60 110 54 50 50 -5"},
    {'5', 95, "", "72 166 30 162 20 100 55 98 70 50 48 4 12 12"},
    {'6', 95, "", "60 166 24 110 14 40 42 0 68 40 45 80 18 50"},
    {'7', 90, "", "12 160 40 164 74 162 50 90 30 0"},
    {'8', 95, "", "60 145 40 170 20 135 60 70 62 20 36 0 16 35 50 100 62 140"},
    {'9', 95, "", "68 140 40 170 16 130 40 95 68 140 60 60 44 0"},
};
// clang-format on

// Returns null for an unknown character.
Letter const* FindLetter(char character) {
    auto const found =
        std::find_if(std::begin(kLetters), std::end(kLetters),
                     [character](Letter const& letter) { return letter.character == character; });
    return found == std::end(kLetters) ? nullptr : found;
}

// A Catmull-Rom spline: a cubic from b to c whose directions depend on the neighbours a and d.
float Spline(float a, float b, float c, float d, float t) {
    return b + 0.5f * t * (c - a + t * (2 * a - 5 * b + 4 * c - d + t * (3 * (b - c) + d - a)));
}

Path SmoothThrough(Path const& points) {
    Path line;
    for (std::size_t i = 0; i + 1 < points.size(); ++i) {
        InkPoint const& a = points[i > 0 ? i - 1 : 0];
        InkPoint const& b = points[i];
        InkPoint const& c = points[i + 1];
        InkPoint const& d = points[std::min(i + 2, points.size() - 1)];
        int const steps = std::max(1, static_cast<int>(std::hypot(c.x - b.x, c.y - b.y) / kStep));
        for (int s = 0; s < steps; ++s) {
            float const t = static_cast<float>(s) / static_cast<float>(steps);
            line.push_back({Spline(a.x, b.x, c.x, d.x, t), Spline(a.y, b.y, c.y, d.y, t), b.radius});
        }
    }
    if (!points.empty()) line.push_back(points.back());
    return line;
}

// Down strokes press harder than up strokes, and both ends are thin.
void Press(Path& line) {
    float press = 1;
    bool const isDot = static_cast<float>(line.size()) < 2 * kTip;
    for (std::size_t i = 0; i < line.size(); ++i) {
        InkPoint const& next = line[std::min(i + 1, line.size() - 1)];
        float const dx = next.x - line[i].x;
        float const dy = next.y - line[i].y;
        float const wanted = 1 + 0.3f * dy / std::max(std::hypot(dx, dy), 0.001f);
        press += (wanted - press) * 0.25f;
        float const fromEnd = static_cast<float>(std::min(i, line.size() - 1 - i));
        line[i].radius *= press * (isDot ? 1 : 0.6f + 0.4f * std::min(1.0f, fromEnd / kTip));
    }
}

Path ReadPath(char const* text, float scale) {
    Path path;
    std::istringstream numbers(text);
    for (InkPoint p{}; numbers >> p.x >> p.y;) path.push_back({p.x * scale, p.y * scale, 0});
    return path;
}

// Returns a pseudo-random number, -0.5 ... 0.5.
float Shake(unsigned& seed) {
    seed = seed * 1664525 + 1013904223;
    return static_cast<float>(seed >> 8) / static_cast<float>(1 << 24) - 0.5f;
}

// True for letters that begin at the top right. A stroke from the letter before would cross them, so they are
// not joined.
bool IsRound(char character) { return std::string("acdgo").find(character) != std::string::npos; }

} // namespace

void Hand::Trace(Path const& path, Ink const& ink) {
    Path line = SmoothThrough(path);
    for (InkPoint& point : line) point.radius = ink.width / 2;
    Press(line);
    mPen.DrawStroke(mCanvas, line, ink.color);
}

void Hand::Write(std::string const& text, float x, float y, Ink const& ink) {
    Path joined;
    std::vector<Path> accents;
    auto const lift = [&] {
        Trace(joined, ink);
        joined.clear();
    };
    for (char const character : text + ' ') {
        Letter const* const letter = FindLetter(character);
        if (!letter || IsRound(character)) lift();
        if (!letter) {
            for (Path const& accent : accents) Trace(accent, ink);
            accents.clear();
            x += 0.75f * ink.xHeight;
            continue;
        }
        float const size = (1 + 0.1f * Shake(mSeed)) * ink.xHeight;
        float const up = 0.07f * Shake(mSeed) * ink.xHeight;
        auto const place = [&](char const* points) {
            Path path = ReadPath(points, 0.01f * size);
            for (InkPoint& p : path) p = {x + p.x + p.y * ink.slant, y - p.y - up, 0};
            return path;
        };
        Path const body = place(letter->body);
        joined.insert(joined.end(), body.begin(), body.end());
        accents.push_back(place(letter->accent));
        x += 0.01f * letter->advance * ink.xHeight;
    }
}

void Hand::Sketch(char const* points, float x, float y, Ink const& ink) {
    Path path = ReadPath(points, 1);
    for (InkPoint& p : path) p = {p.x + x, p.y + y, 0};
    Trace(path, ink);
}

} // namespace Moka::Scenes
