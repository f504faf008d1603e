#include "moka/base/codec/Premultiply.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

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

} // namespace
} // namespace Moka::Testing
