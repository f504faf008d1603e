#include "tests/pixel/canvas/CanvasDrawing.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/NothingLeft.h"
#include "tests/support/reference/ReferenceStage.h"

#include <cstring>
#include <memory>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using CanvasPtr = RefPtr<IMKCanvas>;

class Renderer : public ::testing::Environment {
public:
    RenderThread* Use(int side) {
        if (mThread && mSide == side) return mThread.get();
        mThread.reset();
        RenderThreadOptions options;
        options.limits.maxTextureSize = side;
        options.debugContext = true;
        std::string error;
        mThread = RenderThread::Start(options, &error);
        mSide = side;
        EXPECT_TRUE(mThread) << error;
        return mThread.get();
    }
    void Stop() { mThread.reset(); }
    void TearDown() override { Stop(); }

private:
    std::unique_ptr<RenderThread> mThread;
    int mSide = 0;
};

// The framework owns it, and stops the thread before the process ends.
Renderer& GetRenderer() {
    static auto* const renderer = static_cast<Renderer*>(::testing::AddGlobalTestEnvironment(new Renderer));
    return *renderer;
}

// So that the framework knows of it before the first test.
[[maybe_unused]] Renderer& gRenderer = GetRenderer();

class GpuStage final : public Scenes::SceneStage {
public:
    GpuStage(IGLMsgQueue& queue, bool onRenderThread) : mQueue(queue), mUseQueue(onRenderThread ? 0 : 1) {}

    IMKBitmap* MakeBitmap(Scenes::Picture const& picture) override {
        auto* const copy = new unsigned char[picture.CountBytes()];
        std::memcpy(copy, picture.pixels.data(), picture.CountBytes());
        return MKGraphicsFactory::CreateBitmap(&mQueue, picture.width, picture.height, copy, true, mUseQueue,
                                               false);
    }
    IGLMsgQueue* GetQueue() override { return &mQueue; }

private:
    IGLMsgQueue& mQueue;
    int const mUseQueue;
};

Picture DrawOnGpu(Drawing const& drawing, IGLMsgQueue& queue, bool onRenderThread) {
    Picture const& start = drawing.start;
    UseFrom const from = onRenderThread ? UseFrom::RenderThread : UseFrom::AnyThread;
    auto const bitmap = NewBitmap(queue, start.width, start.height, start.pixels.data(), from);
    Picture picture(start.width, start.height);
    if (!bitmap) return picture;
    {
        auto const canvas = NewCanvas(queue, bitmap, from);
        GpuStage stage(queue, onRenderThread);
        drawing.draw(*canvas, stage);
    }
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), picture.pixels.data());
    return picture;
}

} // namespace

Picture MakeBackdrop(int width, int height) {
    Picture const pattern = MakeAlphaPattern(16, 16);
    Picture image(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) image.SetColor(x, y, pattern.GetColor(y % 16, x % 16));
    }
    return image;
}

RefPtr<IMKBitmap> MakeBitmap(Scenes::SceneStage& stage, Picture const& image) {
    return RefPtr<IMKBitmap>::Adopt(stage.MakeBitmap(image));
}

Drawing Twice(Drawing drawing) {
    auto const draw = drawing.draw;
    drawing.draw = [draw](IMKCanvas& canvas, Scenes::SceneStage& stage) {
        Matrix3<float> const matrix = canvas.GetMatrix();
        int const level = canvas.Save(IMKCanvasBase::SaveAll);
        draw(canvas, stage);
        canvas.Restore(level);
        canvas.SetMatrix(matrix);
        canvas.ClearAll(0);
        draw(canvas, stage);
    };
    return drawing;
}

void CanvasDrawing::UseLargestSide(int side) { mSide = side; }

RenderThread& CanvasDrawing::GetRenderThread() const { return *GetRenderer().Use(mSide); }

CanvasDrawing::~CanvasDrawing() {
    GetRenderThread().WaitForTasks();
    GetRenderThread().WaitForTasks(); // a canvas that goes last posts the end of its bitmap
    ExpectNothingLeft(RendererFactory::GetStatistics(), kept);
    for (std::string const& line : log.GetTexts(ANDROID_LOG_ERROR)) ADD_FAILURE() << line;
    if (kept > 0) GetRenderer().Stop();
}

Picture CanvasDrawing::Draw(Drawing const& drawing, Way way) {
    RenderThread& thread = GetRenderThread();
    Picture picture(0, 0);
    if (way == Way::Immediate) thread.Call([] { RendererFactory::SetDeferred(false); });
    if (way == Way::RenderThread) {
        thread.Call([&] { picture = DrawOnGpu(drawing, thread, true); });
    } else {
        picture = DrawOnGpu(drawing, thread, false);
    }
    if (way == Way::Immediate) thread.Call([] { RendererFactory::SetDeferred(true); });
    return picture;
}

void CanvasDrawing::ExpectLikeReference(Drawing const& drawing, std::string const& what, Way way) {
    ReferenceCanvas::Device device{mSide};
    // The least that OpenGL ES allows.
    if (GetRenderThread().GetContextInfo().renderer.find("SwiftShader") != std::string::npos)
        device.subpixelBits = 4;
    auto const bitmap = RefPtr<ReferenceBitmap>::Adopt(new ReferenceBitmap(drawing.start));
    auto const canvas = RefPtr<ReferenceCanvas>::Adopt(new ReferenceCanvas(*bitmap, device));
    ReferenceStage stage;
    drawing.draw(*canvas, stage);
    int const open = canvas->GetSlack().CountOver(kCoarse);
    EXPECT_LE(open * 7, drawing.start.width * drawing.start.height)
        << what << ": the reference knows too little";
    RecordProperty("open", open);
    ExpectSame(bitmap->image, Draw(drawing, way), what, &canvas->GetSlack());
}

void CanvasDrawing::ExpectSame(Picture const& expected, Picture const& actual, std::string const& what,
                               Slack const* slack) {
    ImageDifference const difference = CompareImages(expected, actual, slack);
    if (difference.differingPixels == 0) return;
    ADD_FAILURE() << what << ": " << difference << "; " << KeepDifference(expected, actual, what, slack);
}

} // namespace Moka::Testing
