// TextureParameter.h: how a texture is sampled. The numbers are the interface: callers pass and store them.
#pragma once

namespace Moka {

// The names of the parameters, one number space for both kinds.
enum TextureParamWrapping { TextureParamWrappingS = 0, TextureParamWrappingT = 1 };
enum TextureParamFiltering { TextureParamFilteringMin = 4, TextureParamFilteringMag = 5 };

enum TextureParamFilteringValue { TextureFilterNearest = 0, TextureFilterLinear = 1 };

// 2 names no mode: it is refused with a log line.
enum TextureParamWrappingValue {
    TextureWrapRepeat = 0,
    TextureWrapClampToEdge = 1,
    TextureWrapMirroredRepeat = 3,
};

// One parameter and its value, as ITextureObject::SetParameter takes them.
struct TextureParameter {
    int id = 0;
    int value = 0;
};

} // namespace Moka
