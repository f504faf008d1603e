// Blend.h: what a pixel becomes, from the blend equations. Premultiplied, components 0 ... 1, not rounded.
#pragma once

#include "moka/graphics/canvas/MKPaint.h"
#include "tests/support/TestImages.h"

namespace Moka::Testing {

struct Rgba {
    Rgba() = default;
    Rgba(double red, double green, double blue, double alpha) : r(red), g(green), b(blue), a(alpha) {}
    explicit Rgba(Vector4<float> const& v) : r(double{v.x}), g(double{v.y}), b(double{v.z}), a(double{v.w}) {}

    double r = 0;
    double g = 0;
    double b = 0;
    double a = 0;
};

double Distance(Rgba const& a, Rgba const& b); // in the channel that differs most
Rgba FromBytes(Color const& color);
Color ToBytes(Rgba const& color); // clamped, to the nearest
Rgba RoundedToBytes(Rgba const& color);
Rgba Clamped(Rgba const& color);

// The paint's colour over part of a pixel, premultiplied; a tint takes the place of the colour and keeps
// both alphas.
Rgba PaintColor(MKPaint const& paint, double coverage);

// The source is clamped first, as a target of bytes does.
Rgba Blend(int mode, Rgba const& source, Rgba const& destination);

// The composite of a bitmap's pixel under Darken or Lighten.
Rgba DarkenOrLighten(bool darken, Rgba const& source, Rgba const& destination);

} // namespace Moka::Testing
