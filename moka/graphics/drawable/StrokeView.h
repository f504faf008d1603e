// StrokeView: maps pixels of the target to the canvas: the inverse of a projection and a viewport.
// Thread: any.
#pragma once

#include "moka/graphics/drawable/StrokeSegment.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/math/Vector.h"

#include <array>

namespace Moka::detail {

class StrokeView {
public:
    // width and height are those of the viewport, in pixels.
    StrokeView(Matrix4<float> const& projection, int width, int height);

    // False if the projection has no inverse. Nothing is visible then.
    bool IsValid() const { return mIsValid; }
    // The dot products of the three rows with (gl_FragCoord.xy, 1) are homogeneous coordinates on the canvas.
    // The row's w is 0.
    Vector4<float> GetRow(int row) const;
    // Returns the scale for strokes whose coordinates do not exceed extent.
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
