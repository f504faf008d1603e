/// DrawBounds: a box on the target that encloses all pixels that a draw covers.
/// Units: normalized device coordinates: -1 to 1 over the target, as gl_Position.xy / gl_Position.w has them.
/// An empty box, such as a default one, means that the bounds are unknown.
#pragma once

namespace Moka {

struct DrawBounds {
    /// The box's sides.
    float left = 0;
    float bottom = 0;
    float right = 0;
    float top = 0;

    /// False for an empty box, and if a side is NaN.
    bool IsKnown() const { return left < right && bottom < top; }
};

} // namespace Moka
