// What the recorder keeps over flushes, contexts and threads. Pictures are for the tests with a driver.
#include "tests/unit/renderer/RecorderFixture.h"

#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/record/ProgramState.h"

#include <cstring>
#include <thread>

namespace Moka::Testing {
namespace {

constexpr std::uint64_t kBytes = 4 * sizeof(float); // of the vertices that these tests hand over

class RecorderTest : public RecorderFixture {
protected:
    static float GetWidthInForce() {
        float value = 0;
        std::memcpy(&value, detail::GetAttachedRecorder()->requested->GetProgram()->GetValues().data(),
                    sizeof value);
        return value;
    }
};

TEST_F(RecorderTest, VerticesAreHandedOverOnceAndDrawnAgainAfterAFlush) {
    SetVertices({9, 9, 9, 9}); // never drawn
    SetVertices({0, 1, 2, 3});
    EXPECT_TRUE(graphics->Draw(0, -1, 1));
    RendererFactory::GetRasterizerState()->SetScissorEnabled(true); // so that the next draw is not joined
    EXPECT_TRUE(graphics->Draw(1, 2, 1));
    RendererFactory::Flush();
    EXPECT_EQ(Count().vertexBytes, kBytes);
    target->Activate();
    EXPECT_TRUE(graphics->Draw(1, 2, 1));
    RendererFactory::Flush();
    EXPECT_EQ(Count().vertexBytes, 2 * kBytes);
    EXPECT_EQ(Count().draws, 3u);
    for (TracedDraw const& draw : RendererTrace::GetDraws()) {
        EXPECT_EQ(draw.vertices[static_cast<std::size_t>(1 - draw.first)], 1);
    }
}

// Vertices that nobody drew are replaced in the list only while they are its end.
TEST_F(RecorderTest, VerticesOfTwoObjectsStayEachItsOwnWhicheverGetsNewOnes) {
    RendererPtr<IGraphicsObject> const other = MakeGraphics();
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
}

TEST_F(RecorderTest, AProgramBuiltAgainInANewContextKeepsItsValuesAndHandles) {
    SetWidth(2.5f);
    RendererFactory::DetachContext();
    SetWidth(3);
    RendererPtr<IShaderProgram> const homeless = MakeProgram();
    std::unique_ptr<IParameterBinding> const early(homeless->GetParameter("width"));
    EXPECT_EQ(early->GetType(), BindingTypeUnknown);
    RendererFactory::AttachContext();
    EXPECT_EQ(Count().programs, 0);
    program->MakeCurrent();
    EXPECT_EQ(Count().programs, 1);
    EXPECT_EQ(GetWidthInForce(), 3);
    SetWidth(4);
    EXPECT_EQ(GetWidthInForce(), 4);
    // One that was created without a context takes values once it was built.
    homeless->MakeCurrent();
    width.reset(homeless->GetParameter("width"));
    SetWidth(5);
    EXPECT_EQ(GetWidthInForce(), 5);
}

TEST_F(RecorderTest, WhatAnotherThreadDropsIsDeletedByTheNextRequestThatFindsItUnused) {
    target->ClearColor(1, 1, 1, 1);
    target->Deactivate(false, false);
    target.reset();
    std::thread([this] { texture.reset(); }).join();
    EXPECT_EQ(Count().textureObjects, 0);
    program->MakeCurrent();
    EXPECT_EQ(Count().textures, 1) << "the clear waits in the list";
    RendererFactory::Flush();
    EXPECT_EQ(Count().textures, 0);
    EXPECT_EQ(Count().frameBuffers, 0);
}

} // namespace
} // namespace Moka::Testing
