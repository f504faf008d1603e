#include "tests/support/reference/ReferenceDraw.h"

#include <algorithm>
#include <cmath>

namespace Moka::Testing {
namespace {

// How far, in steps of 255, the picture may bend over that distance and still be a ramp and no jump.
constexpr double kLargestBend = 3;
// How far off an exact blend a target of bytes may come out: one step, and half of one for storing it. What
// takes the target's place as it is, is only stored.
constexpr double kBlending = 1.5;
constexpr double kStoring = 0.6;

// In steps of 255.
double Distance(Rgba const& a, Rgba const& b) {
    return 255 *
           std::max({std::abs(a.r - b.r), std::abs(a.g - b.g), std::abs(a.b - b.b), std::abs(a.a - b.a)});
}

double Bend(Rgba const& before, Rgba const& at, Rgba const& after) {
    return Distance({before.r + after.r, before.g + after.g, before.b + after.b, before.a + after.a},
                    {2 * at.r, 2 * at.g, 2 * at.b, 2 * at.a});
}

// One step off in every channel.
Rgba Nudged(Rgba const& c) {
    auto const nudge = [](double v) { return v > 0.5 ? v - 1.0 / 255 : v + 1.0 / 255; };
    return {nudge(c.r), nudge(c.g), nudge(c.b), nudge(c.a)};
}

std::optional<Ink> Touch(Brush const& brush, PointD const& p) {
    RectD const r(brush.bounds);
    bool const inside = p.x >= r.left && p.x <= r.right && p.y >= r.top && p.y <= r.bottom;
    return inside ? brush.at(p) : std::nullopt;
}

bool IsUpright(Matrix3f const& m) { return m[1] == 0 && m[2] == 0 && m[3] == 0 && m[5] == 0; }

} // namespace

// Edges along the pixels' rows and columns meet exactly wherever they end.
ReferenceDraw::ReferenceDraw(Painting const& painting, ClipSet const& clip, int subpixelBits)
    : mPainting(painting),
      mClip(clip),
      mTransform(painting.matrix),
      mIsCoarse(subpixelBits < 8),
      mShift(2.5 / (2 << subpixelBits)),
      mHasSeams(painting.arePieces && !IsUpright(painting.matrix)) {}

ReferencePixel ReferenceDraw::Apply(int x, int y, ReferencePixel const& before,
                                    Brushes const& brushes) const {
    ReferencePixel pixel = Store({x, y, 0, 0}, before, brushes);
    double const jump = GetJump(x, y, before.color, brushes);
    if (jump > 0) pixel.slack = std::min(255, pixel.slack + static_cast<int>(std::ceil(jump)));
    if (mHasSeams && IsOnSeam(x, y, brushes)) pixel.slack = 255;
    return pixel;
}

// The point on the shapes that shows there.
std::optional<PointD> ReferenceDraw::Find(View const& view) const {
    PointD const place{view.x + 0.5 + view.dx, view.y + 0.5 + view.dy};
    if (!mClip.Contains(view.x, view.y, place)) return {};
    return mTransform.Unmap(place);
}

Rgba ReferenceDraw::Mix(std::optional<Ink> const& ink, Rgba const& current, Rgba const& before) const {
    if (!ink) return current;
    if (!mPainting.composes) return Blend(mPainting.mode, ink->color, current);
    return DarkenOrLighten(mPainting.mode == MKPaint::Darken, ink->color, before);
}

// Exactly, without storing it between the shapes.
Rgba ReferenceDraw::Evaluate(View const& view, Rgba const& before, Brushes const& brushes) const {
    auto const p = Find(view);
    Rgba color = before;
    if (!p) return color;
    for (Brush const* brush : brushes) color = Mix(Touch(*brush, *p), color, before);
    return color;
}

ReferencePixel ReferenceDraw::Store(View const& view, ReferencePixel const& before,
                                    Brushes const& brushes) const {
    auto const p = Find(view);
    ReferencePixel pixel = before;
    if (!p) return pixel;
    for (Brush const* brush : brushes) {
        auto const ink = Touch(*brush, *p);
        Rgba const basis = mPainting.composes ? before.color : pixel.color;
        Rgba const exact = Mix(ink, basis, basis);
        double const blur = brush->blur ? GetBlur(*brush, *p, exact, basis) : 0;
        if (!ink && blur == 0) continue;
        Rgba const stored = RoundedToBytes(exact);
        double const shown = Distance(Mix(ink, Nudged(basis), Nudged(basis)), exact);
        bool const blends = shown > 0 || brush->blur || mPainting.mode == MKPaint::SrcNonPremultiplied;
        double const slack = pixel.slack * shown + (blends ? kBlending : kStoring) + Distance(stored, exact) +
                             blur + (ink ? ink->slack : 0) + 1e-3;
        pixel.slack = static_cast<int>(std::min(slack, 255.0));
        pixel.color = stored;
    }
    return pixel;
}

double ReferenceDraw::GetBlur(Brush const& brush, PointD const& p, Rgba const& exact,
                              Rgba const& basis) const {
    double sum = 0;
    for (PointD const& d : *brush.blur) {
        sum += std::max(Distance(Mix(Touch(brush, {p.x + d.x, p.y + d.y}), basis, basis), exact),
                        Distance(Mix(Touch(brush, {p.x - d.x, p.y - d.y}), basis, basis), exact));
    }
    return sum;
}

// How far the picture jumps where the centre may be found; a coarse rasteriser moves ramps as well.
double ReferenceDraw::GetJump(int x, int y, Rgba const& before, Brushes const& brushes) const {
    Rgba const here = Evaluate({x, y, 0, 0}, before, brushes);
    double jump = 0;
    for (PointD const& d : {PointD{mShift, 0}, PointD{0, mShift}}) {
        Rgba const one = Evaluate({x, y, -d.x, -d.y}, before, brushes);
        Rgba const other = Evaluate({x, y, d.x, d.y}, before, brushes);
        if (!mIsCoarse && Bend(one, here, other) <= kLargestBend) continue;
        jump += std::max(Distance(one, here), Distance(other, here));
    }
    return jump;
}

// A pixel there may be drawn by both pieces or by none.
bool ReferenceDraw::IsOnSeam(int x, int y, Brushes const& brushes) const {
    auto const findPiece = [&](double dx, double dy) -> Brush const* {
        auto const p = Find({x, y, dx, dy});
        if (!p) return nullptr;
        auto const piece =
            std::find_if(brushes.begin(), brushes.end(), [&](Brush const* b) { return Touch(*b, *p); });
        return piece == brushes.end() ? nullptr : *piece;
    };
    return findPiece(-mShift, 0) != findPiece(mShift, 0) || findPiece(0, -mShift) != findPiece(0, mShift);
}

} // namespace Moka::Testing
