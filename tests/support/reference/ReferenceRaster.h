// ReferenceRaster: puts draws onto an image, pixel by pixel, strip by strip, and keeps how far off each pixel
// may be and still be right: by the rounding of its blends, by a jump of the picture so near to the pixel's centre
// that the rasteriser may find the centre on either side, by the weights of a texture's filter, and by anything where
// the definition of a shape does. What is drawn over a pixel hides as much of that as it hides of the pixel.
#pragma once

#include "tests/support/ImageCompare.h"
#include "tests/support/reference/Blend.h"
#include "tests/support/reference/ClipSet.h"
#include "tests/support/reference/Coverage.h"

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

// Whether the box around a mapped rectangle meets a frame, as the drawing of whole frames is decided: without
// what strokes and fringes add.
bool Meets(RectF const& frame, RectF const& shape, Matrix3f const& m);

class ReferenceRaster {
public:
    // The image, which outlives it, is cut into strips of so many rows.
    ReferenceRaster(Picture& image, int stripHeight, int subpixelBits);

    void Draw(Painting const& painting, ClipSet const& clip);
    void Fill(Rgba const& color, ClipSet const& clip);

    Slack const& GetSlack() const { return mSlack; }

private:
    void DrawStrip(Painting const& painting, ClipSet const& clip, Rect const& strip);

    Picture& mImage;
    int const mStripHeight;
    int const mSubpixelBits;
    Slack mSlack;
};

} // namespace Moka::Testing
