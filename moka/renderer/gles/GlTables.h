// GlTables.h: maps the renderer's enumerations to GL's. GL_NONE marks an unknown value.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"
#include "moka/renderer/DepthStencilStateDescriptor.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/TextureParameter.h"
#include "moka/renderer/gles/GlState.h"

namespace Moka::detail {

constexpr GLenum ToGlFilter(TextureParamFilteringValue value) {
    switch (value) {
    case TextureFilterNearest:
        return GL_NEAREST;
    case TextureFilterLinear:
        return GL_LINEAR;
    case TextureFilterMipmapped:
        return GL_LINEAR_MIPMAP_LINEAR;
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

// Returns BindingTypeUnknown for unsupported types.
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

constexpr GLenum ToGlFactor(BlendingFactor factor) {
    switch (factor) {
    case BlendingFactor::Zero:
        return GL_ZERO;
    case BlendingFactor::One:
        return GL_ONE;
    case BlendingFactor::SrcColor:
        return GL_SRC_COLOR;
    case BlendingFactor::SrcAlpha:
        return GL_SRC_ALPHA;
    case BlendingFactor::OneMinusSrcAlpha:
        return GL_ONE_MINUS_SRC_ALPHA;
    case BlendingFactor::DstAlpha:
        return GL_DST_ALPHA;
    case BlendingFactor::OneMinusDstAlpha:
        return GL_ONE_MINUS_DST_ALPHA;
    }
    return GL_NONE;
}

constexpr GLenum ToGlComparison(StencilComparison comparison) {
    switch (comparison) {
    case StencilEqual:
        return GL_EQUAL;
    case StencilNotEqual:
        return GL_NOTEQUAL;
    case StencilAlways:
        return GL_ALWAYS;
    }
    return GL_NONE;
}

constexpr GLenum ToGlStencilOperation(StencilOperation operation) {
    switch (operation) {
    case StencilKeep:
        return GL_KEEP;
    case StencilZero:
        return GL_ZERO;
    case StencilReplace:
        return GL_REPLACE;
    case StencilIncrementSaturate:
        return GL_INCR;
    case StencilDecrementSaturate:
        return GL_DECR;
    }
    return GL_NONE;
}

constexpr GLenum ToGlPrimitive(PrimitiveType primitive) {
    switch (primitive) {
    case PrimitiveType::TriangleList:
        return GL_TRIANGLES;
    case PrimitiveType::TriangleStrip:
        return GL_TRIANGLE_STRIP;
    }
    return GL_NONE;
}

inline GlBox ToGlBox(ScissorRect const& rect) { return {rect.x, rect.y, rect.width, rect.height}; }

inline GlBlend ToGlBlend(BlendStateDescriptor const& descriptor) {
    GlBlend blend;
    if (!descriptor.IsBlending()) return blend;
    BlendStateDescriptor::Equation const& color = descriptor.GetColorEquation();
    BlendStateDescriptor::Equation const& alpha = descriptor.GetAlphaEquation();
    return {true,
            {ToGlFactor(color.source), ToGlFactor(color.destination)},
            {ToGlFactor(alpha.source), ToGlFactor(alpha.destination)}};
}

inline GlStencil ToGlStencil(DepthStencilStateDescriptor const& descriptor) {
    if (!descriptor.IsStencil()) return {};
    return {true,
            ToGlComparison(descriptor.GetComparison()),
            descriptor.GetReference(),
            descriptor.GetReadMask(),
            ToGlStencilOperation(descriptor.GetStencilFail()),
            ToGlStencilOperation(descriptor.GetDepthFail()),
            ToGlStencilOperation(descriptor.GetPass())};
}

// The only pixel format. kBytesPerPixel is its size.
inline constexpr GLenum kGlInternalFormat = GL_RGBA8;
inline constexpr GLenum kGlFormat = GL_RGBA;
inline constexpr GLenum kGlType = GL_UNSIGNED_BYTE;

} // namespace Moka::detail
