#include "apps/samples/Picture.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

namespace Moka::Samples {

Picture::Picture(int width, int height)
    : mWidth(width),
      mHeight(height),
      mPixels(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4) {}

void Picture::Blend(int x, int y, Color const& color, float coverage) {
    float const alpha = std::clamp(color.a * coverage, 0.0f, 1.0f);
    if (alpha <= 0 || x < 0 || y < 0 || x >= mWidth || y >= mHeight) return;
    unsigned char* const pixel = &mPixels[(static_cast<std::size_t>(y) * static_cast<std::size_t>(mWidth) +
                                           static_cast<std::size_t>(x)) *
                                          4];
    float const source[4] = {color.r, color.g, color.b, 1};
    for (int i = 0; i < 4; ++i) {
        float const value =
            std::clamp(source[i], 0.0f, 1.0f) * alpha * 255 + static_cast<float>(pixel[i]) * (1 - alpha);
        pixel[i] = static_cast<unsigned char>(std::lround(value));
    }
    // Each channel is rounded by itself, so one may come out above alpha by a hair.
    for (int i = 0; i < 3; ++i) pixel[i] = std::min(pixel[i], pixel[3]);
}

bool Picture::Save(std::string const& path, int quality) const {
    Bitmap bitmap;
    // The bitmap only looks at the buffer; its interface has no const.
    bitmap.Construct(const_cast<unsigned char*>(mPixels.data()), mWidth, mHeight, mWidth * 4,
                     Bitmap::kFormatRgba8888, false, false);
    String const text(path);
    return BitmapFactory::SaveBitmap(&bitmap, &text, quality);
}

float Hash(int x, int y, unsigned seed) {
    std::uint32_t h = static_cast<std::uint32_t>(x) * 0x9E3779B1u ^
                      static_cast<std::uint32_t>(y) * 0x85EBCA77u ^ seed * 0xC2B2AE3Du;
    h = (h ^ h >> 15) * 0x2C1B3C6Du;
    h = (h ^ h >> 12) * 0x297A2D39u;
    return static_cast<float>((h ^ h >> 15) >> 8) / static_cast<float>(1 << 24);
}

float Noise(float x, float y, unsigned seed) {
    float const left = std::floor(x);
    float const top = std::floor(y);
    int const column = static_cast<int>(left);
    int const row = static_cast<int>(top);
    float const u = Smooth(0, 1, x - left);
    float const v = Smooth(0, 1, y - top);
    return Mix(Mix(Hash(column, row, seed), Hash(column + 1, row, seed), u),
               Mix(Hash(column, row + 1, seed), Hash(column + 1, row + 1, seed), u), v);
}

float Clouds(float x, float y, int octaves, unsigned seed) {
    float sum = 0;
    float total = 0;
    float strength = 1;
    for (int i = 0; i < octaves; ++i, strength /= 2, x *= 2, y *= 2) {
        sum += strength * Noise(x, y, seed + static_cast<unsigned>(i));
        total += strength;
    }
    return sum / total;
}

} // namespace Moka::Samples
