// StrokeView: how a target's pixels lie on the canvas: the inverse of a projection and a viewport.
// Thread: any.
#pragma once

#include "moka/graphics/drawable/StrokeSegment.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"

#include <array>

namespace Moka::detail {

class StrokeView {
public:
    // Of a viewport of this size, in pixels.
    StrokeView(Matrix4<float> const& projection, int width, int height);

    // False if the projection has no inverse: nothing can be seen.
    bool IsValid() const { return mIsValid; }
    // Dot products with (gl_FragCoord.xy, 1) are homogeneous coordinates on the canvas. w is 0.
    Vector4<float> GetRow(int row) const;
    // For strokes that reach so far from the canvas's origin.
    StrokeScale GetScale(double extent) const;

private:
    struct Range {
        double least;
        double most;
    };

    Range MeasurePixel(double x, double y) const;

    std::array<std::array<double, 3>, 3> mToCanvas{};
    double mWidth;
    double mHeight;
    bool mIsAffine = true;
    bool mIsValid = false;
};

} // namespace Moka::detail
