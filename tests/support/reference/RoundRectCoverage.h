// RoundRectCoverage.h: rectangles with elliptic corners, in the pieces they are defined in: straight parts
// and corners, which meet without a gap and, under a stroke thicker than the radii, lie over each other.
#pragma once

#include "tests/support/reference/Coverage.h"

#include <vector>

namespace Moka::Testing {

std::vector<Shape> FilledRoundRect(RectF const& r, double rx, double ry);
std::vector<Shape> StrokedRoundRect(RectF const& r, double rx, double ry, double width);

} // namespace Moka::Testing
