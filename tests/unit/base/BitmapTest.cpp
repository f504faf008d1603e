#include "moka/base/Bitmap.h"

#include "tests/support/Allocation.h"

#include <gtest/gtest.h>

#include <limits>
#include <memory>
#include <vector>

namespace Moka {
namespace {

unsigned char* NewPixels(int bytes) {
    auto* const pixels = new unsigned char[static_cast<std::size_t>(bytes)];
    for (int i = 0; i < bytes; ++i) pixels[i] = static_cast<unsigned char>(i);
    return pixels;
}

TEST(BitmapTest, CopyIsOwnedAndTightAndLeavesTheSourceToTheCaller) {
    // Two rows at stride 12; the buffer ends with the last pixel, not with a whole stride.
    std::unique_ptr<unsigned char[]> const pixels(NewPixels(12 + 8));
    for (bool const deleteBuffer : {false, true}) {
        Bitmap bitmap;
        bool constructed = true;
        {
            Testing::FailAllocations const fail;
            constructed = bitmap.Construct(pixels.get(), 2, 2, 12, 1, true, deleteBuffer);
        }
        EXPECT_FALSE(constructed) << "no memory for a copy";
        ASSERT_TRUE(bitmap.Construct(pixels.get(), 2, 2, 12, 1, true, deleteBuffer));
        unsigned char const* const copy = bitmap.GetBuffer();
        ASSERT_NE(copy, pixels.get());
        EXPECT_EQ(bitmap.GetStride(), 8);
        EXPECT_TRUE(bitmap.GetDeleteBuffer());
        EXPECT_EQ(std::vector<unsigned char>(copy, copy + 16),
                  (std::vector<unsigned char>{0, 1, 2, 3, 4, 5, 6, 7, 12, 13, 14, 15, 16, 17, 18, 19}));
    }
}

TEST(BitmapTest, RefusesBadArgumentsAndStaysUsable) {
    std::unique_ptr<unsigned char[]> const pixels(NewPixels(16));
    struct Case {
        int width, height, stride, format;
    };
    int const max = std::numeric_limits<int>::max();
    Bitmap bitmap;
    EXPECT_FALSE(bitmap.Construct(nullptr, 2, 2, 8, 1, false, true));
    for (Case const& c : {Case{0, 2, 8, 1}, Case{2, 0, 8, 1}, Case{-2, 2, 8, 1}, Case{2, -2, 8, 1},
                          Case{2, 2, 7, 1}, Case{2, 2, -8, 1}, Case{2, 2, 8, 0}, Case{2, 2, 8, 2},
                          Case{1 << 30, 1, 0, 1}, Case{max, 1, max, 1}}) {
        EXPECT_FALSE(bitmap.Construct(pixels.get(), c.width, c.height, c.stride, c.format, false, true))
            << c.width << 'x' << c.height << " stride " << c.stride << " format " << c.format;
        EXPECT_EQ(bitmap.GetBuffer(), nullptr);
    }
    ASSERT_TRUE(bitmap.Construct(pixels.get(), 2, 2, 8, 1, false, false));
    EXPECT_FALSE(bitmap.Construct(pixels.get(), 1, 1, 4, 1, false, true)) << "has pixels already";
    EXPECT_EQ(bitmap.GetWidth(), 2);
    EXPECT_FALSE(bitmap.GetDeleteBuffer());
}

} // namespace
} // namespace Moka
