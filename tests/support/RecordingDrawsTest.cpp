#include "tests/support/RecordingDraws.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RecordingDevice.h"
#include "tests/support/RecordingRenderer.h"

#include <gmock/gmock.h>

#include <climits>
#include <memory>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

class RecordingDrawsTest : public ::testing::Test {
protected:
    RecordingDrawsTest() {
        RecordingRenderer::Reset();
        RendererFactory::AttachContext();
    }
    ~RecordingDrawsTest() override { RecordingRenderer::Reset(); }

    static IGraphicsObject* MakeGraphics(int components) {
        VertexDescriptor descriptor;
        descriptor.addAttribute(VertexAttributeType::Float, components, -1, 0);
        return RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &descriptor, 0, 0);
    }
    static IShaderProgram* MakeProgram() {
        return RendererFactory::CreateShaderProgram("uniform vec2 uSize;",
                                                    "uniform bool uOn; uniform sampler2D uImage;", "Sample");
    }
    static ITextureObject* MakeTexture() {
        return RendererFactory::CreateTextureObject(TextureDescriptor(2, 2, 0, 2, 6, 1, false, nullptr),
                                                    nullptr, 0, {});
    }
    template <class T>
    static void SetUniform(IShaderProgram* program, char const* name, T const& value) {
        std::unique_ptr<IParameterBinding>(program->GetParameter(name))->Set(&value);
    }
};

TEST_F(RecordingDrawsTest, ADrawIsWrittenDownWithTheStateOfItsMoment) {
    float vertices[] = {0, 1, 2, 3, 4, 5, 6, 7};
    IGraphicsObject* const graphics = MakeGraphics(2);
    graphics->SetVertices(0, vertices, 4);
    IShaderProgram* const program = MakeProgram();
    float const size[] = {0.5f, 8};
    SetUniform(program, "uSize", size);
    SetUniform(program, "uOn", true);
    SetUniform(program, "uImage", 3);
    program->MakeCurrent();
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
    target->AttachDepthStencil(buffer);
    BlendStateDescriptor off(false);
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(off);
    texture->Bind(3);

    vertices[2] = 99; // they were copied
    target->Activate();
    target->ClearDepthStencil(false, 1, true, 7);
    blend->Apply();
    EXPECT_TRUE(graphics->Draw(1, 2, 1));
    blend->SetDescriptor(BlendStateDescriptor(true)); // not applied
    SetUniform(program, "uOn", false);
    graphics->SetVertices(0, nullptr, 0);
    texture->Bind(0);
    target->Deactivate(false, false);
    EXPECT_TRUE(graphics->Draw(0, -1, 1));
    target->DetachDepthStencil();
    graphics->Release();
    program->Release();
    blend->Release();
    target->Release();
    buffer->Release();
    delete texture;

    auto const draws = RecordingRenderer::GetDraws();
    ASSERT_EQ(draws.size(), 2u);
    RecordedDraw const& first = draws[0];
    EXPECT_THAT(first.vertices, ElementsAre(2, 3, 4, 5));
    EXPECT_EQ(first.floatsPerVertex, 2);
    EXPECT_EQ(first.first, 1);
    EXPECT_EQ(first.primitive, PrimitiveType::TriangleStrip);
    EXPECT_EQ(first.state.blend, off);
    EXPECT_EQ(first.target + ", " + first.buffer, "target 1, buffer 1");
    EXPECT_EQ(first.program + ", " + first.shader, "program 1, Sample");
    EXPECT_THAT(first.uniforms.at("uSize").numbers, ElementsAre(0.5f, 8));
    EXPECT_EQ(first.uniforms.at("uSize").text, "0.5 8");
    EXPECT_THAT(first.uniforms.at("uOn").numbers, ElementsAre(1));
    EXPECT_THAT(first.uniforms.at("uImage").numbers, ElementsAre(3));
    EXPECT_THAT(first.textures, ElementsAre(std::pair(3, "texture 1")));
    EXPECT_EQ(draws[1].target, "none");
    EXPECT_EQ(draws[1].count, 0);
    EXPECT_EQ(draws[1].uniforms.at("uOn").text, "0");
    EXPECT_EQ(draws[1].state.blend, off);

    auto const events = RecordingRenderer::TakeEvents();
    ASSERT_EQ(events.size(), 3u);
    auto const& clear = std::get<RecordedClear>(events[0]);
    EXPECT_TRUE(clear.clearsStencil && !clear.clearsDepth && !clear.clearsColor);
    EXPECT_EQ(clear.stencil, 7);
    EXPECT_EQ(clear.buffer, "buffer 1");
    EXPECT_THAT(RecordingRenderer::GetEvents(), IsEmpty());
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingDrawsTest, OnlyVerticesThatAreThereAreDrawn) {
    LogCapture log;
    float const vertices[] = {0, 1, 2, 3, 4};
    IGraphicsObject* const graphics = MakeGraphics(1);
    graphics->SetVertices(0, vertices, 5);
    EXPECT_FALSE(graphics->Draw(0, -1, 1)); // no program
    IShaderProgram* const program = MakeProgram();
    program->MakeCurrent();
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 0);
    EXPECT_FALSE(graphics->Draw(0, -1, 2));
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 1);
    for (auto const& [first, count] : {std::pair(0, -1), {3, -1}, {3, 9}, {-2, 3}, {5, 1}, {1, 0}, {1, -2}}) {
        EXPECT_TRUE(graphics->Draw(first, count, 1));
    }
    EXPECT_TRUE(graphics->Draw(2, INT_MAX, 1));
    EXPECT_TRUE(graphics->Draw(INT_MIN, INT_MIN, 1));
    std::vector<std::vector<float>> drawn;
    for (RecordedDraw const& draw : RecordingRenderer::GetDraws()) drawn.push_back(draw.vertices);
    using Floats = std::vector<float>;
    EXPECT_THAT(drawn, ElementsAre(Floats{0, 1, 2, 3, 4}, Floats{3, 4}, Floats{3, 4}, Floats{0}, Floats{},
                                   Floats{}, Floats{}, Floats{2, 3, 4}, Floats{}));
    EXPECT_EQ(RendererFactory::GetStatistics().drawRequests, 11u);
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 5u);

    // What is refused leaves nothing of the old behind.
    graphics->SetVertices(1, vertices, 5);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 2);
    graphics->Draw(0, -1, 1);
    EXPECT_EQ(RecordingRenderer::GetDraws().back().count, 0);
    graphics->SetVertices(0, vertices, 5);
    graphics->SetVertices(0, nullptr, 1);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 3);
    graphics->Draw(0, -1, 1);
    EXPECT_EQ(RecordingRenderer::GetDraws().back().count, 0);
    graphics->Release();
    program->Release();
}

TEST_F(RecordingDrawsTest, AStencilClipOutlastsStatesWithoutAStencilTest) {
    DepthStencilStateDescriptor test(false, true);
    test.SetStencilFunction(StencilEqual, 1, 255, 0);
    test.SetStencilOperation(StencilKeep, StencilZero, StencilIncrementSaturate);
    IDepthStencilState* const clip = RendererFactory::CreateDepthStencilState(test);
    IDepthStencilState* const deep = RendererFactory::CreateDepthStencilState({true, false});
    clip->Apply();
    RendererFactory::SetStencilClip(true);
    deep->Apply();
    PipelineState state = RecordingRenderer::GetState();
    EXPECT_TRUE(state.stencilClip);
    EXPECT_TRUE(state.depthStencil.IsDepth());
    DepthStencilStateDescriptor expected(true, true);
    expected.SetStencilFunction(StencilEqual, 1, 255, 0);
    expected.SetStencilOperation(StencilKeep, StencilZero, StencilIncrementSaturate);
    EXPECT_EQ(state.depthStencil, expected);

    test.SetStencilFunction(StencilNotEqual, 2, 255, 255);
    clip->SetDescriptor(test);
    clip->Apply(); // one with a test replaces it
    EXPECT_EQ(RecordingRenderer::GetState().depthStencil, test);
    RendererFactory::SetStencilClip(false);
    deep->Apply();
    EXPECT_FALSE(RecordingRenderer::GetState().depthStencil.IsStencil());
    EXPECT_EQ(RendererFactory::GetStatistics().depthStencilChanges, 4u);
    clip->Release();
    deep->Release();
}

TEST_F(RecordingDrawsTest, TheScissorIsRememberedAndBoundsClears) {
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    EXPECT_FALSE(rasterizer->IsScissorEnabled());
    rasterizer->SetScissorRect({1, -1, 9, 2}); // pixel (1, 0) of the 2 x 2
    target->ClearColor(0, 1, 0, 0);
    rasterizer->SetScissorEnabled(true);
    target->ClearColor(1, 1, 0, 0);
    EXPECT_THAT(RecordingRenderer::GetTexels(target),
                ElementsAre(0, 255, 0, 0, 255, 255, 0, 0, 0, 255, 0, 0, 0, 255, 0, 0));
    rasterizer->SetScissorRect({3, 4, -5, -6});
    EXPECT_EQ(rasterizer->GetScissorRect(), (ScissorRect{3, 4, 0, 0}));
    target->ClearColor(1, 1, 1, 1);
    EXPECT_EQ(RecordingRenderer::GetTexels(target)[2], 0);

    auto const clears = RecordingRenderer::GetClears();
    ASSERT_EQ(clears.size(), 3u);
    EXPECT_FALSE(clears[0].state.scissorOn);
    EXPECT_EQ(clears[1].state.scissor, (ScissorRect{1, -1, 9, 2}));
    EXPECT_THAT(clears[1].color, ElementsAre(1, 1, 0, 0));
    RendererFactory::DetachContext();
    RendererFactory::AttachContext();
    EXPECT_FALSE(rasterizer->IsScissorEnabled());
    target->Release();
    delete texture;
}

TEST_F(RecordingDrawsTest, GraphicsAndStatesAreWatchedLikeOtherObjects) {
    LogCapture log;
    VertexDescriptor const empty;
    EXPECT_EQ(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &empty, 0, 0), nullptr);
    RecordingRenderer::FailCreations(ObjectKind::GraphicsObject);
    RecordingRenderer::FailCreations(ObjectKind::BlendState);
    EXPECT_EQ(MakeGraphics(3), nullptr);
    EXPECT_EQ(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true)), nullptr);
    RecordingRenderer::StopFailing();
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 3);

    IGraphicsObject* const graphics = MakeGraphics(3);
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true));
    IDepthStencilState* const depth = RendererFactory::CreateDepthStencilState({false, false});
    EXPECT_EQ(RendererFactory::GetStatistics().graphicsObjects, 1);
    EXPECT_EQ(RendererFactory::GetStatistics().stateObjects, 2);
    std::thread([&] {
        blend->Apply();
        RendererFactory::GetRasterizerState()->IsScissorEnabled();
        RendererFactory::Commit();
    }).join();
    graphics->Release();
    EXPECT_FALSE(graphics->Draw(0, -1, 1));
    depth->Release();
    depth->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 1);
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("blend 1 Apply outside the render thread",
                            "rasterizer IsScissorEnabled outside the render thread",
                            "renderer Commit outside the render thread", "graphics 1 Draw after its release",
                            "depthstencil 1 Release after its release"));

    RendererFactory::DetachContext();
    RendererFactory::AttachContext();
    blend->Apply(); // inert
    EXPECT_EQ(RecordingRenderer::GetState().blend, PipelineState().blend);
    blend->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
}

TEST_F(RecordingDrawsTest, WithoutRecordsOnlyLiveObjectsTakeMemory) {
    delete MakeTexture(); // kept so far
    IShaderProgram* const program = MakeProgram();
    program->MakeCurrent();
    IGraphicsObject* const graphics = MakeGraphics(1);
    float const vertex = 1;
    graphics->SetVertices(0, &vertex, 1);
    graphics->Draw(0, 1, 1);
    detail::Device const& device = detail::Device::Get();
    EXPECT_EQ(device.objects.size(), 3u);
    RecordingRenderer::KeepRecords(false);
    EXPECT_EQ(device.objects.size(), 2u);

    for (int i = 0; i < 3; ++i) {
        ITextureObject* const texture = MakeTexture();
        texture->Bind(i);
        IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
        IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
        target->Activate();
        target->ClearColor(1, 1, 1, 1);
        EXPECT_TRUE(graphics->Draw(0, -1, 1));
        RendererFactory::GetRasterizerState()->SetScissorEnabled(i % 2 == 0);
        target->Release();
        buffer->Release();
        delete texture;
    }
    EXPECT_EQ(device.objects.size(), 2u);
    EXPECT_THAT(device.texturesByAddress, IsEmpty());
    EXPECT_THAT(RecordingRenderer::GetCalls(), IsEmpty());
    EXPECT_THAT(RecordingRenderer::GetEvents(), IsEmpty());
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 4u);

    // A handle outlives its program, which goes with it.
    IParameterBinding* const parameter = program->GetParameter("uOn");
    program->Release();
    EXPECT_EQ(device.objects.size(), 2u);
    delete parameter;
    graphics->Release();
    EXPECT_THAT(device.objects, IsEmpty());
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
    RecordingRenderer::KeepRecords(true);
    delete MakeTexture();
    EXPECT_THAT(RecordingRenderer::TakeCalls(), ElementsAre("texture 5 Create 2 2", "texture 5 Release"));
}

} // namespace
} // namespace Moka::Testing
