/// TextureFilter.h: reads the filter that a bitmap is sampled with.
/// Thread: the render thread, or another thread after all requests for the bitmap are done, as after a
///         read-back.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/renderer/ITextureObject.h"

namespace Moka {

/// The minification filter of the first strip; SetTextureFilter sets all strips alike. Without a texture, the
/// default filter.
inline TextureParamFilteringValue GetTextureFilter(IMKBitmap& bitmap) {
    IMKTextureBitmap* const strips = bitmap.GetTextureBitmap();
    IMKSubBitmap* const first = strips ? strips->GetSubBitmap(0) : nullptr;
    ITextureObject const* const texture = first ? first->GetTexture() : nullptr;
    return texture ? static_cast<TextureParamFilteringValue>(texture->GetParameter(TextureParamFilteringMin))
                   : TextureFilterLinear;
}

} // namespace Moka
