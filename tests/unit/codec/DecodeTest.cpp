#include "tests/unit/codec/CodecTestSupport.h"

#include <cmath>
#include <png.h>
#include <random>
#include <turbojpeg.h>
#include <utility>

namespace Moka::Testing {
namespace {

struct PngKind {
    int type;
    int depth;
    bool hasTransparency; // a tRNS chunk
    bool isInterlaced;
};

struct Pass {
    int x, y, stepX, stepY;
};
std::vector<Pass> const kWhole{{0, 0, 1, 1}};
std::vector<Pass> const kAdam7{{0, 0, 8, 8}, {4, 0, 8, 8}, {0, 4, 4, 8}, {2, 0, 4, 4},
                               {0, 2, 2, 4}, {1, 0, 2, 2}, {0, 1, 1, 2}};

// Of random samples, whatever they mean, many of them zero; the transparent colour, if any, is zero.
Bytes MakePng(PngKind const& kind, int width, int height) {
    std::mt19937 random(static_cast<unsigned>(kind.type * 100 + kind.depth));
    auto const noise = [&random](int count) {
        Bytes bytes;
        for (int i = 0; i < count; ++i) bytes += static_cast<char>(random() % 2 ? random() : 0);
        return bytes;
    };
    constexpr int kChannels[] = {1, 0, 3, 1, 2, 0, 4}; // of each type
    Bytes rows;
    for (Pass const& pass : kind.isInterlaced ? kAdam7 : kWhole) {
        int const columns = (width - pass.x + pass.stepX - 1) / pass.stepX;
        for (int y = pass.y; y < height && columns > 0; y += pass.stepY)
            rows += '\0' + noise((columns * kChannels[kind.type] * kind.depth + 7) / 8);
    }
    Bytes const header = ToBigEndian(static_cast<unsigned>(width), 4) +
                         ToBigEndian(static_cast<unsigned>(height), 4) + static_cast<char>(kind.depth) +
                         static_cast<char>(kind.type) + '\0' + '\0' + static_cast<char>(kind.isInterlaced);
    Bytes file = "\x89PNG\r\n\x1A\n" + MakePngChunk("IHDR", header);
    bool const hasPalette = kind.type == PNG_COLOR_TYPE_PALETTE;
    if (hasPalette) file += MakePngChunk("PLTE", noise(3 << kind.depth));
    if (kind.hasTransparency)
        file += MakePngChunk("tRNS",
                             hasPalette ? noise(1 << kind.depth) : Bytes(kChannels[kind.type] * 2U, '\0'));
    return file + MakePngChunk("IDAT", Deflate(rows)) + MakePngChunk("IEND", "");
}

// As libpng's simple interface reads it, which takes none of the decoder's decisions, premultiplied here.
Picture ReadSimply(Bytes const& file) {
    png_image header = {};
    header.version = PNG_IMAGE_VERSION;
    EXPECT_TRUE(png_image_begin_read_from_memory(&header, file.data(), file.size())) << header.message;
    header.format = PNG_FORMAT_RGBA;
    header.flags |= PNG_IMAGE_FLAG_16BIT_sRGB;
    Picture image(static_cast<int>(header.width), static_cast<int>(header.height));
    EXPECT_TRUE(png_image_finish_read(&header, nullptr, image.pixels.data(), 0, nullptr)) << header.message;
    for (std::size_t i = 0; i < image.pixels.size(); ++i) {
        unsigned char& value = image.pixels[i];
        if (i % 4 < 3) value = static_cast<unsigned char>(std::lround(value * image.pixels[i | 3] / 255.0));
    }
    return image;
}

void ExpectExactPixels(PngKind const& kind) {
    TempFolder const folder;
    std::string const path = folder.Path("a.png");
    // Of interlaced images of 16 bits that lack a pass, the simple interface returns some pixels twice.
    bool const isSimple = kind.depth < 16 || !kind.isInterlaced;
    for (int const side : isSimple ? std::vector<int>{2, 3, 19} : std::vector<int>{19}) {
        SCOPED_TRACE(::testing::Message()
                     << "type " << kind.type << " depth " << kind.depth << " tRNS " << kind.hasTransparency
                     << " interlaced " << kind.isInterlaced << " side " << side);
        Bytes const file = MakePng(kind, side, 21 - side);
        WriteFile(path, file);
        Picture const expected = ReadSimply(file);
        EXPECT_EQ(GetInfo(path).hasAlpha, kind.hasTransparency || (kind.type & PNG_COLOR_MASK_ALPHA) != 0);
        EXPECT_TRUE(LoadImage(path) == expected);
        EXPECT_TRUE(DecodeScaled(path, 13, 5) == Scale(expected, 13, 5));
    }
}

TEST(PngDecode, EveryColourTypeDepthAndInterlacingBecomesItsExactPixels) {
    ErrorLines const errors;
    std::pair<int, std::vector<int>> const depths[] = {{PNG_COLOR_TYPE_GRAY, {1, 2, 4, 8, 16}},
                                                       {PNG_COLOR_TYPE_PALETTE, {1, 2, 4, 8}},
                                                       {PNG_COLOR_TYPE_RGB, {8, 16}},
                                                       {PNG_COLOR_TYPE_GRAY_ALPHA, {8, 16}},
                                                       {PNG_COLOR_TYPE_RGBA, {8, 16}}};
    for (auto const& [type, ofType] : depths)
        for (int const depth : ofType)
            for (bool const hasTransparency : {false, true})
                for (bool const isInterlaced : {false, true})
                    if (!hasTransparency || !(type & PNG_COLOR_MASK_ALPHA))
                        ExpectExactPixels({type, depth, hasTransparency, isInterlaced});
}

// An application segment full of what looks like the end of an image.
Bytes MakePreviewSegment() {
    Bytes segment = "\xFF\xE1\xFF\xFC";
    while (segment.size() < 2 + 0xFFFC) segment += "\xFF\xD9";
    return segment;
}

TEST(JpegDecode, EveryColourSpaceAndCodingBecomesOpaqueRgb) {
    ErrorLines const errors;
    Picture const image = MakeGradient(83, 61, true);
    for (int subsampling : {TJSAMP_444, TJSAMP_422, TJSAMP_420, TJSAMP_440, TJSAMP_411}) {
        for (int flags : {0, TJFLAG_PROGRESSIVE}) {
            Bytes const file = MakeJpeg(image, TJPF_RGBA, subsampling, flags);
            EXPECT_LE(LargestDifference(Decode(file), image), 12) << subsampling << ' ' << flags;
        }
    }
    EXPECT_EQ(Decode(MakeJpeg(Fill(16, 16, {77, 77, 77, 77}), TJPF_GRAY, TJSAMP_GRAY)),
              Fill(16, 16, {77, 77, 77, 255}));
}

TEST(JpegDecode, FourInksMixToRgbByEitherConvention) {
    ErrorLines const errors;
    auto const isNear = [](Bytes const& file, Color const& color) {
        return LargestDifference(Decode(file), Fill(16, 16, color)) <= 4;
    };
    // With Adobe's marker the numbers are light: 255 is no ink. The library codes them as YCCK.
    Bytes const light = MakeJpeg(Fill(16, 16, {200, 100, 50, 255}), TJPF_CMYK, TJSAMP_444);
    EXPECT_TRUE(isNear(light, {200, 100, 50, 255}));
    Bytes dark = MakeJpeg(Fill(16, 16, {240, 240, 240, 128}), TJPF_CMYK, TJSAMP_420);
    EXPECT_TRUE(isNear(dark, {120, 120, 120, 255}));
    // Without it the same components (15, 128, 128, 128 in the file) are ink.
    dark.erase(dark.find("\xFF\xEE"), 16);
    EXPECT_TRUE(isNear(dark, {120, 63, 63, 255}));
}

TEST(JpegDecode, LongHeadersAreReadToTheirEndAndPreviewsDoNotCountAsIt) {
    ErrorLines errors;
    TempFolder const folder;
    Picture const image = MakeGradient(40, 30, true);
    Bytes file = MakeJpeg(image, TJPF_RGBA, TJSAMP_444);
    for (int i = 0; i < 12; ++i) file.insert(2, MakePreviewSegment());
    WriteFile(folder.Path("photo.jpg"), file);
    EXPECT_EQ(GetInfo(folder.Path("photo.jpg")).width, 40);
    EXPECT_LE(LargestDifference(LoadImage(folder.Path("photo.jpg")), image), 4);
    file.resize(file.size() - 2);
    EXPECT_TRUE(Decode(file).pixels.empty());
    EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr("truncated")));
}

} // namespace
} // namespace Moka::Testing
