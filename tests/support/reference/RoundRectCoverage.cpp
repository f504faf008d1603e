#include "tests/support/reference/Coverage.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

// The rectangle with its corner boxes, as lines across it.
struct Frame {
    Frame(RectF const& r, double xRadius, double yRadius)
        : outer(r),
          rx(std::min(double{r.GetWidth()} / 2, xRadius)),
          ry(std::min(double{r.GetHeight()} / 2, yRadius)),
          innerLeft(outer.left + rx),
          innerTop(outer.top + ry),
          innerRight(outer.right - rx),
          innerBottom(outer.bottom - ry) {}

    RectD outer;
    double rx, ry;
    double innerLeft, innerTop, innerRight, innerBottom;
};

// Half-open, so that of two pieces that meet exactly one has a point between them.
template <class Function>
Shape Piece(RectF const& bounds, Function const& coverage) {
    return {bounds, [=](PointD const& p) -> Coverage {
                if (!RectD(bounds).Holds(p)) return {};
                return coverage(p);
            }};
}

// One straight side: profile gives the coverage at a distance inwards from the edge.
template <class Function>
void AddSides(std::vector<Shape>& shapes, Frame const& f, double from, double to, Function const& profile) {
    RectD const r = f.outer;
    shapes.push_back(Piece(Box(f.innerLeft, r.top + from, f.innerRight, r.top + to),
                           [=](PointD const& p) { return Fragment{profile(p.y - r.top)}; }));
    shapes.push_back(Piece(Box(f.innerLeft, r.bottom - to, f.innerRight, r.bottom - from),
                           [=](PointD const& p) { return Fragment{profile(r.bottom - p.y)}; }));
    shapes.push_back(Piece(Box(r.left + from, f.innerTop, r.left + to, f.innerBottom),
                           [=](PointD const& p) { return Fragment{profile(p.x - r.left)}; }));
    shapes.push_back(Piece(Box(r.right - to, f.innerTop, r.right - from, f.innerBottom),
                           [=](PointD const& p) { return Fragment{profile(r.right - p.x)}; }));
}

// 1 on the ellipse with these radii.
double OnEllipse(PointD const& d, double a, double b) { return d.x * d.x / (a * a) + d.y * d.y / (b * b); }

// As wide along the x radii as along the y radii, whatever those are, which callers see.
double RampWidth(double outer, double inner) { return outer * outer / (inner * inner) - 1; }

Coverage CoverCorner(PointD const& d, double rx, double ry, double k, bool filled) {
    if (OnEllipse(d, rx + k + 0.5, ry + k + 0.5) > 1) return {};
    double coverage = 1;
    double const s = OnEllipse(d, rx + k - 0.5, ry + k - 0.5);
    if (s > 1) coverage *= 1 - (s - 1) / RampWidth(rx + k + 0.5, rx + k - 0.5);
    if (filled) return Fragment{coverage};
    double const hole = OnEllipse(d, rx - k - 0.5, ry - k - 0.5);
    if (hole < 1) return {};
    if (OnEllipse(d, rx - k + 0.5, ry - k + 0.5) < 1) {
        coverage *= (hole - 1) / RampWidth(rx - k + 0.5, rx - k - 0.5);
    }
    return Fragment{coverage};
}

void AddCorners(std::vector<Shape>& shapes, Frame const& f, double k, bool filled) {
    double const reach = k + 0.5;
    for (bool const left : {true, false}) {
        for (bool const top : {true, false}) {
            PointD const center{left ? f.innerLeft : f.innerRight, top ? f.innerTop : f.innerBottom};
            RectF const quad = Box(center.x, center.y, left ? f.outer.left - reach : f.outer.right + reach,
                                   top ? f.outer.top - reach : f.outer.bottom + reach);
            shapes.push_back(Piece(quad, [=](PointD const& p) {
                return CoverCorner({p.x - center.x, p.y - center.y}, f.rx, f.ry, k, filled);
            }));
        }
    }
}

} // namespace

std::vector<Shape> FilledRoundRect(RectF const& r, double rx, double ry) {
    Frame const f(r, rx, ry);
    std::vector<Shape> shapes;
    AddSides(shapes, f, -0.5, 0.5, [](double inset) { return inset + 0.5; });
    auto const solid = [](PointD const&) { return Fragment{1}; };
    auto const [l, t, right, b] = f.outer;
    shapes.push_back(Piece(Box(f.innerLeft, t + 0.5, f.innerRight, f.innerTop), solid));
    shapes.push_back(Piece(Box(l + 0.5, f.innerTop, right - 0.5, f.innerBottom), solid));
    shapes.push_back(Piece(Box(f.innerLeft, f.innerBottom, f.innerRight, b - 0.5), solid));
    AddCorners(shapes, f, 0, true);
    return shapes;
}

std::vector<Shape> StrokedRoundRect(RectF const& r, double rx, double ry, double width) {
    Frame const f(r, rx, ry);
    double const h = width / 2;
    std::vector<Shape> shapes;
    AddSides(shapes, f, -h - 0.5, h + 0.5,
             [h](double inset) { return std::min(1.0, h + 0.5 - std::abs(inset)); });
    AddCorners(shapes, f, h, false);
    return shapes;
}

} // namespace Moka::Testing
