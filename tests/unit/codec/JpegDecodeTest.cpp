#include "tests/unit/codec/CodecTestSupport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <turbojpeg.h>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;

Bytes Repeat(int count, Bytes const& pixel) {
    Bytes pixels;
    for (int i = 0; i < count; ++i) pixels.insert(pixels.end(), pixel.begin(), pixel.end());
    return pixels;
}

// An application segment full of what looks like the end of an image.
Bytes MakePreviewSegment() {
    Bytes segment = {0xFF, 0xE1, 0xFF, 0xFD};
    while (segment.size() < 2 + 0xFFFD) segment.push_back(segment.size() % 2 == 0 ? 0xFF : 0xD9);
    return segment;
}

TEST(JpegDecode, EveryColourSpaceAndCodingBecomesOpaqueRgb) {
    ErrorLines const errors;
    Picture const image = MakeGradient(83, 61, true);
    for (int subsampling : {TJSAMP_444, TJSAMP_422, TJSAMP_420, TJSAMP_440, TJSAMP_411}) {
        for (int flags : {0, TJFLAG_PROGRESSIVE}) {
            Bytes const file = MakeJpeg(image.pixels, 83, 61, TJPF_RGBA, subsampling, flags);
            EXPECT_LE(LargestDifference(Decode(file), image), 12) << subsampling << ' ' << flags;
        }
    }
    Picture const grey = Decode(MakeJpeg(Repeat(64, {77}), 8, 8, TJPF_GRAY, TJSAMP_GRAY));
    EXPECT_EQ(grey.pixels, Repeat(64, {77, 77, 77, 255}));
}

TEST(JpegDecode, FourInksMixToRgbByEitherConvention) {
    ErrorLines const errors;
    auto const isNear = [](Bytes const& file, Color const& color) {
        return LargestDifference(Decode(file), Fill(16, 16, color)) <= 4;
    };
    // With Adobe's marker the numbers are light: 255 is no ink. The library codes them as YCCK.
    Bytes const light = MakeJpeg(Repeat(256, {200, 100, 50, 255}), 16, 16, TJPF_CMYK, TJSAMP_444);
    EXPECT_TRUE(isNear(light, {200, 100, 50, 255}));
    Bytes dark = MakeJpeg(Repeat(256, {240, 240, 240, 128}), 16, 16, TJPF_CMYK, TJSAMP_420);
    EXPECT_TRUE(isNear(dark, {120, 120, 120, 255}));
    // Without it the same components (15, 128, 128, 128 in the file) are ink.
    auto const marker = dark.begin() + static_cast<std::ptrdiff_t>(Find(dark, {0xFF, 0xEE}));
    dark.erase(marker, marker + 16);
    EXPECT_TRUE(isNear(dark, {120, 63, 63, 255}));
}

TEST(JpegDecode, LongHeadersAreReadToTheirEndAndPreviewsDoNotCountAsIt) {
    ErrorLines errors;
    TempFolder const folder;
    Picture const image = MakeGradient(40, 30, true);
    Bytes file = MakeJpeg(image.pixels, 40, 30, TJPF_RGBA, TJSAMP_444);
    for (int i = 0; i < 12; ++i) file = Insert(file, 2, MakePreviewSegment());
    WriteBytes(folder.Path("photo.jpg"), file);
    EXPECT_EQ(GetInfo(folder.Path("photo.jpg")).width, 40);
    EXPECT_LE(LargestDifference(DecodeFile(folder.Path("photo.jpg")), image), 4);
    file.resize(file.size() - 2);
    EXPECT_TRUE(Decode(file).pixels.empty());
    EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr("truncated")));
}

TEST(JpegDecode, HarmlessWarningsPassAndGuessedPixelsDoNot) {
    ErrorLines errors;
    Picture const image = MakeOpaqueNoise(64, 64);
    Bytes const good = MakeJpeg(image.pixels, 64, 64, TJPF_RGBA, TJSAMP_444);
    Picture const decoded = Decode(good);
    EXPECT_EQ(Decode(Insert(good, good.size() - 2, {0x11, 0x22, 0x33})), decoded) << "before the end";
    EXPECT_EQ(Decode(Insert(good, good.size(), Bytes(1000, 0x55))), decoded) << "behind the end";
    EXPECT_TRUE(errors.Take().empty());
    Bytes cut(good.begin(), good.end() - static_cast<std::ptrdiff_t>(good.size() * 4 / 10));
    if (cut.back() == 0xFF) cut.pop_back();
    EXPECT_TRUE(Decode(Insert(cut, cut.size(), {0xFF, 0xD9})).pixels.empty()) << "an end marker too early";
    EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr("premature end")));
}

TEST(JpegDecode, SubsamplingThatHasNoNameDecodes) {
    ErrorLines const errors;
    // Middle grey, brightness three times as wide as colour. In every block the difference is 0 and nothing
    // follows, 00 1010 in the brightness tables, which all components are made to use: 5 blocks, 4 bytes.
    Bytes file = MakeJpeg(Repeat(24 * 8, {128, 128, 128}), 24, 8, TJPF_RGB, TJSAMP_444);
    std::size_t const frame = Find(file, {0xFF, 0xC0});
    ASSERT_EQ(file[frame + 11], 0x11);
    file[frame + 11] = 0x31;
    std::size_t const scan = Find(file, {0xFF, 0xDA});
    file[scan + 6] = file[scan + 8] = file[scan + 10] = 0;
    file.resize(scan + 14);
    file = Insert(file, file.size(), {0x28, 0xA2, 0x8A, 0x2B, 0xFF, 0xD9});
    EXPECT_EQ(Decode(file).pixels, Repeat(24 * 8, {128, 128, 128, 255}));
}

} // namespace
} // namespace Moka::Testing
