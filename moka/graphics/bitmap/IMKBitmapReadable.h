/// IMKBitmapReadable: a bitmap, or a strip of one, as a texture.
/// Thread:  the plain operations post; those ending in RT run on the render thread, where `release` says
///          whether to drop one reference at the end.
#pragma once

#include "moka/renderer/TextureParameter.h"

namespace Moka {

class IMKBitmapReadable {
public:
    virtual ~IMKBitmapReadable() = default;

    /// Binds the texture to a unit, with its sampling state.
    virtual void ActivateTextureRT(int unit, bool release) = 0;

    /// A value that is no filter or wrap is refused with a log line; the former one stays. docs/canvas.md tells
    /// what TextureFilterMipmapped is for, and when its levels are made.
    /// The forms without a kind set both filters, and both wrap directions.
    virtual void SetTextureFilter(TextureParamFilteringValue value) = 0;
    virtual void SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) = 0;
    virtual void SetTextureWrap(TextureParamWrappingValue value) = 0;
    virtual void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) = 0;

    /// The same at once.
    virtual void SetTextureFilterRT(TextureParamFilteringValue value, bool release) = 0;
    virtual void SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value,
                                    bool release) = 0;
    virtual void SetTextureWrapRT(TextureParamWrappingValue value, bool release) = 0;
    virtual void SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value,
                                  bool release) = 0;
};

} // namespace Moka
