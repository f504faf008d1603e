// RecorderFixture: the deferring renderer over a device without a driver, with a program and an active target.
#pragma once

#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/Recorder.h"
#include "tests/support/RendererTrace.h"

#include <gtest/gtest.h>

namespace Moka::Testing {

struct ReleaseIt {
    template <class T>
    void operator()(T* object) const {
        object->Release();
    }
};
template <class T>
using Released = std::unique_ptr<T, ReleaseIt>;

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
    static Released<IGraphicsObject> MakeGraphics(PrimitiveType primitive = PrimitiveType::TriangleList) {
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 1, -1, 0);
        return Released<IGraphicsObject>(RendererFactory::CreateGraphicsObject(1, primitive, &layout, 0, 0));
    }
    static Released<IShaderProgram> MakeProgram() {
        return Released<IShaderProgram>(
            RendererFactory::CreateShaderProgram("", "uniform float width; uniform int count;", "Sample"));
    }
    void SetVertices(std::initializer_list<float> vertices) const {
        graphics->SetVertices(0, std::data(vertices), static_cast<int>(vertices.size()));
    }
    void SetWidth(float value) const { width->Set(&value); }
    static RendererStatistics Count() { return RendererFactory::GetStatistics(); }

    Released<IGraphicsObject> graphics;
    Released<IShaderProgram> program;
    std::unique_ptr<IParameterBinding> width;
    std::unique_ptr<ITextureObject> texture;
    Released<IRenderTarget> target;
};

} // namespace Moka::Testing
