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

// A line from one point to another: places are told by two distances, along it and across it.
struct Axis {
    Axis(PointD const& begin, PointD const& to)
        : from(begin),
          length(std::hypot(to.x - from.x, to.y - from.y)),
          d((to.x - from.x) / length, (to.y - from.y) / length),
          box(Box(from.x, from.y, to.x, to.y)) {}

    double Along(PointD const& p) const { return (p.x - from.x) * d.x + (p.y - from.y) * d.y; }
    double Across(PointD const& p) const { return (p.y - from.y) * d.x - (p.x - from.x) * d.y; }

    PointD from;
    double length;
    PointD d;
    RectF box;
};

constexpr double kNowhere = 100000;
// What single precision may lose of a number of size 1 in a few operations.
constexpr double kRounding = 1e-6;

double Clamp01(double v) { return std::min(std::max(v, 0.0), 1.0); }
double Modulo(double x, double y) { return x - y * std::floor(x / y); }
bool Within(double v, double low, double high) { return v >= low && v <= high; }

// The part of the line, or of its pattern, that a point at x lies in.
struct Interval {
    double left;
    double right;
    bool inked;
    double x; // measured as left and right are
};

struct LineGeometry {
    double halfWidth;
    double length;
    int cap;
    bool dashed;
    std::array<double, 4> ends{}; // of dash, gap, dash, gap; the last one is the period

    Interval FindSolid(double x) const;
    Interval FindDashed(double x) const;
    double CoverAlong(double x, double across) const;
    // Whether the length comes so near to a boundary of the pattern that single precision may find it on
    // either side.
    bool IsEndOpen() const;
};

Interval LineGeometry::FindSolid(double x) const {
    if (x < 0) return {-kNowhere, 0, false, x};
    if (x > length) return {length, kNowhere, false, x};
    return {0, length, true, x};
}

Interval LineGeometry::FindDashed(double x) const {
    double const period = ends[3];
    double const rest = Modulo(length, period);
    double const place = Modulo(x, period);
    bool const endsInDash = Within(rest, 0, ends[0]) || Within(rest, ends[1], ends[2]);
    bool const endsInGap = Within(rest, ends[0], ends[1]) || Within(rest, ends[2], ends[3]);
    if (x >= length) {
        if (endsInDash) return {length, kNowhere, false, x};
        return {rest < ends[1] ? ends[0] : ends[2], kNowhere, false, place};
    }
    if (place < ends[0]) return {0, ends[0], true, place};
    if (place >= ends[1] && place < ends[2]) return {ends[1], ends[2], true, place};
    Interval gap{ends[2], ends[3], false, place};
    if (place < ends[1]) gap = {ends[0], ends[1], false, place};
    if (x >= length - halfWidth - 0.5 && endsInGap) gap.right = kNowhere;
    return gap;
}

double LineGeometry::CoverAlong(double x, double across) const {
    Interval const i = dashed ? FindDashed(x) : FindSolid(x);
    if (i.inked) {
        if (cap != MKPaint::Butt) return 1;
        if (i.x < i.left + 0.5) return std::max(0.5 + i.x - i.left, 0.0);
        if (i.x > i.right - 0.5) return std::max(0.5 + i.right - i.x, 0.0);
        return 1;
    }
    if (cap == MKPaint::Butt) return std::max({0.5 + i.left - i.x, 0.5 + i.x - i.right, 0.0});
    if (cap == MKPaint::Round) {
        double const near = std::min(std::hypot(i.x - i.left, across), std::hypot(i.x - i.right, across));
        return Clamp01(0.5 + halfWidth - near);
    }
    return Clamp01(0.5 + std::max(i.left + halfWidth - i.x, i.x - i.right + halfWidth));
}

// One thinner than its two ramps is not covered whole even on its axis, and has a step between them.
double CoverAcross(double halfWidth, double across) {
    if (across > halfWidth - 0.5) return Clamp01(0.5 + halfWidth - across);
    return Clamp01(0.5 + halfWidth + across);
}

bool LineGeometry::IsEndOpen() const {
    double const rest = Modulo(length, ends[3]);
    auto const isNear = [&](double end) { return rest != end && std::abs(rest - end) < length * kRounding; };
    return isNear(0) || std::any_of(ends.begin(), ends.end(), isNear);
}

LineGeometry Measure(double length, MKPaint const& paint) {
    LineGeometry line{
        static_cast<double>(paint.GetLineWidth()) / 2, length, paint.GetLineCapType(), false, {}};
    auto const pattern = paint.GetDashedLinePattern();
    if (pattern.x > -1.0f) {
        line.dashed = true;
        double sum = 0;
        std::size_t i = 0;
        for (float const part : {pattern.x, pattern.y, pattern.z, pattern.w}) {
            sum += static_cast<double>(part);
            line.ends[i++] = sum;
        }
    }
    return line;
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

RectF Box(double left, double top, double right, double bottom) {
    return Sorted({static_cast<float>(left), static_cast<float>(top), static_cast<float>(right),
                   static_cast<float>(bottom)});
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
    return {Grown(Box(center.x, center.y, center.x, center.y), radius + 0.5),
            [=](PointD const& p) -> Coverage {
                double const outside = std::hypot(p.x - center.x, p.y - center.y) - radius;
                if (outside > 0.5) return {};
                return Fragment{std::min(1.0, 0.5 - outside)};
            }};
}

Shape StrokedCircle(PointD const& center, double radius, double width) {
    double const k = width / 2;
    RectF const bounds = Grown(FilledCircle(center, radius).bounds, k + 1);
    return {bounds, [=](PointD const& p) -> Coverage {
                double const outside = std::hypot(p.x - center.x, p.y - center.y) - radius;
                if (std::abs(outside) > k + 0.5) return {};
                return Fragment{CoverAcross(k, outside)};
            }};
}

Shape SimpleLine(PointD const& from, PointD const& to, double width, bool antiAliased) {
    Axis const axis(from, to);
    double const edge = width / 2 + (antiAliased ? 0.5 : 0.0);
    return {Grown(axis.box, edge), [=](PointD const& p) -> Coverage {
                double const along = axis.Along(p);
                double const across = std::abs(axis.Across(p));
                if (!(along >= 0 && along <= axis.length && across <= edge)) return {};
                return Fragment{antiAliased ? std::min(1.0, edge - across) : 1.0};
            }};
}

Shape Line(PointD const& from, PointD const& to, MKPaint const& paint) {
    Axis const axis(from, to);
    LineGeometry const line = Measure(axis.length, paint);
    double const reach = line.halfWidth + 0.5;
    bool const endIsOpen = line.dashed && line.IsEndOpen();
    // Both ways from the corner of the quad: further than its sides reach.
    return {Grown(axis.box, 1.5 * reach), [=](PointD const& p) -> Coverage {
                double const along = axis.Along(p);
                double const across = axis.Across(p);
                if (!(along >= -reach && along <= axis.length + reach && std::abs(across) <= reach))
                    return {};
                return Fragment{std::min(line.CoverAlong(along, across), CoverAcross(line.halfWidth, across)),
                                endIsOpen && along > axis.length - reach};
            }};
}

} // namespace Moka::Testing
