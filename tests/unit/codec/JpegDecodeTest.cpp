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

} // namespace
} // namespace Moka::Testing
