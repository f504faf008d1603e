// ImageCompare.h: how far two images of the same size are apart, in numbers and as a picture.
// RGBA8, rows packed. Compared as stored: premultiplied with premultiplied.
#pragma once

#include "tests/support/TestImages.h"

#include <iosfwd>
#include <string>

namespace Moka::Testing {

struct ImageDifference {
    int differingPixels = 0;
    int largest = 0; // of any channel of any pixel
    double mean = 0; // over all channels of all pixels
    int firstX = -1; // of the first differing pixel in reading order; -1 when there is none
    int firstY = -1;
};

// So that a failing test says it all.
std::ostream& operator<<(std::ostream& stream, ImageDifference const& difference);

ImageDifference CompareImages(unsigned char const* a, unsigned char const* b, int width, int height);
// Images of different sizes differ everywhere, by 255.
ImageDifference CompareImages(TestImage const& a, TestImage const& b);

// Writes a PNG of both images and, between them, their difference: grey and dim where they agree, red by the
// largest channel difference (at least half bright) where not. Each is shown on white. False when the file
// cannot be written (one error line).
bool WriteDifference(TestImage const& a, TestImage const& b, std::string const& path);

} // namespace Moka::Testing
