// Moved: see the header below.
#pragma once

#include "moka/graphics/factory/MKGraphicsFactory.h" // IWYU pragma: export
