// Saturate.h: numbers to int, the nearest one for what does not fit.
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

// Towards zero; NaN becomes 0.
inline int Saturate(float value) {
    if (std::isnan(value)) return 0;
    // The greatest int has no float of its own; the next float up is the first that does not fit.
    if (value >= 2147483648.0f) return std::numeric_limits<int>::max();
    if (value <= -2147483648.0f) return std::numeric_limits<int>::min();
    return static_cast<int>(value);
}

} // namespace Moka
