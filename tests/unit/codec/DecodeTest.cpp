#include "tests/unit/codec/CodecTestSupport.h"

#include <cmath>
#include <png.h>
#include <random>
#include <turbojpeg.h>
#include <utility>

namespace Moka::Testing {
namespace {

struct PngKind {
    int colourType;
    int depth;
    bool hasTransparency = false; // a tRNS chunk
    bool isInterlaced = false;
};

std::vector<PngKind> AllKinds() {
    std::vector<PngKind> kinds;
    for (int const type : {PNG_COLOR_TYPE_GRAY, PNG_COLOR_TYPE_PALETTE, PNG_COLOR_TYPE_RGB,
                           PNG_COLOR_TYPE_GRAY_ALPHA, PNG_COLOR_TYPE_RGBA}) {
        for (int const depth : {1, 2, 4, 8, 16}) {
            bool const isSmall = depth < 8;
            if (type != PNG_COLOR_TYPE_GRAY && depth != 8 && isSmall != (type == PNG_COLOR_TYPE_PALETTE))
                continue;
            kinds.push_back({type, depth, false});
            if (!(type & PNG_COLOR_MASK_ALPHA)) kinds.push_back({type, depth, true});
        }
    }
    return kinds;
}

void Append(png_structp png, png_bytep data, std::size_t count) {
    static_cast<Bytes*>(png_get_io_ptr(png))->append(data, data + count);
}

void WritePalette(png_structp png, png_infop info, PngKind const& kind, std::mt19937& random) {
    png_color palette[256];
    png_byte alphas[256];
    auto const next = [&random] { return static_cast<png_byte>(random()); };
    for (png_color& colour : palette) colour = {next(), next(), next()};
    for (png_byte& alpha : alphas) alpha = next();
    png_set_PLTE(png, info, palette, 1 << kind.depth);
    if (kind.hasTransparency) png_set_tRNS(png, info, alphas, 1 << kind.depth, nullptr);
}

// Of random samples, whatever they mean, many of them zero; the transparent colour, if any, is zero.
Bytes MakePng(PngKind const& kind, int width, int height) {
    std::mt19937 random(static_cast<unsigned>(kind.colourType * 100 + kind.depth));
    Bytes bytes;
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    png_set_write_fn(png, &bytes, Append, nullptr);
    png_set_IHDR(png, info, static_cast<png_uint_32>(width), static_cast<png_uint_32>(height), kind.depth,
                 kind.colourType, kind.isInterlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_color_16 const zero = {};
    if (kind.colourType == PNG_COLOR_TYPE_PALETTE)
        WritePalette(png, info, kind, random);
    else if (kind.hasTransparency)
        png_set_tRNS(png, info, nullptr, 0, &zero);
    std::size_t const stride = png_get_rowbytes(png, info);
    std::vector<png_byte> pixels(static_cast<std::size_t>(height) * stride);
    for (png_byte& byte : pixels) byte = static_cast<png_byte>(random() % 2 ? random() : 0);
    std::vector<png_bytep> rows;
    for (std::size_t at = 0; at < pixels.size(); at += stride) rows.push_back(&pixels[at]);
    png_write_info(png, info);
    png_write_image(png, rows.data());
    png_write_end(png, info);
    png_destroy_write_struct(&png, &info);
    return bytes;
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

TEST(PngDecode, EveryColourTypeDepthAndInterlacingBecomesItsExactPixels) {
    ErrorLines const errors;
    TempFolder const folder;
    std::string const path = folder.Path("a.png");
    for (PngKind kind : AllKinds()) {
        for (int const side : {2, 3, 19}) {
            SCOPED_TRACE(::testing::Message() << "type " << kind.colourType << " depth " << kind.depth
                                              << " tRNS " << kind.hasTransparency << " side " << side);
            kind.isInterlaced = false;
            Picture const expected = ReadSimply(MakePng(kind, side, 21 - side));
            WriteFile(path, MakePng(kind, side, 21 - side));
            EXPECT_EQ(GetInfo(path).hasAlpha,
                      kind.hasTransparency || (kind.colourType & PNG_COLOR_MASK_ALPHA) != 0);
            EXPECT_TRUE(LoadImage(path) == expected);
            Picture const scaled = DecodeScaled(path, 13, 5);
            kind.isInterlaced = true;
            WriteFile(path, MakePng(kind, side, 21 - side));
            EXPECT_TRUE(LoadImage(path) == expected);
            EXPECT_TRUE(DecodeScaled(path, 13, 5) == scaled);
        }
    }
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
