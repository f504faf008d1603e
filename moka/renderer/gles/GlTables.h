// GlTables.h: the renderer's numbers and what they are in GL. GL_NONE stands for "names nothing".
#pragma once

#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/TextureDescriptor.h"
#include "moka/renderer/TextureParameter.h"

#include <GLES3/gl3.h>

namespace Moka::detail {

constexpr GLenum ToGlFilter(TextureParamFilteringValue value) {
    switch (value) {
    case TextureFilterNearest:
        return GL_NEAREST;
    case TextureFilterLinear:
        return GL_LINEAR;
    }
    return GL_NONE;
}

constexpr GLenum ToGlWrap(TextureParamWrappingValue value) {
    switch (value) {
    case TextureWrapRepeat:
        return GL_REPEAT;
    case TextureWrapClampToEdge:
        return GL_CLAMP_TO_EDGE;
    case TextureWrapMirroredRepeat:
        return GL_MIRRORED_REPEAT;
    }
    return GL_NONE;
}

constexpr GLenum ToGlParameter(int id) {
    switch (id) {
    case TextureParamWrappingS:
        return GL_TEXTURE_WRAP_S;
    case TextureParamWrappingT:
        return GL_TEXTURE_WRAP_T;
    case TextureParamFilteringMin:
        return GL_TEXTURE_MIN_FILTER;
    case TextureParamFilteringMag:
        return GL_TEXTURE_MAG_FILTER;
    }
    return GL_NONE;
}

// What value means for the parameter that id names.
constexpr GLenum ToGlParameterValue(int id, int value) {
    bool const isFilter = id == TextureParamFilteringMin || id == TextureParamFilteringMag;
    // Outside the range of the enumerations a conversion to them is undefined.
    if (value < 0 || value > 3) return GL_NONE;
    if (!isFilter) return ToGlWrap(static_cast<TextureParamWrappingValue>(value));
    return value > 1 ? GL_NONE : ToGlFilter(static_cast<TextureParamFilteringValue>(value));
}

// Unknown for the types that no parameter has.
constexpr BindingType ToBindingType(GLenum uniformType) {
    switch (uniformType) {
    case GL_BOOL:
        return BindingTypeBool;
    case GL_FLOAT_MAT4:
        return BindingTypeMatrix4;
    case GL_FLOAT_VEC2:
        return BindingTypeVector2;
    case GL_FLOAT_VEC4:
        return BindingTypeVector4;
    case GL_FLOAT:
        return BindingTypeFloat;
    case GL_INT:
        return BindingTypeInt;
    case GL_SAMPLER_2D:
        return BindingTypeTextureUnit;
    default:
        return BindingTypeUnknown;
    }
}

// The one format there is; every size in bytes and every transfer in this folder relies on it.
inline constexpr GLenum kGlInternalFormat = GL_RGBA8;
inline constexpr GLenum kGlFormat = GL_RGBA;
inline constexpr GLenum kGlType = GL_UNSIGNED_BYTE;
inline constexpr int kBytesPerPixel = 4;

// Whether the descriptor's codes name that format, two-dimensional.
inline bool IsKnownFormat(TextureDescriptor const& descriptor) {
    return descriptor.dimension == 0 && descriptor.format == 2 && descriptor.internalFormat == 6 &&
           descriptor.type == 1;
}

} // namespace Moka::detail
