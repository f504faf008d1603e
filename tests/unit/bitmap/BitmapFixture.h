// BitmapFixture: bitmaps over the tracing renderer and a hand-pumped queue. The test's thread stands for
// the render thread only while tasks run, so GPU work that should have been posted is a violation. Every test
// ends with nothing alive and nothing misused.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/MKTextureBitmap.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/PumpedRenderer.h"
#include "tests/support/TestImages.h"

#include <cstring>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace Moka::Testing {

using Pixels = std::vector<unsigned char>;
using BitmapPtr = RefPtr<IMKBitmap>;

inline Pixels UniquePixels(int width, int height) { return MakeGradient(width, height).pixels; }

inline unsigned int PixelAt(Pixels const& pixels, int width, int x, int y) {
    unsigned int pixel = 0;
    std::memcpy(&pixel, &pixels[static_cast<std::size_t>(y * width + x) * 4], 4);
    return pixel;
}

inline int CountOf(IMKBitmap* bitmap) { return dynamic_cast<RefCount*>(bitmap)->GetRefCount(); }
inline int CountOf(IMKSubBitmap* strip) { return dynamic_cast<RefCount*>(strip)->GetRefCount(); }

// What the callbacks of asynchronous reads were given.
struct Seen {
    int calls = 0;
    unsigned int pixel = 1;
    Rect rect;
    void* destination = nullptr;
    static void OnPixel(unsigned int pixel, void* seen) {
        auto* const self = static_cast<Seen*>(seen);
        ++self->calls;
        self->pixel = pixel;
    }
    static void OnData(Rect const& r, void* destination, void* seen) {
        auto* const self = static_cast<Seen*>(seen);
        ++self->calls;
        self->rect = r;
        self->destination = destination;
    }
};

class BitmapFixture : public ::testing::Test {
protected:
    static constexpr int kMaxSide = 64;

    // When the members of the fixtures that derive from it are gone.
    ~BitmapFixture() override {
        queue.RunAll();
        EXPECT_EQ(RendererTrace::CountLiveObjects(), mAliveBefore);
        for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
    }

    IMKBitmap* Create(int width, int height, void const* pixels = nullptr) {
        return MKGraphicsFactory::CreateBitmap(&queue, width, height, pixels, false, 1, false);
    }
    BitmapPtr NewBitmap(int width, int height, void const* pixels = nullptr) {
        return BitmapPtr::Adopt(Create(width, height, pixels));
    }
    static Pixels ReadAll(BitmapPtr const& bitmap) {
        Rect const r = bitmap->GetBitmapRect();
        Pixels pixels(static_cast<std::size_t>(r.GetWidth() * r.GetHeight() * 4));
        bitmap->GetBitmapData(r, pixels.data());
        return pixels;
    }
    static IMKSubBitmap* StripOf(BitmapPtr const& bitmap, int i = 0) {
        return bitmap->GetTextureBitmap()->GetSubBitmap(i);
    }

    // On the render thread, which the test's thread then is until the end of the scope.
    struct OnRenderThread {
        OnRenderThread() { RendererTrace::DeclareRenderThread(); }
        ~OnRenderThread() { RendererTrace::DeclareNoRenderThread(); }
        OnRenderThread(OnRenderThread const&) = delete;
        OnRenderThread& operator=(OnRenderThread const&) = delete;
    };

    static std::string LabelOf(ITextureObject* texture) {
        OnRenderThread const here;
        return texture->GetLabel();
    }

    bool refuse = false; // what the queue does with the next tasks
    PumpedRenderer queue{kMaxSide, [this] { return refuse; }};

private:
    int const mAliveBefore = RendererTrace::CountLiveObjects(); // other tests leak on purpose
};

} // namespace Moka::Testing
