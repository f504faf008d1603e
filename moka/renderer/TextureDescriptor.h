/// TextureDescriptor: size and format of a texture, as a value.
/// Constructed from a model, it describes another view of the model's storage. The storage lives until the
/// last texture that uses it is deleted. Each texture has its own sampling state.
#pragma once

#include "moka/renderer/ITextureObject.h"

namespace Moka {

struct TextureDescriptor {
    int width = 0;  ///< texels
    int height = 0; ///< texels

    /// The renderer's own codes. It supports only dimension 0 (2-D), format 2 (RGBA), internal format 6
    /// (RGBA8) and type 1 (unsigned byte).
    int dimension = 0;
    int format = 2;
    int internalFormat = 6;
    int type = 1;

    bool flag = false; ///< stored, without effect
    /// Not used.
    void const* reserved = nullptr;

    ITextureObject const* model = nullptr; ///< not owned; null for new storage

    /// Describes new storage.
    TextureDescriptor(int widthValue, int heightValue, int dimensionCode, int formatCode,
                      int internalFormatCode, int typeCode, bool flagValue, void const* reservedValue)
        : width(widthValue),
          height(heightValue),
          dimension(dimensionCode),
          format(formatCode),
          internalFormat(internalFormatCode),
          type(typeCode),
          flag(flagValue),
          reserved(reservedValue) {}

    /// Describes a view of the model's storage. A null model makes an empty descriptor, which creates no
    /// texture.
    explicit TextureDescriptor(ITextureObject const* modelTexture)
        : width(modelTexture ? modelTexture->GetWidth() : 0),
          height(modelTexture ? modelTexture->GetHeight() : 0),
          model(modelTexture) {}
};

} // namespace Moka
