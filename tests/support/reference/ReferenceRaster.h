// ReferenceRaster: puts draws onto an image, pixel by pixel, strip by strip, and keeps how far off each pixel
// may be and still be right.
#pragma once

#include "tests/support/ImageCompare.h"
#include "tests/support/reference/ReferenceDraw.h"

namespace Moka::Testing {

// Whether the box around a mapped rectangle meets a frame, as the drawing of whole frames is decided: without
// what strokes and fringes add.
bool Meets(RectF const& frame, RectF const& shape, Matrix3f const& m);

class ReferenceRaster {
public:
    // The image, which outlives it, is cut into strips of so many rows.
    ReferenceRaster(Picture& image, int stripHeight, int subpixelBits);

    void Draw(Painting const& painting, ClipSet const& clip);
    void Fill(Rgba const& color, ClipSet const& clip);
    void FillAll(Rgba const& color);

    Slack const& GetSlack() const { return mSlack; }

private:
    void DrawStrip(ReferenceDraw const& draw, std::vector<Brush> const& brushes, Rect const& strip);
    void DrawPixel(ReferenceDraw const& draw, int x, int y, ReferenceDraw::Brushes const& brushes);

    Picture& mImage;
    int const mStripHeight;
    int const mSubpixelBits;
    Slack mSlack;
};

} // namespace Moka::Testing
