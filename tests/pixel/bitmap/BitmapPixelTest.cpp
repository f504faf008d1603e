// Bitmaps on a real driver: what goes up comes back, over strips, and nothing stays behind.
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "tests/pixel/RenderThreadFixture.h"
#include "tests/support/ImageCompare.h"

#include <cstring>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
constexpr int kMaxSide = 64;

class PixelBitmap : public RenderThreadFixture {
protected:
    PixelBitmap() : RenderThreadFixture(kMaxSide) {}

    static Picture Read(BitmapPtr const& bitmap, Rect const& r) {
        Picture image(r.GetWidth(), r.GetHeight());
        bitmap->GetBitmapData(r, image.pixels.data());
        return image;
    }
    static Picture Read(BitmapPtr const& bitmap) { return Read(bitmap, bitmap->GetBitmapRect()); }

    static void ExpectSame(Picture const& a, Picture const& b) {
        ImageDifference const difference = CompareImages(a, b);
        EXPECT_EQ(difference.differingPixels, 0) << difference;
    }
};

TEST_F(PixelBitmap, RoundTripsEveryStripCountBitForBit) {
    for (int height : {1, kMaxSide - 1, kMaxSide, kMaxSide + 1, 3 * kMaxSide, 5 * kMaxSide + 17})
        for (int width : {1, 3, kMaxSide})
            for (Picture const& image : {MakeGradient(width, height), MakeAlphaPattern(width, height)}) {
                auto const bitmap = Create(image);
                EXPECT_EQ(bitmap->GetTextureBitmap()->GetSubBitmapCount(),
                          (height + kMaxSide - 1) / kMaxSide);
                ExpectSame(Read(bitmap), image);
            }
}

TEST_F(PixelBitmap, ReadsBlocksOverStripEdgesAndPartlyOutsideAndReplacesABlockOfAWiderImage) {
    Picture const image = MakeGradient(40, 2 * kMaxSide + 20);
    auto const bitmap = Create(image);
    ExpectSame(Read(bitmap, Rect(3, kMaxSide - 5, 31, 2 * kMaxSide + 7)),
               image.Crop(3, kMaxSide - 5, 28, kMaxSide + 12));
    Rect const over(-2, 2 * kMaxSide, 44, 2 * kMaxSide + 30);
    Picture block = MakeChecker(over.GetWidth(), over.GetHeight(), 1, {9, 9, 9, 9}, {7, 7, 7, 7});
    Picture expected = block;
    bitmap->GetBitmapData(over, block.pixels.data());
    for (int y = 0; y < 20; ++y)
        for (int x = 0; x < 40; ++x) expected.SetColor(x + 2, y, image.GetColor(x, 2 * kMaxSide + y));
    ExpectSame(block, expected);

    Picture const wide = MakeAlphaPattern(30, 20);
    bitmap->GetTextureBitmap()->UpdateBitmap(Rect(5, 2, 15, 9), wide.pixels.data(), wide.GetStride());
    ExpectSame(Read(bitmap, Rect(5, 2, 15, 9)), wide.Crop(0, 0, 10, 7));
}

} // namespace
} // namespace Moka::Testing
