#include "moka/base/codec/RowScaler.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <gtest/gtest.h>
#include <utility>

namespace Moka::Testing {
namespace {

Image Scale(Image const& source, int width, int height) {
    Image result{width, height,
                 Bytes(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4)};
    detail::RowScaler scaler({source.width, source.height}, {width, height}, result.pixels.data());
    for (int y = 0; y < source.height; ++y) scaler.Push(source.At(0, y));
    return result;
}

constexpr int kSizes[][2] = {{200, 150}, {199, 149}, {100, 75}, {101, 3},  {26, 19},  {25, 19},
                             {1, 1},     {400, 300}, {50, 300}, {400, 20}, {201, 150}};

TEST(ScaledDecode, LosslessFormatsGiveTheScalersPixels) {
    TempFolder const folder;
    Image const image = MakeTranslucentNoise(200, 150);
    for (char const* extension : {"png", "mki"}) {
        std::string const path = folder.Path(std::string("image.") + extension);
        ASSERT_TRUE(Save(image, path, 100));
        for (auto const& size : kSizes) {
            EXPECT_EQ(DecodeScaled(path, size[0], size[1]), Scale(image, size[0], size[1]))
                << extension << ' ' << size[0] << " x " << size[1];
        }
    }
}

// A scaled JPEG covers whole blocks, 152 rows here instead of 150, which shifts the far edge by a part of a
// pixel.
TEST(ScaledDecode, OtherFormatsHaveTheExactSizeAndComeClose) {
    TempFolder const folder;
    Image const image = MakeGradient(200, 150, true);
    for (auto const& [extension, tolerance] : {std::pair{"jpg", 8}, std::pair{"webp", 2}}) {
        std::string const path = folder.Path(std::string("image.") + extension);
        ASSERT_TRUE(Save(image, path, 100));
        for (auto const& size : kSizes) {
            EXPECT_LE(LargestDifference(DecodeScaled(path, size[0], size[1]), Scale(image, size[0], size[1])),
                      tolerance)
                << extension << ' ' << size[0] << " x " << size[1];
        }
    }
}

TEST(ScaledDecode, TransparentColourDoesNotBleedIntoWhatRemains) {
    // Red ink on nothing: whatever it is scaled to, it stays pure red under its alpha.
    Image ink{64, 64, Bytes(64 * 64 * 4)};
    for (std::size_t i = 0; i < ink.pixels.size(); i += 4 * 3) ink.pixels[i] = ink.pixels[i + 3] = 255;
    TempFolder const folder;
    for (char const* extension : {"png", "mki", "webp"}) {
        std::string const path = folder.Path(std::string("ink.") + extension);
        ASSERT_TRUE(Save(ink, path, 100));
        for (int side : {7, 32, 100}) {
            Image const scaled = DecodeScaled(path, side, side);
            ASSERT_EQ(scaled.width, side);
            for (std::size_t i = 0; i < scaled.pixels.size(); i += 4) {
                ASSERT_EQ(scaled.pixels[i], scaled.pixels[i + 3]) << extension << ' ' << side;
                ASSERT_EQ(scaled.pixels[i + 1], 0) << extension << ' ' << side;
            }
        }
    }
}

TEST(ScaledDecode, RefusesSizesOutsideTheLimits) {
    ErrorLines errors;
    TempFolder const folder;
    std::string const path = folder.Path("image.png");
    ASSERT_TRUE(Save(MakeOpaqueNoise(4, 4), path, 100));
    constexpr int kBad[][2] = {{0, 5}, {5, 0}, {-1, 5}, {65536, 1}, {1, 65536}, {20000, 20000}};
    for (auto const& size : kBad) {
        EXPECT_TRUE(DecodeScaled(path, size[0], size[1]).pixels.empty());
        EXPECT_EQ(errors.Take().size(), 1u) << size[0] << " x " << size[1];
    }
    EXPECT_EQ(DecodeScaled(path, 65535, 1).width, 65535);
}

} // namespace
} // namespace Moka::Testing
