#include "moka/base/codec/Premultiply.h"
#include "moka/base/codec/RowScaler.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <random>

namespace Moka::Testing {
namespace {

using detail::PixelSize;
using detail::RowScaler;

TEST(Premultiply, RoundsToNearestForEveryColourAndAlpha) {
    for (int a = 0; a < 256; ++a) {
        for (int c = 0; c < 256; ++c) {
            unsigned char pixel[4] = {static_cast<unsigned char>(c), 0, 255, static_cast<unsigned char>(a)};
            detail::PremultiplyPixels(pixel, 1);
            ASSERT_EQ(pixel[0], std::lround(c * a / 255.0)) << c << " at alpha " << a;
            ASSERT_EQ(pixel[1], 0);
            ASSERT_EQ(pixel[2], a);
            ASSERT_EQ(pixel[3], a);
        }
    }
}

TEST(Premultiply, EveryPremultipliedPixelSurvivesTheWayThroughStraightAlpha) {
    for (int a = 0; a < 256; ++a) {
        for (int c = 0; c < 256; ++c) {
            unsigned char const pixel[4] = {static_cast<unsigned char>(c), static_cast<unsigned char>(c), 0,
                                            static_cast<unsigned char>(a)};
            unsigned char straight[4];
            detail::UnpremultiplyPixels(pixel, straight, 1);
            detail::PremultiplyPixels(straight, 1);
            // A colour above its alpha is none; it must be held down to it, not wrap around.
            ASSERT_EQ(straight[0], std::min(c, a)) << c << " at alpha " << a;
            ASSERT_EQ(straight[3], a);
        }
    }
}

TEST(Premultiply, FlatteningKeepsInvalidPixelsInRange) {
    unsigned char const pixels[] = {10, 20, 30, 100, 200, 0, 0, 100, 7, 8, 9, 255, 0, 0, 0, 0};
    unsigned char flat[12];
    detail::FlattenOnWhite(pixels, flat, 4);
    unsigned char const expected[] = {165, 175, 185, 255, 155, 155, 7, 8, 9, 255, 255, 255};
    EXPECT_TRUE(std::equal(flat, flat + 12, expected));
}

// The weight of source pixel i in target pixel j along one axis, straight from the definitions.
double ReferenceWeight(int from, int to, int i, int j) {
    double const scale = static_cast<double>(from) / to;
    if (to <= from) {
        double const overlap = std::min<double>(i + 1, (j + 1) * scale) - std::max<double>(i, j * scale);
        return std::max(overlap, 0.0) / scale;
    }
    double const centre = std::clamp((j + 0.5) * scale - 0.5, 0.0, from - 1.0);
    return std::max(0.0, 1 - std::abs(centre - i));
}

std::vector<double> ReferenceScale(Image const& source, int width, int height) {
    std::vector<double> across(static_cast<std::size_t>(source.height * width) * 4);
    for (int y = 0; y < source.height; ++y) {
        for (int j = 0; j < width * 4; ++j) {
            double& sum = across[static_cast<std::size_t>(y * width * 4 + j)];
            for (int i = 0; i < source.width; ++i) {
                sum += ReferenceWeight(source.width, width, i, j / 4) * source.At(i, y)[j % 4];
            }
        }
    }
    std::vector<double> result(static_cast<std::size_t>(height * width) * 4);
    for (int k = 0; k < height; ++k) {
        for (int j = 0; j < width * 4; ++j) {
            double& sum = result[static_cast<std::size_t>(k * width * 4 + j)];
            for (int y = 0; y < source.height; ++y) {
                sum += ReferenceWeight(source.height, height, y, k) *
                       across[static_cast<std::size_t>(y * width * 4 + j)];
            }
        }
    }
    return result;
}

Image Scale(Image const& source, int width, int height) {
    Image result{width, height, Bytes(static_cast<std::size_t>(width * height) * 4)};
    RowScaler scaler({source.width, source.height}, {width, height}, result.pixels.data());
    EXPECT_TRUE(scaler.IsReady());
    for (int y = 0; y < source.height; ++y) scaler.Push(source.At(0, y));
    return result;
}

TEST(RowScaler, IsTheRoundedReferenceForEveryMixOfShrinkingAndGrowing) {
    std::mt19937 random(7);
    for (int round = 0; round < 300; ++round) {
        auto const side = [&random] { return 1 + static_cast<int>(random() % 24); };
        Image const source = MakeTranslucentNoise(side(), side(), static_cast<unsigned>(round));
        Image const scaled = Scale(source, side(), side());
        std::vector<double> const reference = ReferenceScale(source, scaled.width, scaled.height);
        for (std::size_t i = 0; i < reference.size(); ++i) {
            ASSERT_LE(std::abs(scaled.pixels[i] - reference[i]), 0.5 + 1e-9)
                << source.width << " x " << source.height << " to " << scaled.width << " x " << scaled.height;
            ASSERT_LE(scaled.pixels[i], scaled.pixels[i | 3]) << "a colour above its alpha";
        }
    }
}

TEST(RowScaler, SameSizeChangesNothing) {
    Image const source = MakeTranslucentNoise(31, 17);
    EXPECT_EQ(Scale(source, 31, 17), source);
}

TEST(RowScaler, TheLongestSidesOverflowNothing) {
    constexpr int kLong = 65535;
    Image const white{kLong, 1, Bytes(std::size_t{kLong} * 4, 255)};
    for (int width : {1, 2, kLong - 1}) {
        Image const scaled = Scale(white, width, 3);
        EXPECT_TRUE(
            std::all_of(scaled.pixels.begin(), scaled.pixels.end(), [](int byte) { return byte == 255; }));
    }
    Image const column{1, kLong, Bytes(std::size_t{kLong} * 4, 255)};
    EXPECT_EQ(Scale(column, 1, 1).pixels, Bytes(4, 255));
    Image const two{2, 2, Bytes(16, 255)};
    Image const grown = Scale(two, kLong, 3);
    EXPECT_TRUE(std::all_of(grown.pixels.begin(), grown.pixels.end(), [](int byte) { return byte == 255; }));
}

TEST(RowScaler, ShrinksWithinTheMemoryOfItsSource) {
    for (PixelSize const to :
         {PixelSize{20, 13}, PixelSize{19, 12}, PixelSize{20, 12}, PixelSize{3, 13}, PixelSize{7, 5}}) {
        Image const source = MakeTranslucentNoise(20, 13);
        Image const expected = Scale(source, to.width, to.height);
        Bytes memory = source.pixels;
        RowScaler scaler({20, 13}, to, memory.data());
        for (int y = 0; y < 13; ++y) scaler.Push(memory.data() + y * 80);
        memory.resize(expected.pixels.size());
        EXPECT_EQ(memory, expected.pixels) << to.width << " x " << to.height;
    }
}

} // namespace
} // namespace Moka::Testing
