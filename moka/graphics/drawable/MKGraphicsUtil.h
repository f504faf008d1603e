// MKGraphicsUtil: a paint's settings as states of the renderer.
#pragma once

#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/BlendStateDescriptor.h"

namespace Moka {

class IMKBitmapReadable;

class MKGraphicsUtil {
public:
    // Colours reach the blender premultiplied. Darken and lighten replace, because a program composes them.
    static BlendStateDescriptor GetBlendingStateDescriptor(MKPaint::XFermode mode);

    // Render thread. An axis with an unknown tile mode is left as it is.
    static void SetTileModeRT(IMKBitmapReadable* bitmap, MKPaint const& paint);
};

} // namespace Moka
