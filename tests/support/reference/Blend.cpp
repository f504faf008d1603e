#include "tests/support/reference/Blend.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

double Clamp01(double v) { return std::min(std::max(v, 0.0), 1.0); }

// Colours scaled and added; the alpha is given apart.
Rgba Mix(Rgba const& s, double ks, Rgba const& d, double kd, double alpha) {
    return {s.r * ks + d.r * kd, s.g * ks + d.g * kd, s.b * ks + d.b * kd, alpha};
}

Rgba Unpremultiplied(Rgba const& c) {
    if (c.a == 0) return {};
    return {c.r / c.a, c.g / c.a, c.b / c.a, c.a};
}

Rgba BlendUnclamped(int mode, Rgba const& s, Rgba const& d) {
    switch (mode) {
    case MKPaint::Add:
        return Mix(s, 1, d, 1, s.a + d.a);
    case MKPaint::Clear:
        return {};
    case MKPaint::Dst:
        return d;
    case MKPaint::DstAtop:
        return Mix(s, 1 - d.a, d, s.a, s.a);
    case MKPaint::DstIn:
        return Mix(s, 0, d, s.a, d.a * s.a);
    case MKPaint::DstOut:
        return Mix(s, 0, d, 1 - s.a, d.a * (1 - s.a));
    // Not symmetric to SrcOver: the source's alpha is weighed by itself.
    case MKPaint::DstOver:
        return Mix(s, 1 - d.a, d, 1, s.a * (1 - s.a) + d.a);
    case MKPaint::Modulate:
        return {s.r * d.r, s.g * d.g, s.b * d.b, s.a * d.a};
    case MKPaint::Src:
    case MKPaint::Darken:
    case MKPaint::Lighten:
    case MKPaint::BlendingOff:
        return s;
    case MKPaint::SrcAtop:
        return Mix(s, d.a, d, 1 - s.a, d.a);
    case MKPaint::SrcIn:
        return Mix(s, d.a, d, 0, s.a * d.a);
    case MKPaint::SrcOut:
        return Mix(s, 1 - d.a, d, 0, s.a * (1 - d.a));
    case MKPaint::SrcKeepDstAlpha:
        return Mix(s, 1, d, 0, d.a);
    case MKPaint::SrcNonPremultiplied:
        return Mix(s, s.a, d, 0, s.a);
    case MKPaint::SrcOverNonPremultiplied:
        return Mix(s, s.a, d, 1 - s.a, s.a + d.a * (1 - s.a));
    default:
        return Mix(s, 1, d, 1 - s.a, s.a + d.a * (1 - s.a)); // SrcOver, also for unknown numbers
    }
}

} // namespace

Rgba FromBytes(Color const& c) { return {c[0] / 255.0, c[1] / 255.0, c[2] / 255.0, c[3] / 255.0}; }

Color ToBytes(Rgba const& c) {
    auto const byte = [](double v) { return static_cast<unsigned char>(std::lround(Clamp01(v) * 255)); };
    return {byte(c.r), byte(c.g), byte(c.b), byte(c.a)};
}

Rgba RoundedToBytes(Rgba const& c) { return FromBytes(ToBytes(c)); }

Rgba Clamped(Rgba const& c) { return {Clamp01(c.r), Clamp01(c.g), Clamp01(c.b), Clamp01(c.a)}; }

Rgba PaintColor(MKPaint const& paint, double coverage) {
    Rgba color(paint.GetColor());
    double alpha = coverage * color.a;
    if (paint.HasTintColor()) {
        color = Rgba(paint.GetTintColor());
        alpha *= color.a;
    }
    return {color.r * alpha, color.g * alpha, color.b * alpha, alpha};
}

Rgba Blend(int mode, Rgba const& source, Rgba const& destination) {
    return Clamped(BlendUnclamped(mode, Clamped(source), destination));
}

Rgba DarkenOrLighten(bool darken, Rgba const& source, Rgba const& destination) {
    Rgba const s = Unpremultiplied(source);
    Rgba const d = Unpremultiplied(destination);
    double const both = s.a * d.a;
    double const sourceOnly = s.a * (1 - d.a);
    double const destinationOnly = d.a * (1 - s.a);
    auto const channel = [&](double sc, double dc) {
        return (darken ? std::min(sc, dc) : std::max(sc, dc)) * both + sc * sourceOnly + dc * destinationOnly;
    };
    return Clamped(
        {channel(s.r, d.r), channel(s.g, d.g), channel(s.b, d.b), both + sourceOnly + destinationOnly});
}

} // namespace Moka::Testing
