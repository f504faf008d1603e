#include "moka/base/codec/Premultiply.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>

namespace Moka::detail {
namespace {

// Computes x / 255, rounded to nearest, without a division. Exact for every product of two bytes.
constexpr unsigned DivideBy255(unsigned x) { return (x + 128 + ((x + 128) >> 8)) >> 8; }

// ceil(2^24 / alpha). (n * reciprocal) >> 24 is n / alpha for every n below 2^16, and the product stays in 32
// bits because the colour is at most alpha.
constexpr std::array<std::uint32_t, 256> MakeReciprocals() {
    std::array<std::uint32_t, 256> table{};
    for (std::uint32_t alpha = 1; alpha < 256; ++alpha) table[alpha] = ((1u << 24) + alpha - 1) / alpha;
    return table;
}
constexpr std::array<std::uint32_t, 256> kReciprocals = MakeReciprocals();

unsigned char Unpremultiply(unsigned colour, unsigned alpha) {
    std::uint32_t const rounded = std::min(colour, alpha) * 255 + alpha / 2;
    return static_cast<unsigned char>((rounded * kReciprocals[alpha]) >> 24);
}

} // namespace

void PremultiplyPixels(unsigned char* pixels, std::size_t count) {
    for (unsigned char* const end = pixels + count * 4; pixels != end; pixels += 4) {
        unsigned const alpha = pixels[3];
        if (alpha == 255) continue;
        pixels[0] = static_cast<unsigned char>(DivideBy255(pixels[0] * alpha));
        pixels[1] = static_cast<unsigned char>(DivideBy255(pixels[1] * alpha));
        pixels[2] = static_cast<unsigned char>(DivideBy255(pixels[2] * alpha));
    }
}

void UnpremultiplyPixels(unsigned char const* from, unsigned char* to, std::size_t count) {
    for (unsigned char const* const end = from + count * 4; from != end; from += 4, to += 4) {
        unsigned char const alpha = from[3];
        if (alpha == 255) {
            std::memmove(to, from, 4);
            continue;
        }
        to[0] = Unpremultiply(from[0], alpha);
        to[1] = Unpremultiply(from[1], alpha);
        to[2] = Unpremultiply(from[2], alpha);
        to[3] = alpha;
    }
}

void FlattenOnWhite(unsigned char const* rgba, unsigned char* rgb, std::size_t count) {
    for (unsigned char const* const end = rgba + count * 4; rgba != end; rgba += 4, rgb += 3) {
        unsigned const white = 255u - rgba[3];
        for (int i = 0; i < 3; ++i) rgb[i] = static_cast<unsigned char>(std::min(rgba[i] + white, 255u));
    }
}

bool IsOpaque(unsigned char const* pixels, std::size_t count) {
    for (std::size_t i = 0; i < count; ++i) {
        if (pixels[i * 4 + 3] != 255) return false;
    }
    return true;
}

} // namespace Moka::detail
