#include "tests/support/ImageCompare.h"

#include "tests/support/TestFiles.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <ostream>
#include <system_error>

namespace Moka::Testing {
namespace {

constexpr Color kAllowed{120, 150, 255, 255};

int LargestDifference(unsigned char const* a, unsigned char const* b) {
    int largest = 0;
    for (int channel = 0; channel < 4; ++channel) {
        largest = std::max(largest, std::abs(a[channel] - b[channel]));
    }
    return largest;
}

Color OnWhite(unsigned char const* pixel) {
    auto const blend = [&](int channel) {
        return static_cast<unsigned char>(std::min(255, pixel[channel] + 255 - pixel[3]));
    };
    return {blend(0), blend(1), blend(2), 255};
}

Color ShowDifference(unsigned char const* a, unsigned char const* b, int slack) {
    int const difference = LargestDifference(a, b);
    if (difference > 0 && difference <= slack) return kAllowed;
    if (difference > 0) return {static_cast<unsigned char>(128 + difference / 2), 0, 0, 255};
    Color const color = OnWhite(a);
    auto const grey = static_cast<unsigned char>(160 + (color[0] + color[1] + color[2]) / 9);
    return {grey, grey, grey, 255};
}

bool WriteDifference(Picture const& a, Picture const& b, std::string const& path, Slack const* slack) {
    int const width = std::min(a.width, b.width);
    int const height = std::min(a.height, b.height);
    Picture sheet(width * 3, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            sheet.SetColor(x, y, OnWhite(a.At(x, y)));
            sheet.SetColor(x + width, y,
                           ShowDifference(a.At(x, y), b.At(x, y), slack ? slack->Get(x, y) : 0));
            sheet.SetColor(x + 2 * width, y, OnWhite(b.At(x, y)));
        }
    }
    return SaveImage(sheet, path);
}

} // namespace

std::ostream& operator<<(std::ostream& stream, ImageDifference const& difference) {
    return stream << difference.differingPixels << " pixels differ, first at (" << difference.firstX << ", "
                  << difference.firstY << "), by at most " << difference.largest;
}

ImageDifference CompareImages(unsigned char const* a, unsigned char const* b, int width, int height,
                              Slack const* slack) {
    ImageDifference result;
    std::size_t offset = 0;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x, offset += 4) {
            int const largest = LargestDifference(a + offset, b + offset);
            if (largest <= (slack ? slack->Get(x, y) : 0)) continue;
            result.largest = std::max(result.largest, largest);
            if (result.differingPixels++ > 0) continue;
            result.firstX = x;
            result.firstY = y;
        }
    }
    return result;
}

ImageDifference CompareImages(Picture const& a, Picture const& b, Slack const* slack) {
    if (a.width == b.width && a.height == b.height) {
        return CompareImages(a.pixels.data(), b.pixels.data(), a.width, a.height, slack);
    }
    return {static_cast<int>(std::max(a.pixels.size(), b.pixels.size()) / 4), 255, 0, 0};
}

std::string KeepDifference(Picture const& expected, Picture const& actual, std::string name,
                           Slack const* slack) {
    for (char& c : name) {
        if (!std::isalnum(static_cast<unsigned char>(c))) c = '-';
    }
    std::error_code error;
    std::filesystem::path const folder = std::filesystem::absolute("differences", error);
    std::filesystem::create_directories(folder, error);
    std::string const path = (folder / (name + ".png")).string();
    if (!WriteDifference(expected, actual, path, slack)) return "the picture of it could not be written";
    return "expected, difference and actual: " + path;
}

} // namespace Moka::Testing
