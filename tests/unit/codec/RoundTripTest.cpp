#include "moka/base/Bitmap.h"
#include "moka/base/String.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <algorithm>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

TEST(RoundTrip, LosslessFormatsKeepEveryPremultipliedPixel) {
    // Every pair of colour and alpha, and shapes that leave odd rows.
    Picture everyPair(256, 256), valid(256, 256);
    for (int alpha = 0; alpha < 256; ++alpha) {
        for (int c = 0; c < 256; ++c) {
            auto const colour = static_cast<unsigned char>(c), a = static_cast<unsigned char>(alpha);
            everyPair.SetColor(c, alpha, {colour, 0, colour, a});
            valid.SetColor(c, alpha, {std::min(colour, a), 0, std::min(colour, a), a});
        }
    }
    Picture const images[] = {valid,
                              MakeTranslucentNoise(1, 1),
                              MakeTranslucentNoise(1, 97),
                              MakeTranslucentNoise(301, 1),
                              MakeOpaqueNoise(67, 45),
                              MakeGradient(640, 480, false)};
    for (Picture const& image : images) {
        for (char const* extension : {"png", "webp", "mki"}) {
            EXPECT_TRUE(Decode(Encode(image, extension)) == image)
                << extension << ' ' << image.width << " x " << image.height;
        }
    }
    // A colour above its alpha is none; it must be held down to it, not wrap around.
    for (char const* extension : {"png", "webp"})
        EXPECT_TRUE(Decode(Encode(everyPair, extension)) == valid) << extension;
    for (auto const& [color, flat] : {std::pair<Color, Color>{{10, 20, 30, 100}, {165, 175, 185, 255}},
                                      {{200, 0, 0, 100}, {255, 155, 155, 255}},
                                      {{0, 0, 0, 0}, {255, 255, 255, 255}}})
        EXPECT_LE(LargestDifference(Decode(Encode(Fill(16, 16, color), "jpg")), Fill(16, 16, flat)), 2);
}

TEST(RoundTrip, LossyFormatsComeClose) {
    for (bool const isOpaque : {true, false}) {
        Picture const image = MakeGradient(200, 120, isOpaque);
        EXPECT_LE(LargestDifference(Decode(Encode(image, "jpg", 95)), FlattenOnWhite(image)), 6);
        EXPECT_LE(LargestDifference(Decode(Encode(image, "webp", 95)), image), 12);
    }
    // From quality 90 on each pixel has a colour of its own, as thin red lines show.
    Picture lines = Fill(32, 32, {255, 255, 255, 255});
    for (int i = 0; i < 32 * 32; i += 2) lines.SetColor(i % 32, i / 32, {255, 0, 0, 255});
    EXPECT_LE(LargestDifference(Decode(Encode(lines, "jpg", 90)), lines), 32);
    EXPECT_GT(LargestDifference(Decode(Encode(lines, "jpg", 89)), lines), 64);
    // Fine structure shows that quality does something, in either codec.
    Picture const noise = MakeOpaqueNoise(64, 64);
    for (char const* extension : {"jpg", "webp"}) {
        EXPECT_LT(Encode(noise, extension, 10).size() * 2, Encode(noise, extension, 95).size()) << extension;
        EXPECT_EQ(Encode(noise, extension, -5), Encode(noise, extension, 0)) << extension;
        EXPECT_EQ(Encode(noise, extension, 1000), Encode(noise, extension, 100)) << extension;
    }
}

TEST(RoundTrip, HonoursAStrideWiderThanTheRow) {
    TempFolder const folder;
    Picture wide = MakeTranslucentNoise(42, 11);
    Bitmap bitmap;
    ASSERT_TRUE(bitmap.Construct(wide.pixels.data(), 37, 11, 42 * 4, 1, false, false));
    for (char const* name : {"a.png", "a.webp", "a.mki"}) {
        String const path(folder.Path(name));
        ASSERT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, 100));
        EXPECT_EQ(DecodeFile(folder.Path(name)), wide.Crop(0, 0, 37, 11)) << name;
    }
}

TEST(RoundTrip, ContentDecidesWhenReadingAndTheExtensionWhenWriting) {
    TempFolder const folder;
    Picture const image = MakeOpaqueNoise(9, 9);
    struct {
        char const* name;
        ImageFormat format;
    } const cases[] = {{"a.PnG", ImageFormat::Png},
                       {"a.JPG", ImageFormat::Jpeg},
                       {"b.jpeg", ImageFormat::Jpeg},
                       {"c.d.WebP", ImageFormat::Webp},
                       {"e.MKI", ImageFormat::Mki}};
    for (auto const& one : cases) {
        String const text(folder.Path(one.name));
        EXPECT_EQ(BitmapFactory::GetFormatByExtension(&text), one.format) << one.name;
        ASSERT_TRUE(SaveImage(image, folder.Path(one.name)));
        WriteBytes(folder.Path("misnamed.png"), ReadBytes(folder.Path(one.name)));
        EXPECT_EQ(GetInfo(folder.Path("misnamed.png")).format, one.format) << one.name;
        EXPECT_FALSE(DecodeFile(folder.Path("misnamed.png")).pixels.empty());
    }
    for (char const* name : {"x.gif", "png", "x.", "x.png/y", "x.pngx", ""}) {
        String const text(name);
        EXPECT_EQ(BitmapFactory::GetFormatByExtension(&text), ImageFormat::Unknown) << name;
    }
}

} // namespace
} // namespace Moka::Testing
