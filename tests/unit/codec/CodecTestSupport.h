// CodecTestSupport.h: pictures, files and captured log lines for the tests of the image codecs.
#pragma once

#include "moka/base/BitmapFactory.h"
#include "moka/base/log/LogSink.h"
#include "tests/support/TestFiles.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Moka::Testing {

using Bytes = std::vector<unsigned char>;

struct Image {
    int width = 0;
    int height = 0;
    Bytes pixels; // RGBA8, premultiplied; empty when there is no image

    std::size_t GetStride() const { return static_cast<std::size_t>(width) * 4; } // bytes
    unsigned char const* Row(int y) const {
        return pixels.data() + static_cast<std::size_t>(y) * GetStride();
    }
    friend bool operator==(Image const& a, Image const& b) {
        return a.width == b.width && a.height == b.height && a.pixels == b.pixels;
    }
};

// Transparent.
Image MakeImage(int width, int height);
// Every alpha occurs, and colours from 0 up to it.
Image MakeTranslucentNoise(int width, int height, unsigned seed = 1);
Image MakeOpaqueNoise(int width, int height);
// Smooth, so that lossy codecs come close.
Image MakeGradient(int width, int height, bool isOpaque);
Image FlattenOnWhite(Image image);

// As the codecs' own scaler does it.
Image Scale(Image const& source, int width, int height);

// The greatest difference of any byte; 256 when the sizes differ.
int LargestDifference(Image const& a, Image const& b);

void WriteFile(std::string const& path, Bytes const& bytes);
Bytes ReadFile(std::string const& path);

// Error lines while it lives. Everything else fails the test: codecs have nothing else to say.
class ErrorLines {
public:
    ErrorLines();
    ~ErrorLines();
    ErrorLines(ErrorLines const&) = delete;
    ErrorLines& operator=(ErrorLines const&) = delete;

    std::vector<std::string> Take();

private:
    std::vector<std::string> mLines;
    LogSink mBefore;
};

// Empty images when the factory returns null.
Image Decode(Bytes const& file, char const* name = "test");
Image DecodeFile(std::string const& path);
Image DecodeScaled(std::string const& path, int width, int height);
// Fails the test when the factory finds none.
ImageInfo GetInfo(std::string const& path);
bool Save(Image const& image, std::string const& path, int quality);
// As image.EXTENSION; fails the test when it cannot be saved. Returns the path.
std::string SaveIn(TempFolder const& folder, Image const& image, std::string const& extension);
// The file's bytes.
Bytes Encode(Image const& image, std::string const& extension, int quality = 100);

// Edits in a copy.
Bytes Replace(Bytes bytes, std::size_t at, Bytes const& with);
Bytes Insert(Bytes bytes, std::size_t at, Bytes const& what);
std::size_t Find(Bytes const& bytes, Bytes const& what); // fails the test when it is not there

} // namespace Moka::Testing
