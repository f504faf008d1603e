#include "tests/support/reference/LineCoverage.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

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
    double CoverAcross(double across) const;
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

// A line thinner than its two ramps is not covered whole even on its axis.
double LineGeometry::CoverAcross(double across) const {
    if (across > halfWidth - 0.5) return Clamp01(0.5 + halfWidth - across);
    if (across < -halfWidth + 0.5) return Clamp01(0.5 + halfWidth + across);
    return 1;
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

Shape Line(PointD const& from, PointD const& to, MKPaint const& paint) {
    double const length = std::hypot(to.x - from.x, to.y - from.y);
    PointD const d{(to.x - from.x) / length, (to.y - from.y) / length};
    LineGeometry const line = Measure(length, paint);
    double const reach = line.halfWidth + 0.5;
    RectF const ends(static_cast<float>(from.x), static_cast<float>(from.y), static_cast<float>(to.x),
                     static_cast<float>(to.y));
    bool const endIsOpen = line.dashed && line.IsEndOpen();
    // Both ways from the corner of the quad: further than its sides reach.
    return {Grown(Sorted(ends), 1.5 * reach), [=](PointD const& p) -> Coverage {
                double const along = (p.x - from.x) * d.x + (p.y - from.y) * d.y;
                double const across = (p.y - from.y) * d.x - (p.x - from.x) * d.y;
                if (!(along >= -reach && along <= length + reach && std::abs(across) <= reach)) return {};
                return Fragment{std::min(line.CoverAlong(along, across), line.CoverAcross(across)),
                                endIsOpen && along > length - reach};
            }};
}

} // namespace Moka::Testing
