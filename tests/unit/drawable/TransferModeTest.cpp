// What the transfer modes mean to the renderer, as the pixels that come out.
#include "moka/graphics/drawable/MKGraphicsUtil.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

// One colour channel and alpha.
struct Pixel {
    double color;
    double alpha;
};

double FactorOf(BlendingFactor factor, Pixel const& s, Pixel const& d) {
    // In the order of the enumeration.
    double const values[] = {0, 1, s.color, s.alpha, 1 - s.alpha, d.alpha, 1 - d.alpha};
    return values[static_cast<int>(factor)];
}

// As the blender computes it; no mode has a colour factor in its alpha equation.
Pixel Blend(BlendStateDescriptor const& state, Pixel const& s, Pixel const& d) {
    if (!state.IsBlending()) return s;
    auto const& c = state.GetColorEquation();
    auto const& a = state.GetAlphaEquation();
    return {s.color * FactorOf(c.source, s, d) + d.color * FactorOf(c.destination, s, d),
            s.alpha * FactorOf(a.source, s, d) + d.alpha * FactorOf(a.destination, s, d)};
}

// s times f plus d times g.
Pixel Mix(Pixel s, double f, Pixel d, double g) {
    return {s.color * f + d.color * g, s.alpha * f + d.alpha * g};
}

Pixel Expected(int mode, Pixel s, Pixel d) {
    double const outOfSource = 1 - s.alpha;
    double const outOfDestination = 1 - d.alpha;
    Pixel const rows[] = {
        Mix(s, 1, d, 1),
        {0, 0},
        d,
        Mix(s, outOfDestination, d, s.alpha),
        Mix(s, 0, d, s.alpha),
        Mix(s, 0, d, outOfSource),
        {d.color + s.color * outOfDestination, d.alpha + s.alpha * outOfSource}, // the odd alpha pair
        {s.color * d.color, s.alpha * d.alpha},
        s,
        Mix(s, d.alpha, d, outOfSource),
        Mix(s, d.alpha, d, 0),
        Mix(s, outOfDestination, d, 0),
        Mix(s, 1, d, outOfSource),
        {s.color, d.alpha},
        {s.color * s.alpha, s.alpha},
        {s.color * s.alpha + d.color * outOfSource, s.alpha + d.alpha * outOfSource},
        s,
        s,
        s,
    };
    return mode >= 0 && mode <= 18 ? rows[mode] : rows[12];
}

TEST(TransferModeTest, EachBlendsAsItsNameSaysAndAnyOtherNumberIsSourceOver) {
    Pixel const d{0.25, 0.7};
    for (int mode : {-1, 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 18, 19, 1000000}) {
        auto const state = MKGraphicsUtil::GetBlendingStateDescriptor(static_cast<MKPaint::XFermode>(mode));
        EXPECT_TRUE(state.IsColorWrite());
        EXPECT_EQ(state.IsBlending(), mode != MKPaint::BlendingOff);
        for (Pixel const s : {Pixel{0.3, 0.4}, Pixel{0.5, 0.9}}) {
            EXPECT_NEAR(Blend(state, s, d).color, Expected(mode, s, d).color, 1e-9) << mode;
            EXPECT_NEAR(Blend(state, s, d).alpha, Expected(mode, s, d).alpha, 1e-9) << mode;
        }
    }
}

} // namespace
} // namespace Moka::Testing
