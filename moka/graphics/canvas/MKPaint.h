// Moved: see the header below.
#pragma once

#include "moka/graphics/paint/MKPaint.h" // IWYU pragma: export
