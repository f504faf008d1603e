// Frame buffers counted by canvases, depth-stencil buffers counted by requests.
#include "moka/graphics/bitmap/MKSubBitmapRT.h"
#include "tests/unit/bitmap/BitmapFixture.h"

namespace Moka::Testing {
namespace {

class FrameBuffer : public BitmapFixture {
protected:
    void SetUp() override {
        BitmapFixture::SetUp();
        RendererTrace::DeclareRenderThread();
        strip = RefPtr<MKSubBitmapRT>::Adopt(
            new MKSubBitmapRT(&queue, 0, Rect(0, 0, 4, 4), 4, 4, nullptr, false));
    }
    void TearDown() override {
        strip = {};
        RendererTrace::DeclareNoRenderThread();
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
    Pixels pixels(4 * 4 * 4);
    strip->GetBitmapData(Rect(0, 0, 4, 4), pixels.data());
    strip->GetPixel(Point(1, 1));
    EXPECT_EQ(Targets(), 0) << "reading gives back what it takes";
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
    EXPECT_EQ(RendererTrace::CountCalls("AttachDepthStencil"), 1);
    EXPECT_EQ(RendererTrace::CountCalls("DetachDepthStencil"), 1);
}

// After that the request is still counted: another one finds no buffer, and the last detach has nothing to
// delete.
TEST_F(FrameBuffer, TheLastCanvasTakesTheBufferAlongAndOpenRequestsStayCounted) {
    strip->CreateFrameBufferRT(false);
    strip->AttachStencilBufferRT(false);
    strip->ReleaseFrameBufferRT(false);
    EXPECT_EQ(Buffers() + Targets(), 0);
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
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
}

TEST_F(FrameBuffer, DiscardFlagsAreTheTwoBits) {
    strip->CreateFrameBufferRT(false);
    RendererTrace::TakeCalls();
    for (int discard : {0, 1, 2, 3})
        strip->DeactivateFrameBufferRT(false, static_cast<DiscardFramebufferType>(discard));
    EXPECT_EQ(RendererTrace::TakeCalls(),
              (std::vector<std::string>{"target 1 Deactivate 0 0", "target 1 Deactivate 1 0",
                                        "target 1 Deactivate 0 1", "target 1 Deactivate 1 1"}));
}

} // namespace
} // namespace Moka::Testing
