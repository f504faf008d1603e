/// TextureFilter.h: which filter a bitmap is sampled with.
/// Thread: the render thread, or another one once what was requested of the bitmap is done, as after a read-back.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/renderer/ITextureObject.h"

namespace Moka {

/// The filter for drawing smaller, which SetTextureFilter sets: that of the first strip, since all strips have the
/// same. Without a texture the default one.
inline TextureParamFilteringValue GetTextureFilter(IMKBitmap& bitmap) {
    IMKTextureBitmap* const strips = bitmap.GetTextureBitmap();
    IMKSubBitmap* const first = strips ? strips->GetSubBitmap(0) : nullptr;
    ITextureObject const* const texture = first ? first->GetTexture() : nullptr;
    return texture ? static_cast<TextureParamFilteringValue>(texture->GetParameter(TextureParamFilteringMin))
                   : TextureFilterLinear;
}

} // namespace Moka
