// TestImages.h: images that depend on nothing but their arguments, for comparing pixel by pixel.
// RGBA8, premultiplied, rows packed, first row first.
#pragma once

#include "scenes/Picture.h"

namespace Moka::Testing {

using Scenes::Color;
using Scenes::Picture;

// Opaque; no two pixels of the first 4096 x 4096 are the same, so that a pixel in the wrong place shows.
Picture MakeGradient(int width, int height);

// Every alpha from 0 to 255, with colours that are valid premultiplied values of it.
Picture MakeAlphaPattern(int width, int height);

// Squares of cell pixels, first where the one at the origin is.
Picture MakeChecker(int width, int height, int cell, Color const& first, Color const& second);

} // namespace Moka::Testing
