// ReferenceDraw: what one draw makes of one pixel, and how far off that may be: by the rounding of its
// blends, by a jump of the picture so near to the pixel's centre that the rasteriser may find the centre on
// either side, by the weights of a texture's filter, and by anything where the definition of a shape does.
// What is drawn over a pixel hides as much of that as it hides of the pixel.
#pragma once

#include "tests/support/reference/Blend.h"
#include "tests/support/reference/ClipSet.h"
#include "tests/support/reference/Coverage.h"

#include <array>
#include <functional>
#include <optional>
#include <vector>

namespace Moka::Testing {

struct Ink {
    Rgba color;       // premultiplied
    double slack = 0; // steps that it may be off
};

// A shape with its colours; nothing where it makes no fragment.
struct Brush {
    RectF bounds;
    std::function<std::optional<Ink>(PointD const&)> at;
    // How far off in two directions the point may be at which a texture is sampled. Nothing without a texture.
    std::optional<std::array<PointD, 2>> blur{};
};

// What one draw puts down, in order.
struct Painting {
    Matrix3f matrix;
    std::optional<RectF> extent; // strips that it does not meet, once mapped, are not drawn to
    std::vector<Brush> brushes;
    int mode = MKPaint::SrcOver;
    bool composes = false;  // Darken and Lighten look at what was there before the draw
    bool arePieces = false; // of one shape, which meet in seams
    bool firstStripOnly = false;
};

struct ReferencePixel {
    Rgba color; // as bytes hold it
    int slack = 0;
};

class ReferenceDraw {
public:
    using Brushes = std::vector<Brush const*>;

    // Both outlive it. The rasteriser knows positions to so many binary digits below the pixel: eight, as
    // most have, or fewer.
    ReferenceDraw(Painting const& painting, ClipSet const& clip, int subpixelBits);

    Transform const& GetTransform() const { return mTransform; }
    // Of the painting's brushes those that may reach the pixel.
    ReferencePixel Apply(int x, int y, ReferencePixel const& before, Brushes const& brushes) const;

private:
    // A pixel, seen from a place near its centre.
    struct View {
        int x, y;
        double dx, dy;
    };

    std::optional<PointD> Find(View const& view) const;
    Rgba Mix(std::optional<Ink> const& ink, Rgba const& current, Rgba const& before) const;
    Rgba Evaluate(View const& view, Rgba const& before, Brushes const& brushes) const;
    ReferencePixel Store(View const& view, ReferencePixel const& before, Brushes const& brushes) const;
    double GetBlur(Brush const& brush, PointD const& p, Rgba const& exact, Rgba const& basis) const;
    double GetJump(int x, int y, Rgba const& before, Brushes const& brushes) const;
    bool IsOnSeam(int x, int y, Brushes const& brushes) const;

    Painting const& mPainting;
    ClipSet const& mClip;
    Transform const mTransform;
    bool const mIsCoarse;
    double const mShift; // how far off it may see a pixel's centre
    bool const mHasSeams;
};

} // namespace Moka::Testing
