#include "apps/notebook/Ink.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {
namespace {

constexpr int kHalvings = 24; // bisections of a segment, down to 1/16,000,000 of its length

float GetDistance(PointF const& a, PointF const& b, float x, float y) {
    float const dx = b.x - a.x;
    float const dy = b.y - a.y;
    float const square = dx * dx + dy * dy;
    float const t = square > 0 ? std::clamp(((x - a.x) * dx + (y - a.y) * dy) / square, 0.0f, 1.0f) : 0.0f;
    return std::hypot(x - a.x - t * dx, y - a.y - t * dy);
}

InkPoint Mix(InkPoint const& a, InkPoint const& b, float t) {
    return {a.x + (b.x - a.x) * t, a.y + (b.y - a.y) * t, a.width + (b.width - a.width) * t};
}

// Returns the parameter of the segment's point with the least distance. The distance is convex along the segment, so a
// ternary search finds it.
float FindNearest(Swipe const& swipe, InkPoint const& a, InkPoint const& b) {
    auto const distance = [&](float t) {
        InkPoint const p = Mix(a, b, t);
        return GetDistance(swipe.from, swipe.to, p.x, p.y);
    };
    float low = 0;
    float high = 1;
    for (int i = 0; i < 2 * kHalvings; ++i) {
        float const third = (high - low) / 3;
        if (distance(low + third) <= distance(high - third))
            high -= third;
        else
            low += third;
    }
    return (low + high) / 2;
}

// Returns the end of the erased part between `inside` and `outside`, which are parameters of the segment.
float FindEdge(Swipe const& swipe, InkPoint const& a, InkPoint const& b, float inside, float outside) {
    for (int i = 0; i < kHalvings; ++i) {
        float const middle = (inside + outside) / 2;
        InkPoint const p = Mix(a, b, middle);
        (GetDistance(swipe.from, swipe.to, p.x, p.y) < swipe.radius ? inside : outside) = middle;
    }
    return outside;
}

} // namespace

float RoundForFile(float value) {
    return static_cast<float>(std::round(static_cast<double>(value) * 100) / 100);
}

RectF GetBounds(InkPoints const& points) {
    if (points.empty()) return {};
    RectF bounds(points[0].x, points[0].y, points[0].x, points[0].y);
    for (InkPoint const& p : points) {
        float const r = p.width / 2 + 1; // 1 for the soft edge
        bounds.MakeRect(p.x - r, p.y - r);
        bounds.MakeRect(p.x + r, p.y + r);
    }
    return bounds;
}

RectF Unite(RectF const& a, RectF const& b) {
    if (a.IsEmpty()) return b;
    if (b.IsEmpty()) return a;
    return {std::min(a.left, b.left), std::min(a.top, b.top), std::max(a.right, b.right),
            std::max(a.bottom, b.bottom)};
}

bool Overlaps(RectF const& a, RectF const& b) {
    return a.left < b.right && b.left < a.right && a.top < b.bottom && b.top < a.bottom;
}

RectF Swipe::GetBounds() const {
    RectF bounds(from.x, from.y, from.x, from.y);
    bounds.MakeRect(to.x, to.y);
    bounds.IncreaseRect(radius, radius);
    return bounds;
}

bool Swipe::Touches(InkPoints const& points) const {
    for (std::size_t i = 0; i < points.size(); ++i) {
        InkPoint const& a = points[i];
        InkPoint const& b = points[std::min(i + 1, points.size() - 1)];
        InkPoint const nearest = Mix(a, b, FindNearest(*this, a, b));
        if (GetDistance(from, to, nearest.x, nearest.y) < radius + nearest.width / 2) return true;
    }
    return false;
}

std::vector<InkPoints> Swipe::Cut(InkPoints const& points) const {
    std::vector<InkPoints> pieces;
    InkPoints piece;
    auto const finish = [&] {
        if (!piece.empty()) pieces.push_back(std::move(piece));
        piece.clear();
    };
    auto const isErased = [this](InkPoint const& p) { return GetDistance(from, to, p.x, p.y) < radius; };
    for (std::size_t i = 0; i < points.size(); ++i) {
        if (isErased(points[i]))
            finish();
        else
            piece.push_back(points[i]);
        if (i + 1 == points.size()) break;
        InkPoint const& a = points[i];
        InkPoint const& b = points[i + 1];
        float const nearest = FindNearest(*this, a, b);
        if (!isErased(Mix(a, b, nearest))) continue;
        if (!isErased(a)) piece.push_back(Mix(a, b, FindEdge(*this, a, b, nearest, 0)));
        finish();
        if (!isErased(b)) piece.push_back(Mix(a, b, FindEdge(*this, a, b, nearest, 1)));
    }
    finish();
    return pieces;
}

bool IsInside(std::vector<PointF> const& polygon, float x, float y) {
    bool isInside = false;
    for (std::size_t i = 0, j = polygon.size() - 1; i < polygon.size(); j = i++) {
        PointF const& a = polygon[i];
        PointF const& b = polygon[j];
        if ((a.y > y) != (b.y > y) && x < (b.x - a.x) * (y - a.y) / (b.y - a.y) + a.x) isInside = !isInside;
    }
    return isInside;
}

bool IsMostlyInside(std::vector<PointF> const& polygon, InkPoints const& points) {
    auto const count = std::count_if(points.begin(), points.end(),
                                     [&](InkPoint const& p) { return IsInside(polygon, p.x, p.y); });
    return !points.empty() && static_cast<std::size_t>(count) * 2 >= points.size();
}

InkPoints Placement::Apply(InkPoints points) const {
    for (InkPoint& p : points)
        p = {RoundForFile(p.x * scale + dx), RoundForFile(p.y * scale + dy), RoundForFile(p.width * scale)};
    return points;
}

} // namespace Moka::Notebook
