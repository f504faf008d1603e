// LineCoverage.h: a line with caps and dashes, told in two distances: along it from its begin and across it.
#pragma once

#include "moka/graphics/canvas/MKPaint.h"
#include "tests/support/reference/Coverage.h"

namespace Moka::Testing {

Shape Line(PointD const& from, PointD const& to, MKPaint const& paint);

} // namespace Moka::Testing
