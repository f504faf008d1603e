// DrawFixture: a target, programs of one colour and of one texture, and the states to draw under; immediate
// and deferred, because the pixels are the same.
#pragma once

#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRasterizerState.h"

namespace Moka::Testing {

using ParameterPtr = std::unique_ptr<IParameterBinding>;
using GraphicsPtr = std::unique_ptr<IGraphicsObject, Releaser>;
using BlendPtr = std::unique_ptr<IBlendStateObject, Releaser>;
using StatePtr = std::unique_ptr<IDepthStencilState, Releaser>;

inline constexpr int kSize = 8;

// Positions are pixels of a target of kSize; texture coordinates follow them.
inline constexpr char kVertex[] = "attribute vec2 corner; varying highp vec2 at;\n"
                                  "void main() { at = corner / 8.0;\n"
                                  "  gl_Position = vec4(at * 2.0 - 1.0, 0.0, 1.0); }";
inline constexpr char kColored[] = "precision highp float; uniform vec4 color;\n"
                                   "void main() { gl_FragColor = color; }";
inline constexpr char kTextured[] = "precision highp float; uniform sampler2D texel; varying vec2 at;\n"
                                    "void main() { gl_FragColor = texture2D(texel, at); }";

// A program with its one parameter.
struct Brush {
    Brush(char const* fragment, char const* parameterName)
        : program(RendererFactory::CreateShaderProgram(kVertex, fragment, "brush")),
          parameter(program->GetParameter(parameterName)) {}

    ProgramPtr program;
    ParameterPtr parameter;
};

// Of triangles with so many attributes of two floats.
inline GraphicsPtr MakeGraphics(int attributes) {
    VertexDescriptor layout;
    for (int i = 0; i < attributes; ++i) layout.addAttribute(VertexAttributeType::Float, 2, -1, 0);
    return GraphicsPtr(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &layout, 0, 0));
}

class DrawFixture : public RendererFixture, public ::testing::WithParamInterface<bool> {
protected:
    DrawFixture() {
        RendererFactory::SetDeferred(GetParam());
        blend->Apply();
        stencil->Apply();
    }

    void SetQuad(float l, float t, float r, float b) const {
        float const corners[] = {l, t, l, b, r, t, r, t, l, b, r, b};
        quad->SetVertices(0, corners, 6);
        quad->SetBounds({l / 4 - 1, t / 4 - 1, r / 4 - 1, b / 4 - 1});
    }
    void Fill(Color color, float l, float t, float r, float b) const { Fill(colored, color, l, t, r, b); }
    void Fill(Brush const& brush, Color color, float l, float t, float r, float b) const {
        brush.program->MakeCurrent();
        brush.parameter->Set(ToFloats(color).data());
        SetQuad(l, t, r, b);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    void Paint(ITextureObject& source, float l, float t, float r, float b) const {
        int const unit = 1;
        source.Bind(unit);
        textured.program->MakeCurrent();
        textured.parameter->Set(&unit);
        SetQuad(l, t, r, b);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    void SetStencil(StencilComparison comparison, int reference, StencilOperation pass) const {
        DepthStencilStateDescriptor descriptor(false, true);
        descriptor.SetStencilFunction(comparison, reference, 0xFF, pass == StencilKeep ? 0u : 0xFFu);
        descriptor.SetStencilOperation(StencilKeep, StencilKeep, pass);
        stencil->SetDescriptor(descriptor);
        stencil->Apply();
    }
    Picture Read() { return RendererFixture::Read(*target, kSize, kSize); }
    static Picture Filled(Color color) { return MakeImage(kSize, kSize, color); }
    static bool IsDeferred() { return GetParam(); }

    TexturePtr texture = MakeTexture(kSize, kSize);
    TargetPtr target = MakeTarget(*texture);
    Brush const colored{kColored, "color"};
    Brush const textured{kTextured, "texel"};
    GraphicsPtr quad = MakeGraphics(1);
    BlendPtr blend{RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true))};
    StatePtr stencil{RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false))};
};

} // namespace Moka::Testing
