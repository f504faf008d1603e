// Sampling.h: the colour of an image at a texture coordinate, and the coordinate of a drawn bitmap's point.
#pragma once

#include "tests/support/reference/Blend.h"
#include "tests/support/reference/Coverage.h"

namespace Moka::Testing {

enum class Wrap { Clamp, Mirror, Repeat };

struct Sampler {
    Wrap x = Wrap::Clamp;
    Wrap y = Wrap::Clamp;
};

// Linear. u and v are 0 at the image's first column and row, 1 at the end of the last.
Rgba Sample(Picture const& image, Sampler const& sampler, double u, double v);

// Whether a linear filter has anything to do there.
bool IsBetweenTexels(Picture const& image, double u, double v);

// More than one where the definition leaves open which.
struct Coordinates {
    std::array<PointD, 4> all;
    std::size_t count = 0;

    void Add(PointD const& p) { all[count++] = p; }
};

// Where in its image each part of a drawn bitmap comes from.
struct BitmapQuad {
    RectF dst;
    double leftU, topV, rightU, bottomV;
    bool antiAliased;

    Shape GetShape() const { return FilledRect(dst, antiAliased); }
    Coordinates GetCoordinates(PointD const& p) const;

private:
    Coordinates GetFringeCoordinates(PointD const& p) const;
};

} // namespace Moka::Testing
