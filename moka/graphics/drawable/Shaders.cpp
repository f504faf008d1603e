#include "moka/graphics/drawable/Shaders.h"

// The build generates this header from shaders/.
#include "moka/graphics/drawable/ShaderSources.h"

namespace Moka {

#define MOKA_DEFINE(Class, UNIFORMS)                                                                         \
    MOKA_SHADER_DEFINITION(Class, UNIFORMS, detail::k##Class##Vertex, detail::k##Class##Fragment)

MOKA_DEFINE(MKRectShader, MOKA_COLOR_UNIFORMS)
MOKA_DEFINE(MKRoundRectShader, MOKA_COLOR_UNIFORMS)
MOKA_DEFINE(MKRoundRectRoundShader, MOKA_ROUND_RECT_ROUND_UNIFORMS)
MOKA_DEFINE(MKCircleShader, MOKA_CIRCLE_UNIFORMS)
MOKA_DEFINE(MKLineShader, MOKA_LINE_UNIFORMS)
MOKA_DEFINE(MKBitmapShader, MOKA_BITMAP_UNIFORMS)
MOKA_DEFINE(MKBitmapShaderColorClamp, MOKA_BITMAP_UNIFORMS)
MOKA_DEFINE(MKBitmapAdvancedBlendingShader, MOKA_BITMAP_ADVANCED_BLENDING_UNIFORMS)
MOKA_DEFINE(MKBlenderBitmapsShader, MOKA_BLENDER_BITMAPS_UNIFORMS)
MOKA_DEFINE(MKTextMaskBitmapShader, MOKA_TEXT_MASK_BITMAP_UNIFORMS)
MOKA_DEFINE(MKNonPremultipliedColorShader, MOKA_NON_PREMULTIPLIED_COLOR_UNIFORMS)
MOKA_DEFINE(MKGaussianBlurShader, MOKA_GAUSSIAN_BLUR_UNIFORMS)
MOKA_DEFINE(MKStrokeShader, MOKA_STROKE_UNIFORMS)

} // namespace Moka
