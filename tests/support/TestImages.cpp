#include "tests/support/TestImages.h"

namespace Moka::Testing {
namespace {

unsigned char ToByte(int value) { return static_cast<unsigned char>(value & 0xFF); }

template <class GetColor>
Picture Paint(int width, int height, GetColor const& getColor) {
    Picture image(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) image.SetColor(x, y, getColor(x, y));
    }
    return image;
}

} // namespace

Picture MakeGradient(int width, int height) {
    return Paint(width, height, [](int x, int y) -> Color {
        return {ToByte(x), ToByte(y), ToByte(((x >> 8) & 0xF) << 4 | ((y >> 8) & 0xF)), 255};
    });
}

Picture MakeAlphaPattern(int width, int height) {
    return Paint(width, height, [](int x, int y) -> Color {
        int const alpha = (x + 16 * y) & 0xFF;
        auto const part = [&](int channel) { return ToByte((channel & 0xFF) * alpha / 255); };
        return {part(x * 7), part(y * 5), part(x * 3 + y * 11), ToByte(alpha)};
    });
}

Picture MakeChecker(int width, int height, int cell, Color const& first, Color const& second) {
    return Paint(width, height,
                 [&](int x, int y) { return (x / cell + y / cell) % 2 == 0 ? first : second; });
}

} // namespace Moka::Testing
