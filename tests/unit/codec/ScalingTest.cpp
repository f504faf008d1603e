#include "moka/base/codec/RowScaler.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <random>
#include <utility>

namespace Moka::Testing {
namespace {

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

double ReferenceChannel(Picture const& source, int width, int height, int x, int y, int channel) {
    double sum = 0;
    for (int v = 0; v < source.height; ++v) {
        double const down = ReferenceWeight(source.height, height, v, y);
        for (int u = 0; down > 0 && u < source.width; ++u)
            sum += down * ReferenceWeight(source.width, width, u, x) * source.At(0, v)[u * 4 + channel];
    }
    return sum;
}

TEST(RowScaler, IsTheRoundedReferenceForEveryMixOfShrinkingAndGrowing) {
    std::mt19937 random(7);
    for (int round = 0; round < 300; ++round) {
        auto const side = [&random] { return 1 + static_cast<int>(random() % 24); };
        Picture const source = MakeTranslucentNoise(side(), side(), static_cast<unsigned>(round));
        int const width = side();
        int const height = round % 50 == 0 ? source.height : side();
        Picture const scaled = Scale(source, width, height);
        for (int i = 0; i < width * height * 4; ++i) {
            unsigned char const* const pixel = &scaled.pixels[static_cast<std::size_t>(i / 4 * 4)];
            double const exact = ReferenceChannel(source, width, height, i / 4 % width, i / 4 / width, i % 4);
            ASSERT_LE(std::abs(pixel[i % 4] - exact), 0.5 + 1e-9)
                << source.width << " x " << source.height << " to " << width << " x " << height;
            ASSERT_LE(pixel[i % 4], pixel[3]) << "a colour above its alpha";
        }
    }
}

// Formats without a scaler of their own give exactly what ours gives. A scaled JPEG covers whole blocks, 152
// rows here instead of 150, which shifts the far edge by a part of a pixel.
TEST(ScaledDecode, EveryFormatHasTheExactSizeAndTheScalersPixelsOrClose) {
    ErrorLines errors;
    TempFolder const folder;
    constexpr std::pair<int, int> kSizes[] = {{200, 150}, {100, 75}, {101, 3},   {25, 19},
                                              {1, 1},     {50, 300}, {400, 300}, {400, 20}};
    Picture const noise = MakeTranslucentNoise(200, 150);
    Picture const smooth = MakeGradient(200, 150, true);
    struct {
        char const* extension;
        Picture const& image;
        int tolerance;
    } const cases[] = {{"png", noise, 0}, {"mki", noise, 0}, {"jpg", smooth, 8}, {"webp", smooth, 2}};
    for (auto const& [extension, image, tolerance] : cases) {
        std::string const path = folder.Path(std::string("image.") + extension);
        EXPECT_TRUE(SaveImage(image, path)) << path;
        for (auto const& [width, height] : kSizes) {
            EXPECT_LE(LargestDifference(DecodeScaled(path, width, height), Scale(image, width, height)),
                      tolerance)
                << extension << ' ' << width << " x " << height;
        }
        for (auto const& [width, height] : {std::pair{0, 5}, {5, -1}, {65536, 1}, {20000, 20000}}) {
            EXPECT_TRUE(DecodeScaled(path, width, height).pixels.empty());
            EXPECT_EQ(errors.Take().size(), 1u) << width << " x " << height;
        }
    }
}

} // namespace
} // namespace Moka::Testing
