#include "moka/base/String.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <algorithm>
#include <cmath>
#include <gtest/gtest.h>
#include <ostream>
#include <png.h>
#include <random>

namespace Moka::Testing {
namespace {

struct PngKind {
    int colourType;
    int depth;
    bool isInterlaced;
    bool hasTransparency; // a tRNS chunk

    friend std::ostream& operator<<(std::ostream& out, PngKind const& kind) {
        return out << "type " << kind.colourType << " depth " << kind.depth
                   << (kind.isInterlaced ? " interlaced" : "") << (kind.hasTransparency ? " tRNS" : "");
    }
};

int ChannelsOf(PngKind const& kind) {
    switch (kind.colourType) {
    case PNG_COLOR_TYPE_RGB:
        return 3;
    case PNG_COLOR_TYPE_RGBA:
        return 4;
    case PNG_COLOR_TYPE_GRAY_ALPHA:
        return 2;
    default:
        return 1;
    }
}

// A picture in the file's own numbers, from which both the file and the expected pixels are made.
struct Samples {
    PngKind kind;
    int width;
    int height;
    std::vector<int> values; // as many a pixel as there are channels
    png_color palette[256];
    png_byte paletteAlpha[256];
    int transparent[3]; // the tRNS colour

    int At(int x, int y, int channel) const {
        return values[static_cast<std::size_t>((y * width + x) * ChannelsOf(kind) + channel)];
    }
};

Samples MakeSamples(PngKind kind, int width, int height) {
    std::mt19937 random(static_cast<unsigned>(kind.colourType * 100 + kind.depth));
    Samples samples{kind, width, height, {}, {}, {}, {}};
    for (int i = 0; i < width * height * ChannelsOf(kind); ++i) {
        samples.values.push_back(static_cast<int>(random() % (1u << kind.depth)));
    }
    for (int i = 0; i < 256; ++i) {
        auto const next = [&random] { return static_cast<png_byte>(random()); };
        samples.palette[i] = {next(), next(), next()};
        samples.paletteAlpha[i] = next();
    }
    for (int c = 0; c < 3; ++c) samples.transparent[c] = samples.At(1, 1, std::min(c, ChannelsOf(kind) - 1));
    return samples;
}

// Rounded to 8 bits, which is exact for every depth but 16.
int ToByte(int value, int depth) { return static_cast<int>(std::lround(value * 255.0 / ((1 << depth) - 1))); }

Image Expect(Samples const& samples) {
    Image image{samples.width, samples.height, {}};
    PngKind const kind = samples.kind;
    int const channels = ChannelsOf(kind);
    for (int i = 0; i < samples.width * samples.height; ++i) {
        int const* const value = &samples.values[static_cast<std::size_t>(i * channels)];
        int rgba[4];
        if (kind.colourType == PNG_COLOR_TYPE_PALETTE) {
            png_color const colour = samples.palette[value[0]];
            int const entry[4] = {colour.red, colour.green, colour.blue,
                                  kind.hasTransparency ? samples.paletteAlpha[value[0]] : 255};
            std::copy_n(entry, 4, rgba);
        } else {
            bool const isGrey = channels < 3;
            bool isTransparent = kind.hasTransparency;
            for (int c = 0; c < 3; ++c) {
                rgba[c] = ToByte(value[isGrey ? 0 : c], kind.depth);
                isTransparent = isTransparent && value[isGrey ? 0 : c] == samples.transparent[c];
            }
            bool const hasAlpha = channels == 2 || channels == 4;
            rgba[3] = hasAlpha ? ToByte(value[channels - 1], kind.depth) : isTransparent ? 0 : 255;
        }
        for (int c = 0; c < 3; ++c) {
            image.pixels.push_back(static_cast<unsigned char>(std::lround(rgba[c] * rgba[3] / 255.0)));
        }
        image.pixels.push_back(static_cast<unsigned char>(rgba[3]));
    }
    return image;
}

std::vector<Bytes> PackRows(Samples const& samples) {
    int const perRow = samples.width * ChannelsOf(samples.kind);
    int const depth = samples.kind.depth;
    std::vector<Bytes> rows;
    for (int y = 0; y < samples.height; ++y) {
        Bytes row(static_cast<std::size_t>((perRow * depth + 7) / 8));
        for (int i = 0; i < perRow; ++i) {
            int const value = samples.values[static_cast<std::size_t>(y * perRow + i)];
            for (int bit = 0; bit < depth; ++bit) { // the most significant first
                int const at = i * depth + bit;
                int const one = (value >> (depth - 1 - bit)) & 1;
                row[static_cast<std::size_t>(at / 8)] |= static_cast<unsigned char>(one << (7 - at % 8));
            }
        }
        rows.push_back(row);
    }
    return rows;
}

void Append(png_structp png, png_bytep data, std::size_t count) {
    auto* const bytes = static_cast<Bytes*>(png_get_io_ptr(png));
    bytes->insert(bytes->end(), data, data + count);
}

void WriteTransparency(png_structp png, png_infop info, Samples const& samples) {
    png_color_16 colour = {};
    colour.gray = colour.red = static_cast<png_uint_16>(samples.transparent[0]);
    colour.green = static_cast<png_uint_16>(samples.transparent[1]);
    colour.blue = static_cast<png_uint_16>(samples.transparent[2]);
    if (samples.kind.colourType == PNG_COLOR_TYPE_PALETTE) {
        png_set_tRNS(png, info, samples.paletteAlpha, 1 << samples.kind.depth, nullptr);
    } else {
        png_set_tRNS(png, info, nullptr, 0, &colour);
    }
}

Bytes MakePng(Samples const& samples) {
    Bytes bytes;
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    png_set_write_fn(png, &bytes, Append, nullptr);
    PngKind const kind = samples.kind;
    png_set_IHDR(png, info, static_cast<png_uint_32>(samples.width), static_cast<png_uint_32>(samples.height),
                 kind.depth, kind.colourType, kind.isInterlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    if (kind.colourType == PNG_COLOR_TYPE_PALETTE) png_set_PLTE(png, info, samples.palette, 1 << kind.depth);
    if (kind.hasTransparency) WriteTransparency(png, info, samples);
    // Chunks that must not change a pixel.
    png_set_gAMA(png, info, 1.0);
    png_text text = {};
    char key[] = "Comment";
    std::string long_text(100000, 'x');
    text.compression = PNG_TEXT_COMPRESSION_zTXt;
    text.key = key;
    text.text = long_text.data();
    png_set_text(png, info, &text, 1);
    std::vector<Bytes> rows = PackRows(samples);
    std::vector<png_bytep> pointers;
    for (Bytes& row : rows) pointers.push_back(row.data());
    png_write_info(png, info);
    png_write_image(png, pointers.data());
    png_write_end(png, info);
    png_destroy_write_struct(&png, &info);
    return bytes;
}

std::vector<PngKind> AllKinds() {
    std::vector<PngKind> kinds;
    for (bool const isInterlaced : {false, true}) {
        for (bool const hasTransparency : {false, true}) {
            for (int depth : {1, 2, 4, 8, 16}) {
                kinds.push_back({PNG_COLOR_TYPE_GRAY, depth, isInterlaced, hasTransparency});
                if (depth < 16)
                    kinds.push_back({PNG_COLOR_TYPE_PALETTE, depth, isInterlaced, hasTransparency});
                if (depth >= 8) kinds.push_back({PNG_COLOR_TYPE_RGB, depth, isInterlaced, hasTransparency});
            }
        }
        for (int depth : {8, 16}) {
            kinds.push_back({PNG_COLOR_TYPE_GRAY_ALPHA, depth, isInterlaced, false});
            kinds.push_back({PNG_COLOR_TYPE_RGBA, depth, isInterlaced, false});
        }
    }
    return kinds;
}

TEST(PngDecode, EveryColourTypeDepthAndInterlacingBecomesItsExactPixels) {
    ErrorLines const errors;
    for (PngKind const& kind : AllKinds()) {
        for (int const side : {2, 3, 19}) {
            Samples const samples = MakeSamples(kind, side, 21 - side);
            EXPECT_EQ(Decode(MakePng(samples)), Expect(samples)) << kind << ' ' << side;
        }
    }
}

TEST(PngDecode, ScalingDoesNotDependOnInterlacing) {
    TempFolder const folder;
    Samples samples = MakeSamples({PNG_COLOR_TYPE_RGBA, 8, false, false}, 60, 50);
    WriteFile(folder.Path("plain.png"), MakePng(samples));
    samples.kind.isInterlaced = true;
    WriteFile(folder.Path("interlaced.png"), MakePng(samples));
    constexpr int kSizes[][2] = {{59, 49}, {10, 10}, {100, 20}, {61, 50}};
    for (auto const& size : kSizes) {
        Image const plain = DecodeScaled(folder.Path("plain.png"), size[0], size[1]);
        EXPECT_EQ(plain.width, size[0]);
        EXPECT_EQ(DecodeScaled(folder.Path("interlaced.png"), size[0], size[1]), plain) << size[0];
    }
}

TEST(PngDecode, ATransparentColourCountsAsAlpha) {
    TempFolder const folder;
    for (bool const hasTransparency : {false, true}) {
        WriteFile(folder.Path("a.png"),
                  MakePng(MakeSamples({PNG_COLOR_TYPE_PALETTE, 4, false, hasTransparency}, 5, 5)));
        String const text(folder.Path("a.png"));
        ImageInfo info;
        ASSERT_TRUE(BitmapFactory::GetImageInfo(&text, &info));
        EXPECT_EQ(info.hasAlpha, hasTransparency);
    }
}

} // namespace
} // namespace Moka::Testing
