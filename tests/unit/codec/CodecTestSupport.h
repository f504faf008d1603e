// CodecTestSupport.h: pictures, files and captured log lines for the tests of the image codecs.
#pragma once

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "tests/support/ColorProfiles.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <gmock/gmock.h>

namespace Moka::Testing {

using ::testing::AllOf;
using ::testing::ElementsAre;
using ::testing::HasSubstr;

// Every pixel the same.
Picture Fill(int width, int height, Color const& color);
// Smooth, so that lossy codecs come close.
Picture MakeGradient(int width, int height, bool isOpaque);
Picture FlattenOnWhite(Picture image);

// As the codecs' own scaler does it.
Picture Scale(Picture const& source, int width, int height);

// The greatest difference of any byte; 255 when the sizes differ.
int LargestDifference(Picture const& a, Picture const& b);

// Error lines while it lives. Everything else fails the test: codecs have nothing else to say.
class ErrorLines : public LogCapture {
public:
    ~ErrorLines();
    std::vector<std::string> Take();
};

// Empty images when the factory returns null.
Picture Decode(Bytes const& file, char const* name = "test");
Picture DecodeScaled(std::string const& path, int width, int height);
// Fails the test when the factory finds none.
ImageInfo GetInfo(std::string const& path);
// By libjpeg-turbo; the format says what the pixels' bytes mean.
Bytes MakeJpeg(Picture const& image, int format, int subsampling, int flags = 0);
// The file's bytes.
Bytes Encode(Picture const& image, std::string const& extension, int quality = 100);

} // namespace Moka::Testing
