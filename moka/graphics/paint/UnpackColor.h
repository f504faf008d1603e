// UnpackColor.h: converts an integer colour to components.
#pragma once

#include "moka/graphics/math/Vector.h"

namespace Moka::detail {

// Converts 0xAARRGGBB to red, green, blue and alpha, each 0 ... 1.
inline Vector4<float> UnpackColor(int argb) {
    auto const component = [argb](int shift) {
        return static_cast<float>((static_cast<unsigned>(argb) >> shift) & 0xFFu) / 255.0f;
    };
    return {component(16), component(8), component(0), component(24)};
}

} // namespace Moka::detail
