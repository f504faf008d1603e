// InkPage: a page of handwriting as the platform saves it: transparent, with dark, soft-edged strokes on lines. A
// synthetic pattern would flatter or hurt a codec.
#pragma once

#include "scenes/Picture.h"

#include <algorithm>
#include <cmath>

namespace Moka::Bench {

using Scenes::Color;
using Scenes::Picture;

// A round pen pressed down at (cx, cy); darker ink stays.
inline void PressPen(Picture& page, double cx, double cy, double radius, Color const& ink) {
    int const left = std::max(0, static_cast<int>(cx - radius - 1));
    int const right = std::min(page.width - 1, static_cast<int>(cx + radius + 1));
    int const top = std::max(0, static_cast<int>(cy - radius - 1));
    int const bottom = std::min(page.height - 1, static_cast<int>(cy + radius + 1));
    for (int y = top; y <= bottom; ++y) {
        for (int x = left; x <= right; ++x) {
            double const coverage =
                std::clamp(radius + 0.5 - std::hypot(x + 0.5 - cx, y + 0.5 - cy), 0.0, 1.0);
            int const alpha = static_cast<int>(std::lround(coverage * 255));
            if (alpha <= page.At(x, y)[3]) continue;
            auto const premultiply = [&](int channel) {
                return static_cast<unsigned char>((channel * alpha + 127) / 255);
            };
            page.SetColor(x, y,
                          {premultiply(ink[0]), premultiply(ink[1]), premultiply(ink[2]),
                           static_cast<unsigned char>(alpha)});
        }
    }
}

// One line of joined-up writing from the left margin to the right one.
inline void WriteLine(Picture& page, double baseline, double height, int number) {
    Color const ink = number % 5 == 4 ? Color{160, 20, 30, 255} : Color{20, 24, 60, 255};
    double const margin = height;
    for (double at = margin; at < page.width - margin; at += 0.5) {
        double const t = at / height * 3.0 + number * 1.7;
        bool const space = std::sin(t * 0.23 + number) > 0.85;
        if (space) continue;
        double const y = baseline - height * 0.3 * (std::sin(t * 2.1) + 0.5 * std::sin(t * 3.7 + number));
        double const x = at + height * 0.25 * std::sin(t * 4.3);
        PressPen(page, x, y, height * (0.05 + 0.02 * std::sin(t)), ink);
    }
}

inline Picture MakeInkPage(int width, int height) {
    Picture page(width, height);
    double const lineHeight = std::max(16.0, width / 24.0);
    int number = 0;
    for (double baseline = lineHeight * 1.5; baseline < height; baseline += lineHeight * 1.6) {
        WriteLine(page, baseline, lineHeight, number++);
    }
    return page;
}

} // namespace Moka::Bench
