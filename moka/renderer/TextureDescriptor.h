/// TextureDescriptor: size and format of a texture, as a value.
/// Made from a model, it describes the same storage: the texture created from it shows the model's image, and
/// the storage lives until the last texture over it is deleted. Sampling state is each texture's own.
#pragma once

#include "moka/renderer/ITextureObject.h"

namespace Moka {

struct TextureDescriptor {
    int width = 0;  ///< texels
    int height = 0; ///< texels

    /// The renderer's own codes. The only combination it knows is dimension 0 (2-D), format 2 (RGBA), internal
    /// format 6 (RGBA8), type 1 (unsigned byte).
    int dimension = 0;
    int format = 2;
    int internalFormat = 6;
    int type = 1;

    bool flag = false; ///< stored, without effect
    /// Not used.
    void const* reserved = nullptr;

    ITextureObject const* model = nullptr; ///< not owned; null for storage of its own

    /// Storage of its own.
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

    /// A null model makes an empty descriptor, which creates nothing.
    explicit TextureDescriptor(ITextureObject const* modelTexture)
        : width(modelTexture ? modelTexture->GetWidth() : 0),
          height(modelTexture ? modelTexture->GetHeight() : 0),
          model(modelTexture) {}
};

} // namespace Moka
