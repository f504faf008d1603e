// What is drawn onto a bitmap that has no frame buffer goes nowhere, and not into the host's window.
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IRenderTarget.h"
#include "scenes/SceneRenderer.h"
#include "tests/pixel/RenderThreadFixture.h"
#include "tests/support/ImageCompare.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
constexpr int kSide = 64;      // of the window
constexpr int kMaxSide = 1024; // of a texture
constexpr Color kWindow{51, 102, 153, 255};

// Hands tasks on to the render thread, but for the ordinal-th from now.
class PickyQueue final : public IGLMsgQueue {
public:
    explicit PickyQueue(IGLMsgQueue& real) : mReal(real) {}
    void Refuse(int ordinal) { mLeft = ordinal; }
    bool Post(ITask* task) override { return --mLeft != 0 && mReal.Post(task); }
    void WaitForTasks() override { mReal.WaitForTasks(); }

private:
    IGLMsgQueue& mReal;
    int mLeft = 0;
};

class NoFrameBuffer : public RenderThreadFixture {
protected:
    NoFrameBuffer() : RenderThreadFixture(kMaxSide, kSide) {
        thread->Call([this] {
            window = RendererFactory::CreateRenderTargetFromDefault(kSide, kSide);
            window->ClearColor(0.2f, 0.4f, 0.6f, 1);
        });
    }
    ~NoFrameBuffer() override {
        thread->Call([this] { window->Release(); });
    }

    BitmapPtr Create(int width, int height, void const* pixels = nullptr) {
        return NewBitmap(queue, width, height, pixels);
    }

    // All that need no pen, with their bitmaps or without.
    void DrawScenes(RefPtr<IMKCanvas> const& canvas) {
        Scenes::QueueStage stage(queue);
        for (Scenes::Scene const& scene : Scenes::GetScenes())
            if (!scene.needsPen) DrawScene(scene, *canvas, stage);
    }

    Picture ReadWindow() {
        Picture image(kSide, kSide);
        thread->Call([&] { window->ReadPixels(0, 0, kSide, kSide, {image.pixels.data(), kSide, 0, 0}); });
        return image;
    }

    void ExpectWindowUntouched(char const* what) {
        Picture const expected = MakeChecker(kSide, kSide, 1, kWindow, kWindow);
        EXPECT_EQ(CompareImages(expected, ReadWindow()).differingPixels, 0) << what;
    }

    PickyQueue queue{*thread};
    IRenderTarget* window = nullptr;
};

TEST_F(NoFrameBuffer, OfABitmapThatIsTooWideNothingIsDrawnAndOneErrorTellsOfIt) {
    DrawScenes(NewCanvas(queue, Create(kMaxSide + 1, kSide)));
    ExpectWindowUntouched("too wide");
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 1);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "1025 x 64 is refused"), 1);
    log.Clear();
}

TEST_F(NoFrameBuffer, OfABitmapThatIsRefusedOrYetToBeCreatedNothingIsDrawn) {
    for (bool const texture : {true, false}) {
        if (texture) queue.Refuse(1);
        BitmapPtr const bitmap = Create(kSide, kSide);
        if (!texture) queue.Refuse(1);
        DrawScenes(NewCanvas(queue, bitmap));
        ExpectWindowUntouched(texture ? "no texture" : "no frame buffer");
        bitmap->GetTextureBitmap()->GetSubBitmap(0)->Unref(); // the reference of the refused task
    }
    thread->Call([this] { DrawScenes(NewCanvas(queue, Create(kSide, kSide), UseFrom::RenderThread)); });
    ExpectWindowUntouched("too early");
}

TEST_F(NoFrameBuffer, WhatTheHostDrawsItselfWithoutATargetReachesItsWindow) {
    Picture const white = MakeChecker(8, 8, 1, {255, 255, 255, 255}, {255, 255, 255, 255});
    BitmapPtr const source = Create(8, 8, white.pixels.data());
    auto const custom =
        RefPtr<MKNonPremultipliedColorDrawable>::Adopt(new MKNonPremultipliedColorDrawable(&queue));
    custom->SetBitmap(source.Get(), source.Get());
    thread->Call([&] { custom->DrawRT(Matrix4<float>(), MKPaint()); });
    EXPECT_EQ(ReadWindow().GetColor(kSide - 1, kSide - 1), (Color{255, 255, 255, 255}));
}

} // namespace
} // namespace Moka::Testing
