// BitmapFixture: bitmaps over the recording renderer and a hand-pumped queue. The test's thread stands for
// the render thread only while tasks run, so GPU work that should have been posted is a violation. Every test
// ends with nothing alive and nothing misused.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/MKGraphicsFactory.h"
#include "moka/graphics/bitmap/MKTextureBitmap.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/Queues.h"
#include "tests/support/RecordingRenderer.h"
#include "tests/support/TestImages.h"

#include <cmath>
#include <cstring>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {

using Pixels = std::vector<unsigned char>;

inline Pixels UniquePixels(int width, int height) { return MakeGradient(width, height).pixels; }

inline unsigned int PixelAt(Pixels const& pixels, int width, int x, int y) {
    unsigned int pixel = 0;
    std::memcpy(&pixel, &pixels[static_cast<std::size_t>(y * width + x) * 4], 4);
    return pixel;
}

inline int CountOf(IMKBitmap* bitmap) { return dynamic_cast<RefCount*>(bitmap)->GetRefCount(); }
inline int CountOf(IMKSubBitmap* strip) { return dynamic_cast<RefCount*>(strip)->GetRefCount(); }

class BitmapFixture : public ::testing::Test {
protected:
    static constexpr int kMaxSide = 64;

    void SetUp() override {
        RecordingRenderer::Reset();
        RecordingRenderer::SetMaxTextureSize(kMaxSide);
        ASSERT_TRUE(RendererFactory::AttachContext());
        RecordingRenderer::DeclareNoRenderThread();
        for (HandPumpedQueue* q :
             {static_cast<HandPumpedQueue*>(&queue), static_cast<HandPumpedQueue*>(&picky)})
            q->SetAroundRun([] { RecordingRenderer::DeclareRenderThread(); },
                            [] { RecordingRenderer::DeclareNoRenderThread(); });
    }

    void TearDown() override {
        queue.RunAll();
        picky.RunAll();
        EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
        ExpectNoViolations();
        RecordingRenderer::DeclareRenderThread();
        RendererFactory::DetachContext();
    }

    static void ExpectNoViolations() {
        for (std::string const& violation : RecordingRenderer::GetViolations()) ADD_FAILURE() << violation;
    }

    IMKBitmap* Create(int width, int height, void const* pixels = nullptr) {
        return MKGraphicsFactory::CreateBitmap(&queue, width, height, pixels, false, 1, false);
    }

    // On the render thread, which the test's thread then is until the end of the scope.
    struct OnRenderThread {
        OnRenderThread() { RecordingRenderer::DeclareRenderThread(); }
        ~OnRenderThread() { RecordingRenderer::DeclareNoRenderThread(); }
        OnRenderThread(OnRenderThread const&) = delete;
        OnRenderThread& operator=(OnRenderThread const&) = delete;
    };

    static std::string LabelOf(ITextureObject* texture) {
        OnRenderThread const here;
        return texture->GetLabel();
    }

    HandPumpedQueue queue;
    bool refuse = false; // what picky does with the next tasks
    RefusingQueue picky{RefusingQueue::Predicate([this](int, ITask*) { return refuse; })};
};

} // namespace Moka::Testing
