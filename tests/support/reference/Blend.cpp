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

Rgba TakeSource(Rgba const& s, Rgba const&) { return s; }

Rgba Unpremultiplied(Rgba const& c) {
    if (c.a == 0) return {};
    return {c.r / c.a, c.g / c.a, c.b / c.a, c.a};
}

// The modes that are none of these draw as SrcOver, also unknown numbers.
constexpr struct {
    int mode;
    Rgba (*blend)(Rgba const& s, Rgba const& d);
} kModes[] = {
    {MKPaint::Add, [](Rgba const& s, Rgba const& d) { return Mix(s, 1, d, 1, s.a + d.a); }},
    {MKPaint::Clear, [](Rgba const&, Rgba const&) { return Rgba(); }},
    {MKPaint::Dst, [](Rgba const&, Rgba const& d) { return d; }},
    {MKPaint::DstAtop, [](Rgba const& s, Rgba const& d) { return Mix(s, 1 - d.a, d, s.a, s.a); }},
    {MKPaint::DstIn, [](Rgba const& s, Rgba const& d) { return Mix(s, 0, d, s.a, d.a * s.a); }},
    {MKPaint::DstOut, [](Rgba const& s, Rgba const& d) { return Mix(s, 0, d, 1 - s.a, d.a * (1 - s.a)); }},
    // Not symmetric to SrcOver: the source's alpha is weighed by itself.
    {MKPaint::DstOver,
     [](Rgba const& s, Rgba const& d) { return Mix(s, 1 - d.a, d, 1, s.a * (1 - s.a) + d.a); }},
    {MKPaint::Modulate,
     [](Rgba const& s, Rgba const& d) { return Rgba(s.r * d.r, s.g * d.g, s.b * d.b, s.a * d.a); }},
    {MKPaint::Src, TakeSource},
    {MKPaint::Darken, TakeSource},
    {MKPaint::Lighten, TakeSource},
    {MKPaint::BlendingOff, TakeSource},
    {MKPaint::SrcAtop, [](Rgba const& s, Rgba const& d) { return Mix(s, d.a, d, 1 - s.a, d.a); }},
    {MKPaint::SrcIn, [](Rgba const& s, Rgba const& d) { return Mix(s, d.a, d, 0, s.a * d.a); }},
    {MKPaint::SrcOut, [](Rgba const& s, Rgba const& d) { return Mix(s, 1 - d.a, d, 0, s.a * (1 - d.a)); }},
    {MKPaint::SrcKeepDstAlpha, [](Rgba const& s, Rgba const& d) { return Mix(s, 1, d, 0, d.a); }},
    {MKPaint::SrcNonPremultiplied, [](Rgba const& s, Rgba const& d) { return Mix(s, s.a, d, 0, s.a); }},
    {MKPaint::SrcOverNonPremultiplied,
     [](Rgba const& s, Rgba const& d) { return Mix(s, s.a, d, 1 - s.a, s.a + d.a * (1 - s.a)); }},
};

} // namespace

double Distance(Rgba const& a, Rgba const& b) {
    return std::max({std::abs(a.r - b.r), std::abs(a.g - b.g), std::abs(a.b - b.b), std::abs(a.a - b.a)});
}

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
    Rgba const s = Clamped(source);
    for (auto const& known : kModes) {
        if (known.mode == mode) return Clamped(known.blend(s, destination));
    }
    return Clamped(Mix(s, 1, destination, 1 - s.a, s.a + destination.a * (1 - s.a)));
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
