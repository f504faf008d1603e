#include "apps/samples/Ink.h"

namespace Moka::Samples {
namespace {

constexpr float kStep = 1.5f; // pixels between the points of a smoothed curve

struct Box {
    int left;
    int top;
    int right;
    int bottom;
};

Box BoxOf(InkPoint const& point) {
    float const reach = point.width / 2 + 1;
    return {static_cast<int>(std::floor(point.at.x - reach)),
            static_cast<int>(std::floor(point.at.y - reach)), static_cast<int>(std::ceil(point.at.x + reach)),
            static_cast<int>(std::ceil(point.at.y + reach))};
}

Box Join(Box const& a, Box const& b) {
    return {std::min(a.left, b.left), std::min(a.top, b.top), std::max(a.right, b.right),
            std::max(a.bottom, b.bottom)};
}

Box BoxOf(Stroke const& stroke) {
    Box all = BoxOf(stroke.front());
    for (InkPoint const& point : stroke) all = Join(all, BoxOf(point));
    return all;
}

// To the edge of a line that widens evenly from a to b.
float Distance(Spot p, InkPoint const& a, InkPoint const& b) {
    float const dx = b.at.x - a.at.x;
    float const dy = b.at.y - a.at.y;
    float const length = dx * dx + dy * dy;
    float const along =
        length > 0 ? std::clamp(((p.x - a.at.x) * dx + (p.y - a.at.y) * dy) / length, 0.0f, 1.0f) : 0;
    return std::hypot(p.x - a.at.x - dx * along, p.y - a.at.y - dy * along) -
           Mix(a.width, b.width, along) / 2;
}

// Catmull-Rom: a cubic through b and c whose directions there follow their neighbours.
float Spline(float a, float b, float c, float d, float t) {
    return b + 0.5f * t * (c - a + t * (2 * a - 5 * b + 4 * c - d + t * (3 * (b - c) + d - a)));
}

} // namespace

void DrawStroke(Picture& picture, Stroke const& stroke, Color const& color) {
    if (stroke.empty()) return;
    Box const box = BoxOf(stroke);
    int const columns = box.right - box.left;
    std::vector<float> mask(static_cast<std::size_t>(columns) *
                            static_cast<std::size_t>(box.bottom - box.top));
    auto const at = [&](int x, int y) -> float& {
        return mask[static_cast<std::size_t>(y - box.top) * static_cast<std::size_t>(columns) +
                    static_cast<std::size_t>(x - box.left)];
    };
    for (std::size_t i = 0; i < stroke.size(); ++i) {
        InkPoint const& a = stroke[i > 0 ? i - 1 : 0];
        InkPoint const& b = stroke[i];
        Box const part = Join(BoxOf(a), BoxOf(b));
        for (int y = part.top; y < part.bottom; ++y) {
            for (int x = part.left; x < part.right; ++x) {
                Spot const centre{static_cast<float>(x) + 0.5f, static_cast<float>(y) + 0.5f};
                at(x, y) = std::max(at(x, y), Cover(Distance(centre, a, b)));
            }
        }
    }
    for (int y = box.top; y < box.bottom; ++y)
        for (int x = box.left; x < box.right; ++x) picture.Blend(x, y, color, at(x, y));
}

Stroke SmoothThrough(std::vector<Spot> const& points, float width) {
    Stroke stroke;
    for (std::size_t i = 0; i + 1 < points.size(); ++i) {
        Spot const& a = points[i > 0 ? i - 1 : 0];
        Spot const& b = points[i];
        Spot const& c = points[i + 1];
        Spot const& d = points[std::min(i + 2, points.size() - 1)];
        int const steps = std::max(1, static_cast<int>(std::hypot(c.x - b.x, c.y - b.y) / kStep));
        for (int s = 0; s < steps; ++s) {
            float const t = static_cast<float>(s) / static_cast<float>(steps);
            stroke.push_back({{Spline(a.x, b.x, c.x, d.x, t), Spline(a.y, b.y, c.y, d.y, t)}, width});
        }
    }
    if (!points.empty()) stroke.push_back({points.back(), width});
    return stroke;
}

void DrawMarker(Picture& picture, Spot from, Spot to, float height, Color const& color) {
    float const length = to.x - from.x;
    auto const paint = [&](int x, int y) {
        float const t = (static_cast<float>(x) + 0.5f - from.x) / length;
        float const middle = Mix(from.y, to.y, t) + 2 * (Noise(t * 6, 0, 91) - 0.5f);
        float const aside = std::abs(static_cast<float>(y) + 0.5f - middle) - height / 2;
        float const ends = std::max(-t, t - 1) * length - 3 * Noise(static_cast<float>(y) * 0.2f, 0, 92);
        Color result = color;
        result.a *= Cover(std::max(aside, ends));
        return result;
    };
    int const top = static_cast<int>(std::min(from.y, to.y) - height);
    int const bottom = static_cast<int>(std::max(from.y, to.y) + height);
    picture.BlendEach(static_cast<int>(from.x) - 6, top, static_cast<int>(to.x) + 7, bottom, paint);
}

} // namespace Moka::Samples
