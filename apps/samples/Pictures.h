// Pictures.h: the pictures of the demonstration.
#pragma once

#include "apps/samples/Picture.h"

namespace Moka::Samples {

Picture PaintPhoto();   // opaque and grainy, as a camera's
Picture PaintNote();    // a page of a notebook, with round corners and a shadow
Picture PaintSticker(); // soft, transparent edges
Picture PaintScroll();  // far taller than any texture

} // namespace Moka::Samples
