// Compare.h: whether two image files hold the same pixels.
#pragma once

#include <cstdint>
#include <string>

namespace Moka::Samples {

struct Comparison {
    bool isRead = false; // both; otherwise an error line was logged
    bool isSameSize = false;
    std::int64_t differing = 0; // pixels, of images of the same size
};

// Decoded, bit for bit, premultiplied.
Comparison Compare(std::string const& a, std::string const& b);

} // namespace Moka::Samples
