// Frame buffers counted by canvases, depth-stencil buffers counted by requests.
#include "moka/graphics/bitmap/MKSubBitmapRT.h"
#include "tests/unit/bitmap/BitmapFixture.h"

namespace Moka::Testing {
namespace {

class FrameBuffer : public BitmapFixture {
protected:
    void SetUp() override {
        BitmapFixture::SetUp();
        RecordingRenderer::DeclareRenderThread();
        strip = RefPtr<MKSubBitmapRT>::Adopt(
            new MKSubBitmapRT(&queue, 0, Rect(0, 0, 4, 4), 4, 4, nullptr, false));
    }
    void TearDown() override {
        strip = {};
        RecordingRenderer::DeclareNoRenderThread();
        BitmapFixture::TearDown();
    }

    static int Targets() { return RendererFactory::GetStatistics().renderTargets; }
    static int Buffers() { return RendererFactory::GetStatistics().depthStencilBuffers; }

    RefPtr<MKSubBitmapRT> strip;
};

TEST_F(FrameBuffer, LivesFromTheFirstCanvasToTheLast) {
    strip->CreateFrameBufferRT(false);
    strip->CreateFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Targets(), 0);
    strip->ReleaseFrameBufferRT(false); // one too many
    strip->CreateFrameBufferRT(false);
    EXPECT_EQ(Targets(), 1);
}

TEST_F(FrameBuffer, DepthAndStencilShareOneBufferAndOneCount) {
    strip->AttachDepthBuffer();
    EXPECT_EQ(Buffers(), 0) << "nothing to attach to yet, and nothing counted";
    strip->CreateFrameBufferRT(false);
    strip->DetachDepthBuffer();
    strip->AttachDepthBuffer();
    strip->AttachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 1);
    strip->DetachDepthBuffer();
    EXPECT_EQ(Buffers(), 1);
    strip->DetachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 0);
    EXPECT_EQ(RecordingRenderer::CountCalls("AttachDepthStencil"), 1);
    EXPECT_EQ(RecordingRenderer::CountCalls("DetachDepthStencil"), 1);
}

TEST_F(FrameBuffer, TheLastCanvasTakesTheDepthStencilBufferAlong) {
    strip->CreateFrameBufferRT(false);
    strip->AttachStencilBufferRT(false);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Buffers(), 0);
    EXPECT_EQ(Targets(), 0);
}

// After that the request is still counted: another one finds no buffer, and the last detach has nothing to
// delete.
TEST_F(FrameBuffer, RequestsLeftOpenStayCountedAndNothingIsDeletedTwice) {
    strip->CreateFrameBufferRT(false);
    strip->AttachStencilBufferRT(false);
    strip->ReleaseFrameBufferRT(false);
    strip->CreateFrameBufferRT(false);
    strip->AttachDepthBuffer();
    EXPECT_EQ(Buffers(), 0);
    strip->DetachDepthBuffer();
    strip->DetachStencilBufferRT(false);
    strip->AttachStencilBufferRT(false);
    EXPECT_EQ(Buffers(), 1) << "counted from zero again, so a buffer is made";
    strip->ReleaseFrameBufferRT(false);
    strip->CreateFrameBufferRT(false);
    strip = {}; // with the request open and its buffer gone
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
}

TEST_F(FrameBuffer, DiscardFlagsAreTheTwoBits) {
    strip->CreateFrameBufferRT(false);
    RecordingRenderer::TakeCalls();
    for (int discard : {0, 1, 2, 3})
        strip->DeactivateFrameBufferRT(false, static_cast<DiscardFramebufferType>(discard));
    std::vector<std::string> const calls = RecordingRenderer::TakeCalls();
    ASSERT_EQ(calls.size(), 4u);
    char const* const expected[] = {"0 0", "1 0", "0 1", "1 1"};
    for (std::size_t i = 0; i < 4; ++i)
        EXPECT_EQ(calls[i], std::string("target 1 Deactivate ") + expected[i]);
}

TEST_F(FrameBuffer, FailedCreationsLeaveEverythingInert) {
    for (ObjectKind kind : {ObjectKind::RenderTarget, ObjectKind::DepthStencilBuffer}) {
        RecordingRenderer::FailCreations(kind);
        strip->CreateFrameBufferRT(false);
        strip->AttachStencilBufferRT(false);
        strip->ActivateFrameBufferRT(false);
        strip->ClearColorRT(1, 1, 1, 1);
        strip->ClearDepthStencilRT(true, 1, true, 0);
        strip->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
        bool const drawable = kind != ObjectKind::RenderTarget;
        EXPECT_EQ(strip->GetPixel(Point(0, 0)), drawable ? 0xFFFFFFFFu : 0u);
        strip->DetachStencilBufferRT(false);
        strip->ReleaseFrameBufferRT(false);
        RecordingRenderer::StopFailing();
    }
}

} // namespace
} // namespace Moka::Testing
