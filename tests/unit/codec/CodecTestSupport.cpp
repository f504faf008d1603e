#include "tests/unit/codec/CodecTestSupport.h"

#include "moka/base/Bitmap.h"
#include "moka/base/String.h"
#include "moka/base/codec/RowScaler.h"
#include "moka/base/log/AndroidLog.h"

#include <algorithm>
#include <cmath>
#include <fstream>
#include <gtest/gtest.h>
#include <iterator>
#include <memory>
#include <random>

namespace Moka::Testing {
namespace {

Image FromBitmap(Bitmap* bitmap) {
    std::unique_ptr<Bitmap> const owner(bitmap);
    if (!bitmap) return {};
    EXPECT_EQ(bitmap->GetStride(), bitmap->GetWidth() * 4);
    EXPECT_TRUE(bitmap->GetDeleteBuffer());
    Image image = MakeImage(bitmap->GetWidth(), bitmap->GetHeight());
    std::copy_n(bitmap->GetBuffer(), image.pixels.size(), image.pixels.begin());
    return image;
}

} // namespace

Image MakeImage(int width, int height) {
    Image image{width, height, {}};
    image.pixels.resize(image.GetStride() * static_cast<std::size_t>(height));
    return image;
}

Image MakeTranslucentNoise(int width, int height, unsigned seed) {
    std::mt19937 random(seed);
    Image image = MakeImage(width, height);
    for (std::size_t i = 0; i < image.pixels.size(); i += 4) {
        unsigned const alpha = random() % 256;
        for (std::size_t c = 0; c < 3; ++c)
            image.pixels[i + c] = static_cast<unsigned char>(random() % (alpha + 1));
        image.pixels[i + 3] = static_cast<unsigned char>(alpha);
    }
    return image;
}

Image MakeOpaqueNoise(int width, int height) {
    return FlattenOnWhite(MakeTranslucentNoise(width, height, 1));
}

Image MakeGradient(int width, int height, bool isOpaque) {
    Image image = MakeImage(width, height);
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

Image FlattenOnWhite(Image image) {
    for (std::size_t i = 0; i < image.pixels.size(); i += 4) {
        int const white = 255 - image.pixels[i + 3];
        for (std::size_t c = 0; c < 4; ++c)
            image.pixels[i + c] = static_cast<unsigned char>(image.pixels[i + c] + white);
    }
    return image;
}

Image Scale(Image const& source, int width, int height) {
    Image result = MakeImage(width, height);
    detail::RowScaler scaler({source.width, source.height}, {width, height}, result.pixels.data());
    EXPECT_TRUE(scaler.IsReady());
    for (int y = 0; y < source.height; ++y) scaler.Push(source.Row(y));
    return result;
}

int LargestDifference(Image const& a, Image const& b) {
    if (a.width != b.width || a.height != b.height || a.pixels.empty()) return 256;
    int largest = 0;
    for (std::size_t i = 0; i < a.pixels.size(); ++i) {
        largest = std::max(largest, std::abs(a.pixels[i] - b.pixels[i]));
    }
    return largest;
}

void WriteFile(std::string const& path, Bytes const& bytes) {
    std::ofstream file(path, std::ios::binary);
    file.write(reinterpret_cast<char const*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
    ASSERT_TRUE(file.good()) << path;
}

Bytes ReadFile(std::string const& path) {
    std::ifstream file(path, std::ios::binary);
    return Bytes(std::istreambuf_iterator<char>(file), {});
}

ErrorLines::ErrorLines()
    : mBefore(SetLogSink([this](LogLine const& line) {
          EXPECT_EQ(line.priority, ANDROID_LOG_ERROR) << line.text;
          EXPECT_EQ(line.tag, "mok_log") << line.text;
          mLines.push_back(line.text);
      })) {}

ErrorLines::~ErrorLines() {
    SetLogSink(mBefore);
    EXPECT_TRUE(mLines.empty()) << "unexpected: " << mLines.front();
}

std::vector<std::string> ErrorLines::Take() {
    std::vector<std::string> lines;
    lines.swap(mLines);
    return lines;
}

Image Decode(Bytes const& file, char const* name) {
    return FromBitmap(BitmapFactory::CreateBitmapFromMemory(file.data(), file.size(), name));
}

Image DecodeFile(std::string const& path) {
    String const text(path);
    return FromBitmap(BitmapFactory::CreateBitmapForGraphics(&text));
}

Image DecodeScaled(std::string const& path, int width, int height) {
    String const text(path);
    return FromBitmap(BitmapFactory::CreateBitmap(&text, width, height));
}

ImageInfo GetInfo(std::string const& path) {
    String const text(path);
    ImageInfo info;
    EXPECT_TRUE(BitmapFactory::GetImageInfo(&text, &info)) << path;
    return info;
}

bool Save(Image const& image, std::string const& path, int quality) {
    Bitmap bitmap;
    Bytes pixels = image.pixels;
    EXPECT_TRUE(bitmap.Construct(pixels.data(), image.width, image.height, image.width * 4, 1, false, false));
    String const text(path);
    return BitmapFactory::SaveBitmap(&bitmap, &text, quality);
}

std::string SaveIn(TempFolder const& folder, Image const& image, std::string const& extension) {
    std::string const path = folder.Path("image." + extension);
    EXPECT_TRUE(Save(image, path, 100)) << path;
    return path;
}

Bytes Encode(Image const& image, std::string const& extension, int quality) {
    TempFolder const folder;
    std::string const path = folder.Path("image." + extension);
    EXPECT_TRUE(Save(image, path, quality));
    return ReadFile(path);
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
