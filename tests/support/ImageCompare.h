// ImageCompare.h: how far two images of the same size are apart, in numbers and as a picture.
// RGBA8, rows packed. Compared as stored: premultiplied with premultiplied.
#pragma once

#include "tests/support/TestImages.h"

#include <algorithm>
#include <iosfwd>
#include <string>
#include <vector>

namespace Moka::Testing {

// How far each pixel of an image may be off, in steps of any channel. 255 is anything.
class Slack {
public:
    Slack(int width, int height, unsigned char steps = 0)
        : mWidth(width), mSteps(static_cast<std::size_t>(width) * static_cast<std::size_t>(height), steps) {}

    int Get(int x, int y) const { return mSteps[GetIndex(x, y)]; }
    void Set(int x, int y, int steps) {
        mSteps[GetIndex(x, y)] = static_cast<unsigned char>(std::clamp(steps, 0, 255));
    }
    // The pixels that may be off by more.
    int CountOver(int steps) const {
        return static_cast<int>(
            std::count_if(mSteps.begin(), mSteps.end(), [steps](int s) { return s > steps; }));
    }

private:
    std::size_t GetIndex(int x, int y) const {
        return static_cast<std::size_t>(y) * static_cast<std::size_t>(mWidth) + static_cast<std::size_t>(x);
    }

    int mWidth;
    std::vector<unsigned char> mSteps;
};

struct ImageDifference {
    int differingPixels = 0; // by more than they may
    int largest = 0;         // of any channel of these
    int firstX = -1;         // of the first differing pixel in reading order; -1 when there is none
    int firstY = -1;
};

// So that a failing test says it all.
std::ostream& operator<<(std::ostream& stream, ImageDifference const& difference);

ImageDifference CompareImages(unsigned char const* a, unsigned char const* b, int width, int height,
                              Slack const* slack = nullptr);
// Images of different sizes differ everywhere, by 255.
ImageDifference CompareImages(Picture const& a, Picture const& b, Slack const* slack = nullptr);

// For a failed test: writes differences/NAME.png in the working directory, whatever characters the name
// has, and returns a line that says where. It shows both images, on white, and between them their
// difference: grey and dim where they agree, red by the largest channel difference (at least half bright)
// where not, blue where they may.
std::string KeepDifference(Picture const& expected, Picture const& actual, std::string name,
                           Slack const* slack = nullptr);

} // namespace Moka::Testing
