#include "tests/unit/codec/CodecTestSupport.h"

#include "moka/base/codec/RowScaler.h"
#include "moka/base/log/AndroidLog.h"

#include <cmath>
#include <memory>
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
    return MakeChecker(width, height, 1, color, color);
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

int LargestDifference(Picture const& a, Picture const& b) { return CompareImages(a, b).largest; }

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

Bytes MakeJpeg(Picture const& image, int format, int subsampling, int flags) {
    tjhandle const handle = tjInitCompress();
    unsigned char* encoded = nullptr;
    unsigned long size = 0;
    EXPECT_EQ(tjCompress2(handle, image.pixels.data(), image.width, 0, image.height, format, &encoded, &size,
                          subsampling, 100, flags),
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
    return ReadFile(path);
}

} // namespace Moka::Testing
