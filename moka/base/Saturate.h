// Saturate.h: converts numbers to int. Numbers outside the range of int become the nearest int.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <limits>

namespace Moka {

inline int Saturate(std::int64_t value) {
    return static_cast<int>(
        std::clamp<std::int64_t>(value, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()));
}

// Rounds towards zero. NaN becomes 0.
inline int Saturate(float value) {
    if (std::isnan(value)) return 0;
    // The greatest int is not a float. 2^31 is the smallest float that does not fit.
    if (value >= 2147483648.0f) return std::numeric_limits<int>::max();
    if (value <= -2147483648.0f) return std::numeric_limits<int>::min();
    return static_cast<int>(value);
}

} // namespace Moka
