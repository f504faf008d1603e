// What the trace must notice or fail in: were it silent, no test over it would be the wiser.
#include "tests/support/RendererTrace.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>

#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

class RendererTraceTest : public ::testing::Test {
protected:
    RendererTraceTest() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
    }
    ~RendererTraceTest() override { RendererTrace::Reset(); }

    static ITextureObject* MakeTexture(int width = 2) {
        return RendererFactory::CreateTextureObject(TextureDescriptor(width, 2, 0, 2, 6, 1, false, nullptr),
                                                    nullptr, 0, {});
    }
    static IShaderProgram* MakeProgram() {
        return RendererFactory::CreateShaderProgram("uniform vec2 uSize;", "uniform bool uOn;", "Sample");
    }

    LogCapture log;
};

TEST_F(RendererTraceTest, MisuseIsNoticed) {
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
    target->AttachDepthStencil(buffer);
    buffer->Release();
    target->ClearDepthStencil(true, 1, true, 0);
    EXPECT_EQ(RendererTrace::GetClears().back().buffer, "none");
    IShaderProgram* const program = MakeProgram();
    IParameterBinding* const parameter = program->GetParameter("uOn");
    program->Release();
    bool const on = true;
    parameter->Set(&on);
    delete parameter;
    RendererTrace::DeclareNoRenderThread();
    RendererFactory::Commit();
    std::thread([&] { delete texture; }).join();
    target->Release();
    RendererFactory::DetachContext();
    RendererFactory::Flush();
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_THAT(RendererTrace::GetViolations(), ElementsAre("buffer 1 released while attached to target 1",
                                                            "program 1 SetParameter after its release",
                                                            "renderer Commit outside the render thread",
                                                            "texture 1 Release outside the render thread",
                                                            "target 1 Release outside the render thread",
                                                            "renderer Flush without a context"));
}

TEST_F(RendererTraceTest, ObjectsOfAFormerContextAreInertAndNotCountedAgain) {
    ITextureObject* const texture = MakeTexture();
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true));
    RendererFactory::DetachContext();
    RendererFactory::AttachContext();
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 0);
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 2);
    std::thread([&] { delete texture; }).join();
    RendererTrace::KeepRecords(false);
    EXPECT_EQ(RendererTrace::NameOf(texture), "none");
    EXPECT_EQ(RendererTrace::NameOf(blend), "blend 1");
    blend->Release();
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_THAT(RendererTrace::GetCalls(), IsEmpty());
    EXPECT_THAT(RendererTrace::GetViolations(), IsEmpty());
}

TEST_F(RendererTraceTest, PlannedCreationsFailWithOneErrorLineAndNoOthers) {
    RendererTrace::FailCreation(2);
    RendererTrace::FailCreations(ObjectKind::kDepthStencilBuffer);
    ITextureObject* const first = MakeTexture();
    EXPECT_EQ(MakeTexture(), nullptr);
    EXPECT_EQ(RendererFactory::CreateDepthStencilBuffer(1, 1), nullptr);
    EXPECT_EQ(RendererFactory::CreateDepthStencilBuffer(1, 1), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 3);
    RendererTrace::StopFailing();
    IDepthStencilBuffer* const last = RendererFactory::CreateDepthStencilBuffer(1, 1);
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 2);
    delete first;
    last->Release();
}

TEST_F(RendererTraceTest, CapabilitiesThatATestSetsAreInForceUntilTheReset) {
    RendererTrace::SetMaxTextureSize(8);
    RendererTrace::SetGpuName("Slow 3D");
    EXPECT_EQ(MakeTexture(9), nullptr);
    EXPECT_TRUE(RendererFactory::IsGPUNameEqualTo("Slow 3D"));
    RendererFactory::DetachContext();
    RendererFactory::AttachContext({7});
    EXPECT_EQ(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(), 7);
    RendererTrace::Reset();
    EXPECT_EQ(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(), 4096);
    EXPECT_FALSE(RendererFactory::IsGPUNameEqualTo("Slow 3D"));
}

TEST_F(RendererTraceTest, ADrawIsWrittenDownWithTheStateOfItsMoment) {
    RendererFactory::SetDeferred(true);
    VertexDescriptor descriptor;
    descriptor.addAttribute(VertexAttributeType::Float, 1, -1, 0);
    IGraphicsObject* const graphics =
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &descriptor, 0, 0);
    float vertices[] = {0, 1, 2, 3, 4};
    graphics->SetVertices(0, vertices, 5);
    vertices[1] = 99;                       // they were copied
    EXPECT_FALSE(graphics->Draw(0, -1, 1)); // no program
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IShaderProgram* const program = MakeProgram();
    IParameterBinding* const size = program->GetParameter("uSize");
    program->MakeCurrent();
    target->Activate();
    texture->Bind(3);
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    for (float const width : {1.0f, 2.5f}) {
        float const value[] = {width, -1};
        size->Set(value);
        rasterizer->SetScissorRect({static_cast<int>(width), 0, 1, 1});
        rasterizer->SetScissorEnabled(width > 2);
        target->ClearColor(width, 0.5f, -3, 0);
        EXPECT_TRUE(graphics->Draw(1, 2, 1));
    }
    target->Deactivate(true, false);
    EXPECT_EQ(RendererTrace::GetActiveTarget(), "none");
    EXPECT_EQ(RendererTrace::GetEvents().size(), 4u);
    EXPECT_EQ(RendererTrace::GetClears().front().color[2], -3);
    std::vector<TracedDraw> const draws = RendererTrace::GetDraws();
    ASSERT_EQ(draws.size(), 2u);
    EXPECT_EQ(draws[0].target + draws[0].program + draws[0].shader, "target 1program 1Sample");
    EXPECT_EQ(draws[0].textures.at(3), "texture 1");
    EXPECT_FALSE(draws[0].state.scissorOn);
    EXPECT_TRUE(draws[1].state.scissorOn);
    EXPECT_EQ(draws[1].state.scissor.x, 2);
    EXPECT_THAT(draws[1].vertices, ElementsAre(1, 2));
    EXPECT_EQ(draws[0].uniforms.at("uSize").text, "1 -1");
    EXPECT_EQ(draws[1].uniforms.at("uSize").text, "2.5 -1");
    EXPECT_EQ(RendererTrace::GetTexels(texture)[0], 255) << "what was discarded";
    EXPECT_EQ(RendererTrace::GetTexels(texture)[1], 0);
    delete size;
    program->Release();
    graphics->Release();
    target->Release();
    delete texture;
    EXPECT_EQ(RendererTrace::GetBoundTexture(3), "none");
    EXPECT_THAT(RendererTrace::GetViolations(), IsEmpty());
}

} // namespace
} // namespace Moka::Testing
