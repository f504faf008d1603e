#include "tests/unit/codec/CodecTestSupport.h"

#include "moka/base/codec/RowScaler.h"
#include "moka/base/log/AndroidLog.h"

#include <cmath>
#include <memory>
#include <random>
#include <turbojpeg.h>

namespace Moka::Testing {
namespace {

Picture FromBitmap(Bitmap* bitmap) {
    std::unique_ptr<Bitmap> const owner(bitmap);
    if (!bitmap) return {};
    EXPECT_EQ(bitmap->GetStride(), bitmap->GetWidth() * 4);
    EXPECT_TRUE(bitmap->GetDeleteBuffer());
    Picture image(bitmap->GetWidth(), bitmap->GetHeight());
    std::copy_n(bitmap->GetBuffer(), image.pixels.size(), image.pixels.begin());
    return image;
}

} // namespace

Picture Fill(int width, int height, Color const& color) {
    Picture image(width, height);
    for (std::size_t i = 0; i < image.pixels.size(); ++i) image.pixels[i] = color[i % 4];
    return image;
}

Picture MakeTranslucentNoise(int width, int height, unsigned seed) {
    std::mt19937 random(seed);
    Picture image(width, height);
    for (std::size_t i = 0; i < image.pixels.size(); i += 4) {
        unsigned const alpha = random() % 256;
        for (std::size_t c = 0; c < 3; ++c)
            image.pixels[i + c] = static_cast<unsigned char>(random() % (alpha + 1));
        image.pixels[i + 3] = static_cast<unsigned char>(alpha);
    }
    return image;
}

Picture MakeOpaqueNoise(int width, int height) {
    return FlattenOnWhite(MakeTranslucentNoise(width, height, 1));
}

Picture MakeGradient(int width, int height, bool isOpaque) {
    Picture image(width, height);
    std::size_t i = 0;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            double const u = (x + 0.5) / width;
            double const v = (y + 0.5) / height;
            double const alpha = isOpaque ? 1 : 0.5 + 0.5 * std::sin(3 * u + 2 * v);
            double const colours[4] = {u, v, 0.5 + 0.5 * std::sin(4 * (u + v)), 1};
            for (double colour : colours)
                image.pixels[i++] = static_cast<unsigned char>(255 * colour * alpha);
        }
    }
    return image;
}

Picture FlattenOnWhite(Picture image) {
    for (std::size_t i = 0; i < image.pixels.size(); i += 4) {
        int const white = 255 - image.pixels[i + 3];
        for (std::size_t c = 0; c < 4; ++c)
            image.pixels[i + c] = static_cast<unsigned char>(image.pixels[i + c] + white);
    }
    return image;
}

Picture Scale(Picture const& source, int width, int height) {
    Picture result(width, height);
    detail::RowScaler scaler({source.width, source.height}, {width, height}, result.pixels.data());
    EXPECT_TRUE(scaler.IsReady());
    for (int y = 0; y < source.height; ++y) scaler.Push(source.At(0, y));
    return result;
}

int LargestDifference(Picture const& a, Picture const& b) {
    return a.pixels.empty() ? 256 : CompareImages(a, b).largest;
}

void WriteBytes(std::string const& path, Bytes const& bytes) {
    WriteFile(path, std::string(bytes.begin(), bytes.end()));
}

Bytes ReadBytes(std::string const& path) {
    std::string const content = ReadFile(path);
    return Bytes(content.begin(), content.end());
}

ErrorLines::~ErrorLines() { EXPECT_THAT(Take(), ::testing::IsEmpty()); }

std::vector<std::string> ErrorLines::Take() {
    std::vector<std::string> lines;
    for (LogLine const& line : GetLines()) {
        EXPECT_EQ(line.priority, ANDROID_LOG_ERROR) << line.text;
        EXPECT_EQ(line.tag, "mok_log") << line.text;
        lines.push_back(line.text);
    }
    Clear();
    return lines;
}

Picture Decode(Bytes const& file, char const* name) {
    return FromBitmap(BitmapFactory::CreateBitmapFromMemory(file.data(), file.size(), name));
}

Picture DecodeFile(std::string const& path) {
    String const text(path);
    return FromBitmap(BitmapFactory::CreateBitmapForGraphics(&text));
}

Picture DecodeScaled(std::string const& path, int width, int height) {
    String const text(path);
    return FromBitmap(BitmapFactory::CreateBitmap(&text, width, height));
}

ImageInfo GetInfo(std::string const& path) {
    String const text(path);
    ImageInfo info;
    EXPECT_TRUE(BitmapFactory::GetImageInfo(&text, &info)) << path;
    return info;
}

Bytes MakeJpeg(Bytes const& pixels, int width, int height, int format, int subsampling, int flags) {
    tjhandle const handle = tjInitCompress();
    unsigned char* encoded = nullptr;
    unsigned long size = 0;
    EXPECT_EQ(tjCompress2(handle, pixels.data(), width, 0, height, format, &encoded, &size, subsampling, 100,
                          flags),
              0);
    Bytes bytes(encoded, encoded + size);
    tjFree(encoded);
    tjDestroy(handle);
    return bytes;
}

Bytes Encode(Picture const& image, std::string const& extension, int quality) {
    TempFolder const folder;
    std::string const path = folder.Path("image." + extension);
    EXPECT_TRUE(SaveImage(image, path, quality));
    return ReadBytes(path);
}

Bytes MakePlainJpeg(Bytes const& pixel, int format, int subsampling) {
    Bytes pixels;
    for (int i = 0; i < 256; ++i) pixels = std::move(pixels) + pixel;
    return MakeJpeg(pixels, 16, 16, format, subsampling);
}

Bytes ToLittleEndian(std::uint64_t value, int count) {
    Bytes bytes;
    for (int i = 0; i < count; ++i) bytes.push_back(static_cast<unsigned char>(value >> (8 * i)));
    return bytes;
}

Bytes ToBigEndian(std::uint64_t value, int count) {
    Bytes const bytes = ToLittleEndian(value, count);
    return Bytes(bytes.rbegin(), bytes.rend());
}

Bytes operator+(Bytes bytes, Bytes const& more) {
    bytes.insert(bytes.end(), more.begin(), more.end());
    return bytes;
}

Bytes Replace(Bytes bytes, std::size_t at, Bytes const& with) {
    std::copy(with.begin(), with.end(), bytes.begin() + static_cast<std::ptrdiff_t>(at));
    return bytes;
}

Bytes Insert(Bytes bytes, std::size_t at, Bytes const& what) {
    bytes.insert(bytes.begin() + static_cast<std::ptrdiff_t>(at), what.begin(), what.end());
    return bytes;
}

std::size_t Find(Bytes const& bytes, Bytes const& what) {
    auto const found = std::search(bytes.begin(), bytes.end(), what.begin(), what.end());
    EXPECT_NE(found, bytes.end());
    return static_cast<std::size_t>(found - bytes.begin());
}

} // namespace Moka::Testing
