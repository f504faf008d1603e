// MKGraphicsUtil: converts a paint's settings to the renderer's states.
#pragma once

#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/BlendStateDescriptor.h"

namespace Moka {

class IMKBitmapReadable;

class MKGraphicsUtil {
public:
    // Returns the blend state for premultiplied colours. Darken and Lighten replace the destination, because
    // a program computes the result.
    static BlendStateDescriptor GetBlendingStateDescriptor(MKPaint::XFermode mode);

    // Sets the bitmap's wrap modes. Skips an axis with an unknown tile mode. Render thread only.
    static void SetTileModeRT(IMKBitmapReadable* bitmap, MKPaint const& paint);
};

} // namespace Moka
