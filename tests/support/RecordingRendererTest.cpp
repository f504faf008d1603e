// What the recording renderer must notice or fail in: were it silent, no test over it would be the wiser.
#include "tests/support/RecordingRenderer.h"

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
#include "tests/support/RecordingDevice.h"

#include <gmock/gmock.h>

#include <atomic>
#include <climits>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

class RecordingRendererTest : public ::testing::Test {
protected:
    RecordingRendererTest() {
        RecordingRenderer::Reset();
        RendererFactory::AttachContext();
    }
    ~RecordingRendererTest() override { RecordingRenderer::Reset(); }

    static ITextureObject* MakeTexture(int width = 2, int height = 2) {
        return RendererFactory::CreateTextureObject(
            TextureDescriptor(width, height, 0, 2, 6, 1, false, nullptr), nullptr, 0, {});
    }
    static IGraphicsObject* MakeGraphics(VertexDescriptor const& descriptor) {
        return RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleStrip, &descriptor, 0, 0);
    }
    static IGraphicsObject* MakeGraphics() {
        VertexDescriptor descriptor;
        descriptor.addAttribute(VertexAttributeType::Float, 1, -1, 0);
        return MakeGraphics(descriptor);
    }
    static IShaderProgram* MakeProgram() {
        return RendererFactory::CreateShaderProgram("uniform vec2 uSize;", "uniform bool uOn;", "Sample");
    }

    LogCapture log;
};

TEST_F(RecordingRendererTest, UseAfterReleaseAndSecondReleaseAreNoticedEachTime) {
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
    IGraphicsObject* const graphics = MakeGraphics();
    target->ClearColor(1, 0.5f, -3, 0);
    delete texture;
    texture->Bind(0);
    EXPECT_EQ(RecordingRenderer::GetBoundTexture(0), "none");
    // cppcheck-suppress doubleFree ; what this is about
    delete texture;
    // cppcheck-suppress doubleFree
    delete texture;
    EXPECT_EQ(RendererFactory::CreateOffscreenRenderTarget(texture), nullptr);
    EXPECT_EQ(RendererFactory::CreateTextureObject(TextureDescriptor(texture), nullptr, 0, {}), nullptr);
    buffer->Release();
    buffer->Release();
    target->AttachDepthStencil(buffer);
    target->Release();
    target->ClearColor(1, 1, 1, 1);
    target->Release();
    EXPECT_THAT(RecordingRenderer::GetTexels(texture)[1], 128);
    graphics->Release();
    EXPECT_FALSE(graphics->Draw(0, -1, 1));
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(
        RecordingRenderer::GetViolations(),
        ElementsAre("texture 1 Bind after its release", "texture 1 Release after its release",
                    "texture 1 Release after its release", "texture 1 made a target after its release",
                    "texture 1 GetWidth after its release", "texture 1 GetHeight after its release",
                    "texture 1 used as a model after its release", "buffer 1 Release after its release",
                    "buffer 1 attached after its release", "target 1 ClearColor after its release",
                    "target 1 Release after its release", "graphics 1 Draw after its release"));
}

TEST_F(RecordingRendererTest, ABufferBelongsToATargetOfItsSizeUntilDetached) {
    ITextureObject* const texture = MakeTexture();
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const fitting = RendererFactory::CreateDepthStencilBuffer(2, 2);
    IDepthStencilBuffer* const other = RendererFactory::CreateDepthStencilBuffer(2, 3);
    target->AttachDepthStencil(fitting);
    target->DetachDepthStencil();
    target->AttachDepthStencil(other);
    other->Release();
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("buffer 2 attached to target 1 of another size"));
    target->AttachDepthStencil(fitting);
    fitting->Release();
    EXPECT_EQ(RecordingRenderer::GetViolations().back(), "buffer 1 released while attached to target 1");
    target->ClearDepthStencil(true, 1, true, 0);
    EXPECT_EQ(RecordingRenderer::GetClears().back().buffer, "none");
    target->Release();
    delete texture;
}

TEST_F(RecordingRendererTest, EveryThreadButTheDeclaredOneIsNoticed) {
    ITextureObject* texture = nullptr;
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true));
    std::thread([&] {
        texture = MakeTexture();
        blend->Apply();
        RendererFactory::GetRasterizerState()->IsScissorEnabled();
        RendererFactory::Commit();
        RecordingRenderer::DeclareRenderThread();
        texture->Bind(2);
    }).join();
    texture->Bind(3);
    RecordingRenderer::DeclareNoRenderThread();
    delete texture;
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("renderer CreateTextureObject outside the render thread",
                            "blend 1 Apply outside the render thread",
                            "rasterizer IsScissorEnabled outside the render thread",
                            "renderer Commit outside the render thread",
                            "texture 1 Bind outside the render thread",
                            "texture 1 Release outside the render thread"));
    RendererFactory::DetachContext();
    blend->Release();
    EXPECT_EQ(MakeTexture(), nullptr);
    EXPECT_EQ(RecordingRenderer::GetViolations().back(), "renderer CreateTextureObject without a context");
}

TEST_F(RecordingRendererTest, ObjectsOfAFormerContextAreInertAndNotCountedAgain) {
    ITextureObject* const texture = MakeTexture(1, 1);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(BlendStateDescriptor(true));
    RendererFactory::DetachContext();
    RendererFactory::AttachContext();
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 0);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 3);
    target->ClearColor(1, 1, 1, 1);
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), Each(0));
    blend->Apply();
    EXPECT_EQ(RecordingRenderer::GetState().blend, PipelineState().blend);
    std::thread([&] { delete texture; }).join();
    target->Release();
    blend->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, PlannedCreationsFailWithOneErrorLineAndNoOthers) {
    RecordingRenderer::FailCreation(2);
    RecordingRenderer::FailCreations(ObjectKind::GraphicsObject);
    ITextureObject* const first = MakeTexture();
    EXPECT_EQ(MakeTexture(), nullptr);
    ITextureObject* const third = MakeTexture();
    EXPECT_EQ(MakeGraphics(), nullptr);
    EXPECT_EQ(MakeGraphics(), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 3);
    RecordingRenderer::StopFailing();
    IGraphicsObject* const graphics = MakeGraphics();
    ASSERT_NE(first, nullptr);
    ASSERT_NE(third, nullptr);
    ASSERT_NE(graphics, nullptr);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 3);
    delete first;
    delete third;
    graphics->Release();
}

TEST_F(RecordingRendererTest, WhatADeviceRefusesIsRefused) {
    RecordingRenderer::SetMaxTextureSize(8);
    EXPECT_EQ(MakeTexture(9, 1), nullptr);
    EXPECT_EQ(MakeTexture(1, 0), nullptr);
    EXPECT_EQ(RendererFactory::CreateDepthStencilBuffer(0, 1), nullptr);
    EXPECT_EQ(RendererFactory::CreateOffscreenRenderTarget(nullptr), nullptr);
    EXPECT_EQ(MakeGraphics(VertexDescriptor()), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 5);
    ITextureObject* const texture = MakeTexture(8, 8);
    texture->SetParameter(TextureParamWrappingT, 2);
    texture->SetParameter(TextureParamFilteringMin, TextureWrapMirroredRepeat);
    texture->SetParameter(2, 0);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "SetParameter"), 3);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingT), TextureWrapClampToEdge);
    delete texture;
    EXPECT_FALSE(RendererFactory::AttachContext({7}));
}

TEST_F(RecordingRendererTest, ADrawIsWrittenDownWithTheStateOfItsMoment) {
    IGraphicsObject* const graphics = MakeGraphics();
    float vertices[] = {0, 1, 2, 3, 4};
    graphics->SetVertices(0, vertices, 5);
    vertices[1] = 99;                       // they were copied
    EXPECT_FALSE(graphics->Draw(0, -1, 1)); // no program
    IShaderProgram* const program = MakeProgram();
    IParameterBinding* const on = program->GetParameter("uOn");
    bool value = true;
    on->Set(&value);
    program->MakeCurrent();
    for (auto const& [first, count] :
         {std::pair(1, 2), {3, 9}, {-2, 3}, {5, 1}, {2, INT_MAX}, {0, INT_MIN}}) {
        EXPECT_TRUE(graphics->Draw(first, count, 1));
    }
    value = false;
    on->Set(&value);
    // What is refused leaves nothing of the old behind.
    graphics->SetVertices(1, vertices, 5);
    graphics->Draw(0, -1, 1);
    EXPECT_FALSE(graphics->Draw(0, -1, 2));
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 2);

    std::vector<std::vector<float>> drawn;
    for (RecordedDraw const& draw : RecordingRenderer::GetDraws()) drawn.push_back(draw.vertices);
    using Floats = std::vector<float>;
    EXPECT_THAT(drawn, ElementsAre(Floats{1, 2}, Floats{3, 4}, Floats{0}, Floats{}, Floats{2, 3, 4}, Floats{},
                                   Floats{}));
    EXPECT_EQ(RecordingRenderer::GetDraws().front().uniforms.at("uOn").text, "1");
    EXPECT_EQ(RecordingRenderer::GetDraws().back().uniforms.at("uOn").text, "0");
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 4u);
    delete on;
    program->Release();
    graphics->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, WithoutRecordsOnlyLiveObjectsTakeMemory) {
    delete MakeTexture(); // kept so far
    IShaderProgram* const program = MakeProgram();
    program->MakeCurrent();
    IGraphicsObject* const graphics = MakeGraphics();
    detail::Device const& device = detail::Device::Get();
    EXPECT_EQ(device.objects.size(), 3u);
    RecordingRenderer::KeepRecords(false);
    for (int i = 0; i < 3; ++i) {
        ITextureObject* const texture = MakeTexture();
        texture->Bind(i);
        IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
        target->Activate();
        target->ClearColor(1, 1, 1, 1);
        target->ClearDepthStencil(true, 1, true, 0);
        EXPECT_TRUE(graphics->Draw(0, -1, 1));
        target->Release();
        delete texture;
    }
    EXPECT_EQ(device.objects.size(), 2u);
    EXPECT_THAT(device.texturesByAddress, IsEmpty());
    EXPECT_THAT(RecordingRenderer::GetCalls(), IsEmpty());
    EXPECT_THAT(RecordingRenderer::GetEvents(), IsEmpty());

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

TEST_F(RecordingRendererTest, ManyThreadsMayAskWhileTheRenderThreadWorks) {
    std::atomic<bool> done{false};
    auto const watch = [&] {
        while (!done) {
            EXPECT_LE(RendererFactory::GetStatistics().textures, 1);
            EXPECT_GT(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(), 0);
            RecordingRenderer::GetCalls();
        }
    };
    std::thread watchers[] = {std::thread(watch), std::thread(watch)};
    for (int i = 0; i < 200; ++i) delete MakeTexture();
    done = true;
    for (std::thread& watcher : watchers) watcher.join();
    EXPECT_EQ(RecordingRenderer::CountCalls("Release"), 200);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

} // namespace
} // namespace Moka::Testing
