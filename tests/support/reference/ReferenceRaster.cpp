#include "tests/support/reference/ReferenceRaster.h"

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
double CountSteps(Rgba const& a, Rgba const& b) { return 255 * Distance(a, b); }

double Bend(Rgba const& before, Rgba const& at, Rgba const& after) {
    return CountSteps({before.r + after.r, before.g + after.g, before.b + after.b, before.a + after.a},
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

struct ReferencePixel {
    Rgba color; // as bytes hold it
    int slack = 0;
};

// What one draw makes of one pixel, and how far off that may be.
class PixelDraw {
public:
    // Of the painting's brushes those that may reach the pixel.
    using Brushes = std::vector<Brush const*>;

    // Both outlive it. The rasteriser knows positions to so many binary digits below the pixel: eight, as most
    // have, or fewer. Edges along the pixels' rows and columns meet exactly wherever they end.
    PixelDraw(Painting const& painting, ClipSet const& clip, int subpixelBits)
        : mPainting(painting),
          mClip(clip),
          mTransform(painting.matrix),
          mIsCoarse(subpixelBits < 8),
          mShift(2.5 / (2 << subpixelBits)),
          mHasSeams(painting.arePieces && !IsUpright(painting.matrix)) {}

    ReferencePixel Apply(int x, int y, ReferencePixel const& before, Brushes const& brushes) const {
        ReferencePixel pixel = Store({x, y, 0, 0}, before, brushes);
        double const jump = GetJump(x, y, before.color, brushes);
        if (jump > 0) pixel.slack = std::min(255, pixel.slack + static_cast<int>(std::ceil(jump)));
        if (mHasSeams && IsOnSeam(x, y, brushes)) pixel.slack = 255;
        return pixel;
    }

private:
    // A pixel, seen from a place near its centre.
    struct View {
        int x, y;
        double dx, dy;
    };

    // The point on the shapes that shows there.
    std::optional<PointD> Find(View const& view) const {
        PointD const place{view.x + 0.5 + view.dx, view.y + 0.5 + view.dy};
        if (!mClip.Contains(view.x, view.y, place)) return {};
        return mTransform.Unmap(place);
    }

    Rgba Mix(std::optional<Ink> const& ink, Rgba const& current, Rgba const& before) const {
        if (!ink) return current;
        if (!mPainting.composes) return Blend(mPainting.mode, ink->color, current);
        return DarkenOrLighten(mPainting.mode == MKPaint::Darken, ink->color, before);
    }

    // Exactly, without storing it between the shapes.
    Rgba Evaluate(View const& view, Rgba const& before, Brushes const& brushes) const {
        auto const p = Find(view);
        Rgba color = before;
        if (!p) return color;
        for (Brush const* brush : brushes) color = Mix(Touch(*brush, *p), color, before);
        return color;
    }

    ReferencePixel Store(View const& view, ReferencePixel const& before, Brushes const& brushes) const {
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
            double const shown = CountSteps(Mix(ink, Nudged(basis), Nudged(basis)), exact);
            bool const blends = shown > 0 || brush->blur || mPainting.mode == MKPaint::SrcNonPremultiplied;
            double const slack = pixel.slack * shown + (blends ? kBlending : kStoring) +
                                 CountSteps(stored, exact) + blur + (ink ? ink->slack : 0) + 1e-3;
            pixel.slack = static_cast<int>(std::min(slack, 255.0));
            pixel.color = stored;
        }
        return pixel;
    }

    double GetBlur(Brush const& brush, PointD const& p, Rgba const& exact, Rgba const& basis) const {
        double sum = 0;
        for (PointD const& d : *brush.blur) {
            sum += std::max(CountSteps(Mix(Touch(brush, {p.x + d.x, p.y + d.y}), basis, basis), exact),
                            CountSteps(Mix(Touch(brush, {p.x - d.x, p.y - d.y}), basis, basis), exact));
        }
        return sum;
    }

    // How far the picture jumps where the centre may be found; a coarse rasteriser moves ramps as well.
    double GetJump(int x, int y, Rgba const& before, Brushes const& brushes) const {
        Rgba const here = Evaluate({x, y, 0, 0}, before, brushes);
        double jump = 0;
        for (PointD const& d : {PointD{mShift, 0}, PointD{0, mShift}}) {
            Rgba const one = Evaluate({x, y, -d.x, -d.y}, before, brushes);
            Rgba const other = Evaluate({x, y, d.x, d.y}, before, brushes);
            if (!mIsCoarse && Bend(one, here, other) <= kLargestBend) continue;
            jump += std::max(CountSteps(one, here), CountSteps(other, here));
        }
        return jump;
    }

    // A pixel there may be drawn by both pieces or by none.
    bool IsOnSeam(int x, int y, Brushes const& brushes) const {
        auto const findPiece = [&](double dx, double dy) -> Brush const* {
            auto const p = Find({x, y, dx, dy});
            if (!p) return nullptr;
            auto const piece =
                std::find_if(brushes.begin(), brushes.end(), [&](Brush const* b) { return Touch(*b, *p); });
            return piece == brushes.end() ? nullptr : *piece;
        };
        return findPiece(-mShift, 0) != findPiece(mShift, 0) || findPiece(0, -mShift) != findPiece(0, mShift);
    }

    Painting const& mPainting;
    ClipSet const& mClip;
    Transform const mTransform;
    bool const mIsCoarse;
    double const mShift; // how far off it may see a pixel's centre
    bool const mHasSeams;
};

// A brush and the pixels it may reach.
struct Reach {
    Brush const* brush;
    Rect pixels;
};

std::vector<Reach> FindReach(Transform const& transform, std::vector<Brush> const& brushes,
                             Rect const& area) {
    std::vector<Reach> found;
    for (Brush const& brush : brushes) {
        auto const box = transform.MapBox(brush.bounds);
        Rect const pixels = box ? Rect(Grown(*box, 1)).Intersect(area) : area;
        if (!pixels.IsEmpty()) found.push_back({&brush, pixels});
    }
    return found;
}

} // namespace

// In single precision, as where it decides.
bool Meets(RectF const& frame, RectF const& shape, Matrix3f const& m) {
    std::optional<RectF> box;
    for (float const px : {shape.left, shape.right}) {
        for (float const py : {shape.top, shape.bottom}) {
            float const w = px * m[2] + py * m[5] + m[8];
            float const x = (px * m[0] + py * m[3] + m[6]) / w;
            float const y = (px * m[1] + py * m[4] + m[7]) / w;
            if (!box) box = RectF(x, y, x, y);
            box->MakeRect(x, y);
        }
    }
    return frame.IsIntersect(*box);
}

ReferenceRaster::ReferenceRaster(Picture& image, int stripHeight, int subpixelBits)
    : mImage(image),
      mStripHeight(stripHeight),
      mSubpixelBits(subpixelBits),
      mSlack(image.width, image.height) {}

void ReferenceRaster::Draw(Painting const& painting, ClipSet const& clip) {
    for (int top = 0; top < mImage.height; top += mStripHeight) {
        Rect const strip(0, top, mImage.width, std::min(top + mStripHeight, mImage.height));
        if (!painting.extent || Meets(RectF(strip), *painting.extent, painting.matrix)) {
            DrawStrip(painting, clip, strip);
        }
        if (painting.firstStripOnly) break;
    }
}

// Row by row only the brushes that reach it: a batch has thousands.
void ReferenceRaster::DrawStrip(Painting const& painting, ClipSet const& clip, Rect const& strip) {
    PixelDraw const draw(painting, clip, mSubpixelBits);
    std::vector<Reach> const all = FindReach(Transform(painting.matrix), painting.brushes, strip);
    PixelDraw::Brushes here;
    for (int y = strip.top; y < strip.bottom; ++y) {
        std::vector<Reach> row;
        for (Reach const& reach : all) {
            if (y >= reach.pixels.top && y < reach.pixels.bottom) row.push_back(reach);
        }
        for (int x = strip.left; x < strip.right && !row.empty(); ++x) {
            here.clear();
            for (Reach const& reach : row) {
                if (x >= reach.pixels.left && x < reach.pixels.right) here.push_back(reach.brush);
            }
            if (here.empty()) continue;
            ReferencePixel const before{FromBytes(mImage.GetColor(x, y)), mSlack.Get(x, y)};
            ReferencePixel const after = draw.Apply(x, y, before, here);
            mImage.SetColor(x, y, ToBytes(after.color));
            mSlack.Set(x, y, after.slack);
        }
    }
}

void ReferenceRaster::Fill(Rgba const& color, ClipSet const& clip) {
    Painting painting;
    RectF const everywhere = Grown(RectF(Rect(0, 0, mImage.width, mImage.height)), 1);
    painting.brushes = {{everywhere, [color](PointD const&) { return Ink{color}; }}};
    painting.mode = MKPaint::Src;
    Draw(painting, clip);
}

} // namespace Moka::Testing
