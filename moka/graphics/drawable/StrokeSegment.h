// StrokeSegment.h: points and segments of a stroke, in double precision.
// Thread: any.
// Units:  canvas pixels.
#pragma once

#include <algorithm>
#include <cmath>

namespace Moka::detail {

// A stroke thinner than a device pixel fades and shows deviations less, so tolerances grow, down to this
// width.
constexpr double kThinnestStroke = 0.25;

struct StrokeNode {
    double x;
    double y;
    double radius;
};

// The size of a device pixel in canvas pixels: between fine and coarse, which are powers of two.
struct StrokeScale {
    double coarse = 1;
    double fine = 1;
    bool isEven = true; // the size is the same in all directions

    friend bool operator==(StrokeScale const& a, StrokeScale const& b) {
        return a.coarse == b.coarse && a.fine == b.fine && a.isEven == b.isEven;
    }
};

// All discs between two discs: their hull, bounded by the tangents to both.
struct StrokeSegment {
    StrokeNode a;
    StrokeNode b;

    struct Nearest {
        double distance; // from the centre of a disc
        double radius;   // of that disc
    };

    // Returns the disc whose edge is nearest to the point. The shader uses the same formula.
    Nearest Find(double x, double y) const {
        double const lineX = b.x - a.x;
        double const lineY = b.y - a.y;
        double const growth = b.radius - a.radius;
        double const square = lineX * lineX + lineY * lineY;
        double const rest = square - growth * growth;
        double t = growth > 0 ? 1 : 0;
        if (rest > 0) {
            double const along = (x - a.x) * lineX + (y - a.y) * lineY;
            double const across = std::fabs((x - a.x) * lineY - (y - a.y) * lineX);
            t = std::clamp((along + across * growth / std::sqrt(rest)) / square, 0.0, 1.0);
        }
        return Measure(x, y, t);
    }
    // Returns the disc whose centre is nearest to the point.
    Nearest FindCenter(double x, double y) const {
        double const lineX = b.x - a.x;
        double const lineY = b.y - a.y;
        double const square = lineX * lineX + lineY * lineY;
        double const along = (x - a.x) * lineX + (y - a.y) * lineY;
        return Measure(x, y, square > 0 ? std::clamp(along / square, 0.0, 1.0) : 0.0);
    }
    // Returns the distance of the point from the segment's edge; negative inside.
    double GetEdge(double x, double y) const {
        Nearest const nearest = Find(x, y);
        return nearest.distance - nearest.radius;
    }
    // Returns a lower bound of the distance of the line from a square around the point.
    double GetGap(double x, double y, double half) const {
        double const lineX = b.x - a.x;
        double const lineY = b.y - a.y;
        double const beside = std::max(std::min(a.x, b.x) - x, x - std::max(a.x, b.x)) - half;
        double const above = std::max(std::min(a.y, b.y) - y, y - std::max(a.y, b.y)) - half;
        double const ends = std::hypot(std::max(beside, 0.0), std::max(above, 0.0));
        double const length = GetLength();
        if (length == 0) return ends;
        double const across = std::fabs((x - a.x) * lineY - (y - a.y) * lineX);
        return std::max(ends, (across - half * (std::fabs(lineX) + std::fabs(lineY))) / length);
    }
    double GetLength() const { return std::hypot(b.x - a.x, b.y - a.y); }
    double GetGreatestRadius() const { return std::max(a.radius, b.radius); }
    double GetLeastRadius() const { return std::min(a.radius, b.radius); }

private:
    Nearest Measure(double x, double y, double t) const {
        return {std::hypot(x - a.x - (b.x - a.x) * t, y - a.y - (b.y - a.y) * t),
                a.radius + (b.radius - a.radius) * t};
    }
};

} // namespace Moka::detail
