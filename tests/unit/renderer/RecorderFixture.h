// RecorderFixture: the deferring renderer over a device without a driver, with a program and an active target.
#pragma once

#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/Recorder.h"
#include "tests/support/RendererTrace.h"

#include <gtest/gtest.h>

namespace Moka::Testing {

using detail::RendererPtr;

class RecorderFixture : public ::testing::Test {
protected:
    static constexpr int kSize = 100;

    RecorderFixture() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
        RendererFactory::SetDeferred(true);
        program = MakeProgram();
        program->MakeCurrent();
        width.reset(program->GetParameter("width"));
        texture = MakeTexture();
        target.reset(RendererFactory::CreateOffscreenRenderTarget(texture.get()));
        graphics = MakeGraphics();
        target->Activate();
        RendererFactory::Flush();
    }
    ~RecorderFixture() override { RendererTrace::Reset(); } // what is alive may be released later

    static std::unique_ptr<ITextureObject> MakeTexture() {
        TextureDescriptor const descriptor(kSize, kSize, 0, 2, 6, 1, false, nullptr);
        return std::unique_ptr<ITextureObject>(
            RendererFactory::CreateTextureObject(descriptor, nullptr, 0, {}));
    }
    // Of vertices of one float.
    static RendererPtr<IGraphicsObject> MakeGraphics(PrimitiveType primitive = PrimitiveType::TriangleList) {
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 1, -1, 0);
        return RendererPtr<IGraphicsObject>(
            RendererFactory::CreateGraphicsObject(1, primitive, &layout, 0, 0));
    }
    static RendererPtr<IShaderProgram> MakeProgram() {
        return RendererPtr<IShaderProgram>(
            RendererFactory::CreateShaderProgram("", "uniform float width; uniform int count;", "Sample"));
    }
    void SetVertices(std::initializer_list<float> vertices) const {
        graphics->SetVertices(0, std::data(vertices), static_cast<int>(vertices.size()));
    }
    void SetWidth(float value) const { width->Set(&value); }
    static RendererStatistics Count() { return RendererFactory::GetStatistics(); }

    RendererPtr<IGraphicsObject> graphics;
    RendererPtr<IShaderProgram> program;
    std::unique_ptr<IParameterBinding> width;
    std::unique_ptr<ITextureObject> texture;
    RendererPtr<IRenderTarget> target;
};

} // namespace Moka::Testing
