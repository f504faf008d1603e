/// TextureParameter.h: how a texture is sampled. The numbers are the interface: callers pass and store them.
#pragma once

namespace Moka {

/// The names of the parameters, one number space for both kinds.
enum TextureParamWrapping : int { TextureParamWrappingS = 0, TextureParamWrappingT = 1 };
/// The filters: for shrinking and for growing.
enum TextureParamFiltering : int { TextureParamFilteringMin = 4, TextureParamFilteringMag = 5 };

/// Mipmapped: linear between texels and between the two levels nearest to the scale, so that a texture drawn
/// smaller than half its size has no speckles; magnified it is linear. The levels are made when the texture is
/// first drawn so, and again at the first such draw after its contents changed. They take a third more memory.
enum TextureParamFilteringValue : int {
    TextureFilterNearest = 0,
    TextureFilterLinear = 1,
    TextureFilterMipmapped = 2,
};

/// 2 names no mode: it is refused with a log line.
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
