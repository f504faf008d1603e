// Picture: an RGBA8, premultiplied image that is painted on, on the CPU.
// Units:   pixels, origin top left, y down; pixel (x, y) covers x ... x + 1, so its centre is at x + 0.5.
//          Colours are straight (not premultiplied), 0 ... 1. Everything is a pure function of its arguments:
//          the same picture comes out on every machine.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace Moka::Samples {

struct Color {
    float r = 0;
    float g = 0;
    float b = 0;
    float a = 1;
};

struct Spot {
    float x = 0;
    float y = 0;
};

constexpr Color FromHex(unsigned rgb, float alpha = 1) {
    return {static_cast<float>(rgb >> 16 & 0xFF) / 255, static_cast<float>(rgb >> 8 & 0xFF) / 255,
            static_cast<float>(rgb & 0xFF) / 255, alpha};
}

inline float Mix(float a, float b, float t) { return a + (b - a) * t; }
inline Color Mix(Color const& a, Color const& b, float t) {
    return {Mix(a.r, b.r, t), Mix(a.g, b.g, t), Mix(a.b, b.b, t), Mix(a.a, b.a, t)};
}
inline float Smooth(float low, float high, float value) {
    float const t = std::clamp((value - low) / (high - low), 0.0f, 1.0f);
    return t * t * (3 - 2 * t);
}

// How much of a pixel is inside a shape, by the signed distance of its centre to the edge (negative inside).
inline float Cover(float distance) { return std::clamp(0.5f - distance, 0.0f, 1.0f); }

class Picture {
public:
    Picture(int width, int height); // transparent

    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // Lays colour over what is there, as strongly as coverage says.
    void Blend(int x, int y, Color const& color, float coverage);

    // paint(x, y) returns the colour laid over the pixel, for every pixel of the block, clipped.
    template <class Paint>
    void BlendEach(int left, int top, int right, int bottom, Paint const& paint) {
        for (int y = std::max(top, 0); y < std::min(bottom, mHeight); ++y)
            for (int x = std::max(left, 0); x < std::min(right, mWidth); ++x) Blend(x, y, paint(x, y), 1);
    }

    // PNG, JPEG, WebP (lossless) or mki by the extension. False after one error line.
    bool Save(std::string const& path, int quality) const;

private:
    int mWidth;
    int mHeight;
    std::vector<unsigned char> mPixels;
};

// 0 ... 1, without any pattern to the eye.
float Hash(int x, int y, unsigned seed);
// 0 ... 1, smooth, features about one unit wide.
float Noise(float x, float y, unsigned seed);
// The sum of octaves of Noise, each twice as fine and half as strong; 0 ... 1.
float Clouds(float x, float y, int octaves, unsigned seed);

} // namespace Moka::Samples
