// Ink.h: pen strokes and cursive handwriting.
#pragma once

#include "apps/samples/Picture.h"

#include <string>
#include <vector>

namespace Moka::Samples {

struct InkPoint {
    Spot at;
    float width = 1; // of the stroke here, in pixels
};
using Stroke = std::vector<InkPoint>;

// One even layer of colour, also where the stroke crosses itself, with round ends and smooth edges.
void DrawStroke(Picture& picture, Stroke const& stroke, Color const& color);

// A curve through all points, in steps short enough to look round.
Stroke SmoothThrough(std::vector<Spot> const& points, float width);

// The shape of a felt-tip marker: a flat band of the given height.
void DrawMarker(Picture& picture, Spot from, Spot to, float height, Color const& color);

struct Pen {
    Color color;
    float width = 2;    // pixels
    float xHeight = 20; // of a small letter, pixels
    float slant = 0.22f;
    unsigned seed = 1; // of the hand's unevenness
};

// Lower-case letters, digits, spaces, commas and full stops, joined as a hand does; at is the left end of the
// baseline. Returns where the line ends.
float Write(Picture& picture, std::string const& text, Spot at, Pen const& pen);

} // namespace Moka::Samples
