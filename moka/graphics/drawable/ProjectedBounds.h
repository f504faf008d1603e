// ProjectedBounds.h: computes the bounds of a draw on its target, so that the renderer can merge draws that
// do not overlap others.
#pragma once

#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/renderer/DrawBounds.h"

#include <cmath>

namespace Moka::detail {

// box is in units before the projection; its sides may be in any order. With perspective the result is
// unknown.
inline DrawBounds Project(RectF const& box, Matrix4<float> const& projection) {
    float const* const m = projection.data();
    if (m[3] != 0.0f || m[7] != 0.0f || m[15] != 1.0f) return {};
    float const x = (box.left + box.right) * 0.5f;
    float const y = (box.top + box.bottom) * 0.5f;
    float const halfWidth = std::fabs(box.right - box.left) * 0.5f;
    float const halfHeight = std::fabs(box.bottom - box.top) * 0.5f;
    float const centerX = m[0] * x + m[4] * y + m[12];
    float const centerY = m[1] * x + m[5] * y + m[13];
    // A margin for the GPU's rounding.
    constexpr float kLarger = 1.0001f;
    constexpr float kMargin = 1e-5f;
    float const reachX = (std::fabs(m[0]) * halfWidth + std::fabs(m[4]) * halfHeight) * kLarger + kMargin;
    float const reachY = (std::fabs(m[1]) * halfWidth + std::fabs(m[5]) * halfHeight) * kLarger + kMargin;
    return {centerX - reachX, centerY - reachY, centerX + reachX, centerY + reachY};
}

} // namespace Moka::detail
