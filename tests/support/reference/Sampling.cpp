#include "tests/support/reference/Sampling.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

int WrapIndex(int i, int count, Wrap wrap) {
    if (wrap == Wrap::Clamp) return std::clamp(i, 0, count - 1);
    int const period = wrap == Wrap::Mirror ? 2 * count : count;
    int const place = (i % period + period) % period;
    return place < count ? place : period - 1 - place;
}

Rgba Mix(Rgba const& a, Rgba const& b, double t) {
    return {a.r + (b.r - a.r) * t, a.g + (b.g - a.g) * t, a.b + (b.b - a.b) * t, a.a + (b.a - a.a) * t};
}

// Between two texel centres.
struct Place {
    int low;
    double between;
};

Place Locate(double coordinate, int count) {
    double const texel = coordinate * count - 0.5;
    double const low = std::floor(texel);
    return {static_cast<int>(low), texel - low};
}

double Between(double from, double to, double t) { return from + (to - from) * t; }

// A band of the fringe is a trapezoid whose ends carry the ends' coordinates on both of its long sides. Cut
// into two triangles, its coordinate depends on which way. q is the place along it, from the outer side's
// begin, c 0 on the outer and 1 on the inner side, n the drawn length. Both ways, from 0 at the begin to 1.
std::array<double, 2> PlaceInBand(double q, double c, double n) {
    double const falling = q <= n + 1 - n * c ? (q - c) / (n + 1) : (q + c - 2) / (n - 1);
    double const rising = q >= n * c ? (q + c) / (n + 1) : (q - c) / (n - 1);
    return {falling, rising};
}

} // namespace

Rgba Sample(Picture const& image, Sampler const& sampler, double u, double v) {
    auto const texel = [&](int x, int y) {
        return FromBytes(
            image.GetColor(WrapIndex(x, image.width, sampler.x), WrapIndex(y, image.height, sampler.y)));
    };
    Place const x = Locate(u, image.width);
    Place const y = Locate(v, image.height);
    return Mix(Mix(texel(x.low, y.low), texel(x.low + 1, y.low), x.between),
               Mix(texel(x.low, y.low + 1), texel(x.low + 1, y.low + 1), x.between), y.between);
}

bool IsBetweenTexels(Picture const& image, double u, double v) {
    auto const isBetween = [](double between) { return between > 1e-3 && between < 1 - 1e-3; };
    return isBetween(Locate(u, image.width).between) || isBetween(Locate(v, image.height).between);
}

Coordinates BitmapQuad::GetCoordinates(PointD const& p) const {
    if (antiAliased && InsetIn(dst, p) < 0.5) return GetFringeCoordinates(p);
    RectF const solid = antiAliased ? Grown(dst, -0.5) : dst;
    RectD const r(solid);
    double const s = (p.x - r.left) / r.GetWidth();
    double const t = (p.y - r.top) / r.GetHeight();
    Coordinates found;
    found.Add({Between(leftU, rightU, s), Between(topV, bottomV, t)});
    return found;
}

Coordinates BitmapQuad::GetFringeCoordinates(PointD const& p) const {
    RectD const r(dst);
    double const left = p.x - r.left;
    double const right = r.right - p.x;
    double const top = p.y - r.top;
    double const bottom = r.bottom - p.y;
    double const inset = InsetIn(dst, p);
    Coordinates found;
    if (inset == left || inset == right) {
        double const u = inset == left ? leftU : rightU;
        for (double const t : PlaceInBand(top + 0.5, inset + 0.5, r.GetHeight())) {
            found.Add({u, Between(topV, bottomV, t)});
        }
    }
    if (inset == top || inset == bottom) {
        double const v = inset == top ? topV : bottomV;
        for (double const t : PlaceInBand(left + 0.5, inset + 0.5, r.GetWidth())) {
            found.Add({Between(leftU, rightU, t), v});
        }
    }
    return found;
}

} // namespace Moka::Testing
