#include "tests/unit/codec/CodecTestSupport.h"

#include "moka/base/codec/RowScaler.h"
#include <cmath>
#include <random>
#include <utility>

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
                              MakeAlphaPattern(1, 1),
                              MakeAlphaPattern(1, 97),
                              MakeAlphaPattern(301, 1),
                              MakeGradient(67, 45),
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
    Picture const fine = FlattenOnWhite(MakeAlphaPattern(64, 64));
    for (char const* extension : {"jpg", "webp"}) {
        EXPECT_LT(Encode(fine, extension, 10).size() * 2, Encode(fine, extension, 95).size()) << extension;
        EXPECT_EQ(Encode(fine, extension, -5), Encode(fine, extension, 0)) << extension;
        EXPECT_EQ(Encode(fine, extension, 1000), Encode(fine, extension, 100)) << extension;
    }
}

TEST(RoundTrip, HonoursAStrideWiderThanTheRow) {
    TempFolder const folder;
    Picture wide = MakeAlphaPattern(42, 11);
    Bitmap bitmap;
    ASSERT_TRUE(bitmap.Construct(wide.pixels.data(), 37, 11, 42 * 4, 1, false, false));
    for (char const* name : {"a.png", "a.webp", "a.mki"}) {
        String const path(folder.Path(name));
        ASSERT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, 100));
        EXPECT_EQ(LoadImage(folder.Path(name)), wide.Crop(0, 0, 37, 11)) << name;
    }
}

TEST(RoundTrip, ContentDecidesWhenReadingAndTheExtensionWhenWriting) {
    TempFolder const folder;
    Picture const image = MakeGradient(9, 9);
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
        WriteFile(folder.Path("misnamed.png"), ReadFile(folder.Path(one.name)));
        EXPECT_EQ(GetInfo(folder.Path("misnamed.png")).format, one.format) << one.name;
        EXPECT_FALSE(LoadImage(folder.Path("misnamed.png")).pixels.empty());
    }
    for (char const* name : {"x.gif", "png", "x.", "x.png/y", "x.pngx", ""}) {
        String const text(name);
        EXPECT_EQ(BitmapFactory::GetFormatByExtension(&text), ImageFormat::Unknown) << name;
    }
}

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
        Picture const source = MakeAlphaPattern(side(), side());
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
    Picture const noise = MakeAlphaPattern(200, 150);
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
