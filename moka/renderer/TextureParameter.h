/// TextureParameter.h: how a texture is sampled. The numbers are the interface: callers pass and store them.
#pragma once

namespace Moka {

/// The parameters for wrapping. Their numbers differ from those for filtering.
enum TextureParamWrapping : int { TextureParamWrappingS = 0, TextureParamWrappingT = 1 };
/// The parameters for the minification and the magnification filter.
enum TextureParamFiltering : int { TextureParamFilteringMin = 4, TextureParamFilteringMag = 5 };

/// Mipmapped: linear between texels and between the two nearest mipmap levels, so that a texture drawn at
/// less than half its size does not alias. Magnification is linear. The levels are generated at the first
/// draw that samples them, and again at the first such draw after the contents have changed. They take a
/// third more memory.
enum TextureParamFilteringValue : int {
    TextureFilterNearest = 0,
    TextureFilterLinear = 1,
    TextureFilterMipmapped = 2,
};

/// How coordinates outside 0 to 1 are wrapped. The value 2 is unknown and logs an error.
enum TextureParamWrappingValue : int {
    TextureWrapRepeat = 0,
    TextureWrapClampToEdge = 1,
    TextureWrapMirroredRepeat = 3,
};

/// One parameter and its value, as ITextureObject::SetParameter takes them.
struct TextureParameter {
    /// A TextureParamWrapping or TextureParamFiltering, and its value.
    int id = 0;
    int value = 0;
};

} // namespace Moka
