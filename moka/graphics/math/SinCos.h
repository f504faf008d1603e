// SinCos: the sine and cosine of an angle, in single precision, computed by one call if the platform has it.
#pragma once

#include <cmath>

namespace Moka::detail {

struct SinCos {
    float s;
    float c;

    explicit SinCos(float radians) {
#if defined(__GLIBC__) || defined(__ANDROID__)
        ::sincosf(radians, &s, &c);
#else
        s = std::sin(radians);
        c = std::cos(radians);
#endif
    }
};

} // namespace Moka::detail
