// What the recorder keeps over flushes, contexts and threads. Pictures are for the tests with a driver.
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "moka/renderer/record/ProgramState.h"
#include "tests/support/RendererTrace.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <thread>
#include <utility>

namespace Moka::Testing {
namespace {

constexpr std::uint64_t kBytes = 4 * sizeof(float); // of the vertices that these tests hand over

class RecorderTest : public ::testing::Test {
protected:
    RecorderTest() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
        RendererFactory::SetDeferred(true);
        VertexDescriptor descriptor;
        descriptor.addAttribute(VertexAttributeType::Float, 1, -1, 0);
        graphics = RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &descriptor, 0, 0);
        program = RendererFactory::CreateShaderProgram("", "uniform float uWidth;", "Sample");
        width = program->GetParameter("uWidth");
        texture = RendererFactory::CreateTextureObject(TextureDescriptor(2, 2, 0, 2, 6, 1, false, nullptr),
                                                       nullptr, 0, {});
        target = RendererFactory::CreateOffscreenRenderTarget(texture);
        program->MakeCurrent();
        target->Activate();
        RendererFactory::Flush();
    }
    ~RecorderTest() override {
        graphics->Release();
        delete width;
        program->Release();
        if (target) target->Release();
        delete texture;
        RendererTrace::Reset();
    }

    void SetVertices(std::initializer_list<float> vertices) {
        graphics->SetVertices(0, std::data(vertices), static_cast<int>(vertices.size()));
    }
    static std::uint64_t CountVertexBytes() { return RendererFactory::GetStatistics().vertexBytes; }
    float GetWidthInForce() const {
        float value = 0;
        std::memcpy(&value, detail::GetAttachedRecorder()->requested->GetProgram()->GetValues().data(),
                    sizeof value);
        return value;
    }

    IGraphicsObject* graphics = nullptr;
    IShaderProgram* program = nullptr;
    IParameterBinding* width = nullptr;
    ITextureObject* texture = nullptr;
    IRenderTarget* target = nullptr;
};

TEST_F(RecorderTest, VerticesAreHandedOverOnceAndDrawnAgainAfterAFlush) {
    SetVertices({9, 9, 9, 9}); // never drawn
    SetVertices({0, 1, 2, 3});
    EXPECT_TRUE(graphics->Draw(0, -1, 1));
    RendererFactory::GetRasterizerState()->SetScissorEnabled(true); // so that the next draw is not joined
    EXPECT_TRUE(graphics->Draw(1, 2, 1));
    RendererFactory::Flush();
    EXPECT_EQ(CountVertexBytes(), kBytes);
    target->Activate();
    EXPECT_TRUE(graphics->Draw(1, 2, 1));
    RendererFactory::Flush();
    EXPECT_EQ(CountVertexBytes(), 2 * kBytes);
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 3u);
    for (TracedDraw const& draw : RendererTrace::GetDraws()) {
        EXPECT_EQ(draw.vertices[static_cast<std::size_t>(1 - draw.first)], 1);
    }
}

// Vertices that nobody drew are replaced in the list only while they are its end.
TEST_F(RecorderTest, VerticesOfTwoObjectsStayEachItsOwnWhicheverGetsNewOnes) {
    VertexDescriptor descriptor;
    descriptor.addAttribute(VertexAttributeType::Float, 1, -1, 0);
    IGraphicsObject* const other =
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &descriptor, 0, 0);
    float const vertices[] = {5, 6, 7};
    SetVertices({0, 1, 2});
    other->SetVertices(0, vertices, 3);
    SetVertices({10, 11, 12, 13, 14, 15});
    EXPECT_TRUE(other->Draw(0, -1, 1));
    EXPECT_TRUE(graphics->Draw(0, -1, 1));
    std::vector<TracedDraw> const draws = RendererTrace::GetDraws();
    ASSERT_EQ(draws.size(), 2u);
    EXPECT_EQ(draws[0].vertices[0], 5);
    EXPECT_EQ(draws[1].vertices[0], 10);
    other->Release();
}

TEST_F(RecorderTest, AProgramBuiltAgainInANewContextKeepsItsValuesAndHandles) {
    float value = 2.5f;
    width->Set(&value);
    RendererFactory::DetachContext();
    value = 3;
    width->Set(&value);
    IShaderProgram* const homeless =
        RendererFactory::CreateShaderProgram("", "uniform float uWidth;", "Late");
    std::unique_ptr<IParameterBinding> early(homeless->GetParameter("uWidth"));
    EXPECT_EQ(early->GetType(), BindingTypeUnknown);
    RendererFactory::AttachContext();
    EXPECT_EQ(RendererFactory::GetStatistics().programs, 0);
    program->MakeCurrent();
    EXPECT_EQ(RendererFactory::GetStatistics().programs, 1);
    EXPECT_EQ(GetWidthInForce(), 3);
    value = 4;
    width->Set(&value);
    EXPECT_EQ(GetWidthInForce(), 4);
    // One that was created without a context takes values once it was built.
    homeless->MakeCurrent();
    early.reset(homeless->GetParameter("uWidth"));
    value = 5;
    early->Set(&value);
    EXPECT_EQ(GetWidthInForce(), 5);
    homeless->Release();
}

TEST_F(RecorderTest, WhatAnotherThreadDropsIsDeletedByTheNextRequestThatFindsItUnused) {
    target->ClearColor(1, 1, 1, 1);
    target->Deactivate(false, false);
    target->Release();
    target = nullptr;
    std::thread([this] { delete std::exchange(texture, nullptr); }).join();
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 0);
    program->MakeCurrent();
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 1) << "the clear waits in the list";
    RendererFactory::Flush();
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 0);
    EXPECT_EQ(RendererFactory::GetStatistics().frameBuffers, 0);
}

} // namespace
} // namespace Moka::Testing
