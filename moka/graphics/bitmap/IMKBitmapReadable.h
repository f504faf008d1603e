/// IMKBitmapReadable: a bitmap, or a strip of one, as a texture.
/// Thread:  the functions ending in RT run on the render thread at once; with `release` they drop one
///          reference at the end. The others are posted.
#pragma once

#include "moka/renderer/TextureParameter.h"

namespace Moka {

class IMKBitmapReadable {
public:
    virtual ~IMKBitmapReadable() = default;

    /// Binds the texture to a unit, with its sampling state.
    virtual void ActivateTextureRT(int unit, bool release) = 0;

    /// Set the sampling state: one filter or wrap direction, or without a kind both. An unknown value logs an
    /// error and changes nothing. docs/canvas.md explains when to use TextureFilterMipmapped.
    virtual void SetTextureFilter(TextureParamFilteringValue value) = 0;
    virtual void SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) = 0;
    virtual void SetTextureWrap(TextureParamWrappingValue value) = 0;
    virtual void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) = 0;

    /// The same functions, executed at once.
    virtual void SetTextureFilterRT(TextureParamFilteringValue value, bool release) = 0;
    virtual void SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value,
                                    bool release) = 0;
    virtual void SetTextureWrapRT(TextureParamWrappingValue value, bool release) = 0;
    virtual void SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value,
                                  bool release) = 0;
};

} // namespace Moka
