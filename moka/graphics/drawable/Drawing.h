// Drawing.h: steps that all drawables have in common.
// Thread: render thread.
#pragma once

#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/RendererFactory.h"

#include <initializer_list>

namespace Moka::detail {

// Describes a vertex. Each number is the number of floats of one attribute.
inline VertexDescriptor FloatVertex(std::initializer_list<int> attributes) {
    VertexDescriptor vertex;
    for (int const floats : attributes) vertex.addAttribute(VertexAttributeType::Float, floats, -1, 0);
    return vertex;
}

// Returns null if the renderer could not create the object.
inline RendererPtr<IGraphicsObject> CreateGraphics(PrimitiveType primitive, VertexDescriptor const& vertex) {
    return RendererPtr<IGraphicsObject>(RendererFactory::CreateGraphicsObject(1, primitive, &vertex, 0, 0));
}

template <class Shader>
void SetColors(Shader& shader, MKPaint const& paint) {
    shader.uColor = paint.GetColor();
    shader.uTintColor = paint.GetTintColor();
    shader.uHasTintColor = paint.HasTintColor() ? 1 : 0;
}

template <class Shader>
void UseShader(Shader& shader, Matrix4<float> const& projection, MKPaint const& paint) {
    shader.program->MakeCurrent();
    shader.uProjectionMatrix = projection;
    SetColors(shader, paint);
}

inline bool DrawAll(IGraphicsObject& graphics) { return graphics.Draw(0, -1, 1); }

inline bool IsFilled(MKPaint::Style style) {
    return style == MKPaint::Fill || style == MKPaint::FillAndStroke;
}

inline bool IsStroked(MKPaint::Style style) {
    return style == MKPaint::FillAndStroke || style == MKPaint::Stroke;
}

} // namespace Moka::detail
