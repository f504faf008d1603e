#include "tests/support/reference/Coverage.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

bool IsMirrored(RectF const& r) { return r.right < r.left || r.bottom < r.top; }
bool IsMirroredOnce(RectF const& r) { return (r.right < r.left) != (r.bottom < r.top); }

double LargestInset(RectF const& r) { return std::min(double{r.GetWidth()}, double{r.GetHeight()}) / 2; }

// Of a ring between two insets, and all inside it: the rectangle is too narrow for the inner one, so that the
// ring's sides cross each other.
bool IsCrossed(RectF const& r, double inner) { return inner > LargestInset(r); }

Coverage FuzzyStroke(RectF const& r, double h, double inset) {
    double const levels[] = {-h - 0.5, -h + 0.5, h - 0.5, h + 0.5};
    if (inset < levels[0]) return {};
    for (int ring = 0; ring < 3; ++ring) {
        if (inset >= levels[ring] && IsCrossed(r, levels[ring + 1])) return Fragment{1, true};
    }
    if (inset > levels[3]) return {};
    return Fragment{std::min({1.0, inset - levels[0], levels[3] - inset})};
}

Coverage HardStroke(RectF const& r, double h, double inset) {
    if (inset < -h) return {};
    if (IsCrossed(r, h)) return Fragment{1, true};
    if (inset >= h) return {};
    return Fragment{1};
}

} // namespace

double InsetIn(RectF const& rect, PointD const& p) {
    RectD const r(rect);
    return std::min({p.x - r.left, r.right - p.x, p.y - r.top, r.bottom - p.y});
}

RectF Grown(RectF const& r, double by) {
    auto const d = static_cast<float>(by);
    return {r.left - d, r.top - d, r.right + d, r.bottom + d};
}

RectF Sorted(RectF const& r) {
    return {std::min(r.left, r.right), std::min(r.top, r.bottom), std::max(r.left, r.right),
            std::max(r.top, r.bottom)};
}

Shape FilledRect(RectF const& rect, bool antiAliased) {
    RectF const r = Sorted(rect);
    if (!antiAliased) {
        return {r, [r](PointD const& p) { return InsetIn(r, p) >= 0 ? Coverage(Fragment{1}) : Coverage(); }};
    }
    // A mirrored one has its fringe inside out, one narrower than the fringe has crossed bands.
    bool const vague = IsMirrored(rect) || IsCrossed(r, 0.5);
    return {Grown(r, 0.5), [r, vague](PointD const& p) -> Coverage {
                double const inset = InsetIn(r, p);
                if (inset < -0.5) return {};
                return Fragment{std::min(1.0, inset + 0.5), vague};
            }};
}

Shape StrokedRect(RectF const& rect, double width, bool antiAliased) {
    RectF const r = Sorted(rect);
    double const h = width / 2;
    bool const vague = IsMirroredOnce(rect);
    return {Grown(r, h + 0.5), [=](PointD const& p) {
                double const inset = InsetIn(r, p);
                Coverage coverage = antiAliased ? FuzzyStroke(r, h, inset) : HardStroke(r, h, inset);
                if (vague) coverage = Fragment{1, true};
                return coverage;
            }};
}

Shape FilledCircle(PointD const& center, double radius) {
    RectF const point(static_cast<float>(center.x), static_cast<float>(center.y),
                      static_cast<float>(center.x), static_cast<float>(center.y));
    return {Grown(point, radius + 0.5), [=](PointD const& p) -> Coverage {
                double const outside = std::hypot(p.x - center.x, p.y - center.y) - radius;
                if (outside > 0.5) return {};
                return Fragment{std::min(1.0, 0.5 - outside)};
            }};
}

// The outer ramp comes first: a stroke thinner than the ramps has a step between them.
Shape StrokedCircle(PointD const& center, double radius, double width) {
    double const k = width / 2;
    RectF const bounds = Grown(FilledCircle(center, radius).bounds, k + 1);
    return {bounds, [=](PointD const& p) -> Coverage {
                double const outside = std::hypot(p.x - center.x, p.y - center.y) - radius;
                if (outside > k + 0.5 || outside < -k - 0.5) return {};
                if (outside > k - 0.5) return Fragment{k + 0.5 - outside};
                if (outside < -k + 0.5) return Fragment{outside + k + 0.5};
                return Fragment{1};
            }};
}

Shape SimpleLine(PointD const& from, PointD const& to, double width, bool antiAliased) {
    double const length = std::hypot(to.x - from.x, to.y - from.y);
    PointD const d{(to.x - from.x) / length, (to.y - from.y) / length};
    double const edge = width / 2 + (antiAliased ? 0.5 : 0.0);
    RectF const ends(static_cast<float>(from.x), static_cast<float>(from.y), static_cast<float>(to.x),
                     static_cast<float>(to.y));
    return {Grown(Sorted(ends), edge), [=](PointD const& p) -> Coverage {
                double const along = (p.x - from.x) * d.x + (p.y - from.y) * d.y;
                double const across = std::abs((p.y - from.y) * d.x - (p.x - from.x) * d.y);
                if (!(along >= 0 && along <= length && across <= edge)) return {};
                return Fragment{antiAliased ? std::min(1.0, edge - across) : 1.0};
            }};
}

} // namespace Moka::Testing
