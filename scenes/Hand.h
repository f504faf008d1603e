// Hand: draws handwriting and sketches on a pen canvas.
// Units: pixels, y down. (x, y) is the left end of the baseline.
#pragma once

#include "scenes/ScenePen.h"

#include <string>
#include <vector>

namespace Moka::Scenes {

using Path = std::vector<InkPoint>; // the points of a stroke

struct Ink {
    Vector4<float> color; // premultiplied
    float width = 2;
    float xHeight = 20; // the height of a small letter
    float slant = 0.22f;
};

class Hand {
public:
    Hand(ScenePen& pen, IMKPenCanvas& canvas) : mPen(pen), mCanvas(canvas) {}

    // Writes small letters, digits, spaces, commas and full stops.
    void Write(std::string const& text, float x, float y, Ink const& ink);
    // Draws a smooth line through pairs of x and y in one string: "10 20 30 40".
    void Sketch(char const* points, float x, float y, Ink const& ink);

private:
    void Trace(Path const& path, Ink const& ink);

    ScenePen& mPen;
    IMKPenCanvas& mCanvas;
    unsigned mSeed = 1; // of the pseudo-random deviations
};

} // namespace Moka::Scenes
