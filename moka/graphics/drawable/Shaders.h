// Shaders.h: the thirteen programs that the library draws with. CMakeLists.txt in this folder lists the GLSL
// files of each; the files declare the vertices. Every vertex stage applies the projection to coordinates of
// the canvas. Input colours are those of the paint; output colours are premultiplied. Flags are ints: 1 is
// on.
#pragma once

#include "moka/graphics/drawable/ShaderClass.h"

namespace Moka {

#define MOKA_COLOR_UNIFORMS(U)                                                                               \
    U(Matrix4, uProjectionMatrix)                                                                            \
    U(Vector4, uColor)                                                                                       \
    U(Vector4, uTintColor)                                                                                   \
    U(Int, uHasTintColor)

// One colour, multiplied by the coverage of the vertices.
MOKA_SHADER_CLASS(MKRectShader, MOKA_COLOR_UNIFORMS)
// The straight parts of a rounded rectangle.
MOKA_SHADER_CLASS(MKRoundRectShader, MOKA_COLOR_UNIFORMS)

// A corner of a rounded rectangle: part of an ellipse, filled or stroked.
#define MOKA_ROUND_RECT_ROUND_UNIFORMS(U)                                                                    \
    MOKA_COLOR_UNIFORMS(U)                                                                                   \
    U(Int, uIsFill)                                                                                          \
    U(Float, uStrokeWidth)                                                                                   \
    U(Vector2, uRxry)
MOKA_SHADER_CLASS(MKRoundRectRoundShader, MOKA_ROUND_RECT_ROUND_UNIFORMS)

#define MOKA_CIRCLE_UNIFORMS(U)                                                                              \
    MOKA_COLOR_UNIFORMS(U)                                                                                   \
    U(Int, uIsFill)                                                                                          \
    U(Float, uStrokeWidth)                                                                                   \
    U(Vector2, uCenter)                                                                                      \
    U(Float, uRadius)
MOKA_SHADER_CLASS(MKCircleShader, MOKA_CIRCLE_UNIFORMS)

// A segment with caps and dashes. uLineInfo is half the width, and the length. uDashedLinePattern contains
// the ends of dash, gap, dash, gap.
#define MOKA_LINE_UNIFORMS(U)                                                                                \
    MOKA_COLOR_UNIFORMS(U)                                                                                   \
    U(Vector2, uLineInfo)                                                                                    \
    U(Int, uIsDashedLine)                                                                                    \
    U(Vector4, uDashedLinePattern)                                                                           \
    U(Float, uDashedLinePatternLength)                                                                       \
    U(Int, uLineCapType)
MOKA_SHADER_CLASS(MKLineShader, MOKA_LINE_UNIFORMS)

#define MOKA_BITMAP_UNIFORMS(U)                                                                              \
    U(Matrix4, uProjectionMatrix)                                                                            \
    U(TextureUnit, uSrcTexture)                                                                              \
    U(Vector4, uColor)                                                                                       \
    U(Vector4, uTintColor)                                                                                   \
    U(Int, uHasTintColor)
MOKA_SHADER_CLASS(MKBitmapShader, MOKA_BITMAP_UNIFORMS)
// Clamps colours to alpha, for one GPU on which they may exceed it.
MOKA_SHADER_CLASS(MKBitmapShaderColorClamp, MOKA_BITMAP_UNIFORMS)

// Blends with a copy of the destination. uBlendingMode 1 is Darken, 2 is Lighten.
#define MOKA_BITMAP_ADVANCED_BLENDING_UNIFORMS(U)                                                            \
    U(Matrix4, uProjectionMatrix)                                                                            \
    U(TextureUnit, uSrcTexture)                                                                              \
    U(TextureUnit, uDstTexture)                                                                              \
    U(Vector4, uColor)                                                                                       \
    U(Vector4, uTintColor)                                                                                   \
    U(Vector2, uDstTextureSize)                                                                              \
    U(Int, uHasTintColor)                                                                                    \
    U(Int, uBlendingMode)
MOKA_SHADER_CLASS(MKBitmapAdvancedBlendingShader, MOKA_BITMAP_ADVANCED_BLENDING_UNIFORMS)

// A mix of two bitmaps. The colours have no effect.
#define MOKA_BLENDER_BITMAPS_UNIFORMS(U)                                                                     \
    U(Matrix4, uProjectionMatrix)                                                                            \
    U(TextureUnit, uSrcTexture1)                                                                             \
    U(TextureUnit, uSrcTexture2)                                                                             \
    U(Float, uFactor)                                                                                        \
    U(Vector4, uColor)                                                                                       \
    U(Vector4, uTintColor)                                                                                   \
    U(Int, uHasTintColor)
MOKA_SHADER_CLASS(MKBlenderBitmapsShader, MOKA_BLENDER_BITMAPS_UNIFORMS)

// A bitmap's alpha in one colour.
#define MOKA_TEXT_MASK_BITMAP_UNIFORMS(U)                                                                    \
    U(Matrix4, uProjectionMatrix)                                                                            \
    U(TextureUnit, uSrcTexture)                                                                              \
    U(Vector4, uMaskColor)
MOKA_SHADER_CLASS(MKTextMaskBitmapShader, MOKA_TEXT_MASK_BITMAP_UNIFORMS)

// One bitmap over another. The output colour is not premultiplied.
#define MOKA_NON_PREMULTIPLIED_COLOR_UNIFORMS(U)                                                             \
    U(Matrix4, projectionMatrix)                                                                             \
    U(TextureUnit, srcTexture)                                                                               \
    U(TextureUnit, dstTexture)
MOKA_SHADER_CLASS(MKNonPremultipliedColorShader, MOKA_NON_PREMULTIPLIED_COLOR_UNIFORMS)

// One direction of a blur.
#define MOKA_GAUSSIAN_BLUR_UNIFORMS(U)                                                                       \
    U(Matrix4, projectionMatrix)                                                                             \
    U(TextureUnit, srcTexture)                                                                               \
    U(Vector4, uTintColor)                                                                                   \
    U(Int, uHasTintColor)                                                                                    \
    U(Bool, isHorizontal)                                                                                    \
    U(Float, blurAmount)
MOKA_SHADER_CLASS(MKGaussianBlurShader, MOKA_GAUSSIAN_BLUR_UNIFORMS)

// A stroke with the maximum coverage of its segments. The uToCanvas rows map pixels of the target to the
// canvas.
#define MOKA_STROKE_UNIFORMS(U)                                                                              \
    MOKA_COLOR_UNIFORMS(U)                                                                                   \
    U(Vector4, uToCanvasX)                                                                                   \
    U(Vector4, uToCanvasY)                                                                                   \
    U(Vector4, uToCanvasW)                                                                                   \
    U(Float, uMargin)
MOKA_SHADER_CLASS(MKStrokeShader, MOKA_STROKE_UNIFORMS)

} // namespace Moka
