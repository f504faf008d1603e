// The pen canvas around real foreign GL: the ink lies where its matrix and clip say, and whatever the foreign
// code leaves behind, the library's own draws before and after it are right.
#include "apps/moka/PenStroke.h"
#include "moka/base/RefPtr.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"
#include "scenes/SceneRenderer.h"
#include "tests/pixel/pen/ForeignInk.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"
#include "tests/support/NothingLeft.h"
#include "tests/support/TestImages.h"

#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using C = IMKCanvasBase;

constexpr int kWidth = 40;
constexpr int kHeight = 26;
constexpr Color kPaper{10, 20, 30, 255};
constexpr Color kInk{0, 255, 0, 255};

Picture Paper() { return MakeChecker(kWidth, kHeight, kWidth + kHeight, kPaper, kPaper); }

void FillImage(Picture& image, Rect const& r, Color const& color) {
    for (int y = r.top; y < r.bottom; ++y)
        for (int x = r.left; x < r.right; ++x) image.SetColor(x, y, color);
}

void FillGradient(Picture& image, Rect const& r) {
    for (int y = r.top; y < r.bottom; ++y)
        for (int x = r.left; x < r.right; ++x) image.SetColor(x, y, GetGradientColor(x - r.left, y - r.top));
}

// With deferral, and without.
class PenCanvasPixel : public ::testing::TestWithParam<bool> {
protected:
    void SetUp() override {
        RenderThreadOptions options;
        options.debugContext = true;
        std::string error;
        queue = RenderThread::Start(options, &error);
        ASSERT_TRUE(queue) << error;
        queue->Call([this] {
            RendererFactory::SetDeferred(GetParam());
            ink = std::make_unique<ForeignInk>();
        });
        bitmap = Create(Paper());
        pen = NewPenCanvas(*queue, bitmap);
        canvas = NewCanvas(*queue, bitmap);
    }

    // Nothing alive on the GPU, and no driver message of error severity.
    void TearDown() override {
        pen = {};
        canvas = {};
        bitmap = {};
        queue->Call([this] {
            RendererFactory::Flush();
            ink.reset();
            RendererFactory::InvalidateState();
        });
        queue->WaitForTasks();
        ExpectNothingLeft(RendererFactory::GetStatistics());
        queue.reset();
        for (std::string const& line : log.GetTexts(ANDROID_LOG_ERROR)) ADD_FAILURE() << line;
    }

    BitmapPtr Create(Picture const& image) {
        auto created = NewBitmap(*queue, image.width, image.height, image.pixels.data());
        queue->WaitForTasks(); // the image may go
        return created;
    }

    Picture Read() {
        Picture image(kWidth, kHeight);
        bitmap->GetBitmapData(bitmap->GetBitmapRect(), image.pixels.data());
        return image;
    }

    // What the pen engine does on the render thread, behind what was asked for before.
    void DrawInk(RectF const& rect) {
        queue->Call([&] {
            pen->EnableClipRT(0);
            bitmap->GetBitmapWritable()->ActivateFrameBufferRT(false);
            ink->Fill(rect, pen->GetCanvasMatrix());
            ink->LeaveAMess();
            pen->DisableClipRT();
            bitmap->GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
        });
    }

    static void ExpectSame(Picture const& expected, Picture const& actual, std::string const& what) {
        ImageDifference const difference = CompareImages(expected, actual);
        if (difference.differingPixels == 0) return;
        ADD_FAILURE() << what << ": " << difference << "; " << KeepDifference(expected, actual, what);
    }

    LogCapture log;
    std::unique_ptr<RenderThread> queue;
    std::unique_ptr<ForeignInk> ink; // render thread
    BitmapPtr bitmap;
    RefPtr<IMKPenCanvas> pen;
    RefPtr<IMKCanvas> canvas;
};

struct Clip {
    int x, y, width, height;
    C::ClipOp op;
};

TEST_P(PenCanvasPixel, InkIsDrawnInsideTheClipAndNotOutside) {
    struct Case {
        std::vector<Clip> clips; // in pixels of the bitmap
        Rect inked;
    };
    for (Case const& c :
         {Case{{}, Rect(4, 2, 24, 12)}, Case{{{6, 0, 10, 26, C::Intersect}}, Rect(6, 2, 16, 12)},
          Case{{{6, 0, 10, 26, C::Intersect}, {0, 5, 40, 4, C::Intersect}}, Rect(6, 5, 16, 9)},
          Case{{{0, 0, 3, 3, C::Intersect}, {10, 4, 8, 3, C::Replace}}, Rect(10, 4, 18, 7)},
          Case{{{4, 2, 5, 5, C::Intersect}, {20, 2, 4, 9, C::Intersect}}, Rect(0, 0, 0, 0)}}) {
        canvas->ClearAll(10 / 255.0f, 20 / 255.0f, 30 / 255.0f, 1);
        int const level = pen->Save(C::SaveAll);
        for (Clip const& clip : c.clips) pen->SetClipRect(clip.x, clip.y, clip.width, clip.height, clip.op);
        pen->PreTranslate(4, 2);
        pen->PreScale(2, 1);
        DrawInk(RectF(0, 0, 10, 10)); // covers (4, 2) to (24, 12)
        pen->Restore(level);
        Picture expected = Paper();
        FillImage(expected, c.inked, kInk);
        ExpectSame(expected, Read(), "ink under " + std::to_string(c.clips.size()) + " clips");
    }
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_WARN).size(), 0u);
}

// Its three panels: whole, cut by two clips, and turned under a clip that replaced another.
TEST_P(PenCanvasPixel, TheScenesInkFillsItsPanelsAndNothingElse) {
    Tool::PenStroke stroke(*queue);
    Picture const picture = RenderScene(*Scenes::FindScene("pen-stroke"), *queue, &stroke);
    auto const countInk = [&](Rect const& part) {
        int count = 0;
        for (int i = part.top * picture.width; i < part.bottom * picture.width; ++i) {
            bool const isInside = i % picture.width >= part.left && i % picture.width < part.right;
            if (isInside && picture.GetColor(i % picture.width, i / picture.width)[0] < 100) ++count;
        }
        return count;
    };
    EXPECT_GT(countInk(Rect(10, 10, 150, 130)), 1000);
    EXPECT_GT(countInk(Rect(190, 40, 290, 90)), 300);
    EXPECT_GT(countInk(Rect(360, 25, 440, 115)), 300);
    for (Rect const& outside :
         {Rect(151, 0, 189, 140), Rect(291, 0, 359, 140), Rect(190, 0, 480, 24), Rect(441, 0, 480, 140)})
        EXPECT_EQ(countInk(outside), 0);
    // External code has ended: draws are joined again.
    queue->Call([this] {
        auto const next = NewCanvas(*queue, bitmap, UseFrom::RenderThread);
        std::uint64_t const before = RendererFactory::GetStatistics().draws;
        for (float const x : {1.0f, 9.0f}) next->DrawRect(x, 1, x + 5, 5, nullptr);
        RendererFactory::Flush();
        EXPECT_EQ(RendererFactory::GetStatistics().draws - before, GetParam() ? 1u : 2u);
    });
}

// Each of these takes another way through the renderer: plain, blended, textured, clipped by the scissor,
// clipped by the stencil, cleared, uploaded.
TEST_P(PenCanvasPixel, OwnDrawsBeforeAndAfterAreRightWhateverIsLeftBehind) {
    Color const white{255, 255, 255, 255};
    Color const red{255, 0, 0, 255};
    Picture expected = Paper();
    BitmapPtr const picture = Create(MakeGradient(6, 5));
    MKPaint paint;
    canvas->DrawRect(2, 2, 30, 8, &paint); // still in the renderer's hands when the pen comes
    DrawInk(RectF(10, 4, 16, 20));
    FillImage(expected, Rect(2, 2, 30, 8), white);
    FillImage(expected, Rect(10, 4, 16, 20), kInk);

    paint.SetColor(static_cast<int>(0xFFFF0000));
    canvas->DrawRect(14, 6, 20, 12, &paint);
    FillImage(expected, Rect(14, 6, 20, 12), red);
    DrawInk(RectF(0, 0, 1, 1));
    FillImage(expected, Rect(0, 0, 1, 1), kInk);
    paint.SetColor(1, 1, 1, 0);
    canvas->DrawRect(0, 0, 40, 26, &paint); // blends to nothing, unless blending is wrong
    DrawInk(RectF(1, 0, 2, 1));
    FillImage(expected, Rect(1, 0, 2, 1), kInk);
    MKPaint const plain;
    canvas->DrawBitmap(picture.Get(), 30, 10, &plain);
    FillGradient(expected, Rect(30, 10, 36, 15));
    ExpectSame(expected, Read(), "drawn around ink");

    DrawInk(RectF(2, 0, 3, 1));
    FillImage(expected, Rect(2, 0, 3, 1), kInk);
    canvas->Save(C::SaveClip);
    canvas->SetClipRect(20, 14, 8, 6, C::Intersect);
    canvas->DrawRect(0, 0, 40, 26, &plain);
    FillImage(expected, Rect(20, 14, 28, 20), white);
    DrawInk(RectF(3, 0, 4, 1));
    FillImage(expected, Rect(3, 0, 4, 1), kInk);
    canvas->SetClipRect(4, 18, 4, 3, C::Union);
    canvas->Clear(1, 0, 0, 1);
    FillImage(expected, Rect(20, 14, 28, 20), red);
    FillImage(expected, Rect(4, 18, 8, 21), red);
    canvas->Restore(-1);
    ExpectSame(expected, Read(), "clipped around ink");

    DrawInk(RectF(4, 0, 5, 1));
    FillImage(expected, Rect(4, 0, 5, 1), kInk);
    BitmapPtr const late = Create(MakeGradient(5, 3));
    canvas->DrawBitmap(late.Get(), 33, 20, &plain);
    FillGradient(expected, Rect(33, 20, 38, 23));
    ExpectSame(expected, Read(), "uploaded after ink");
}

INSTANTIATE_TEST_SUITE_P(Renderer, PenCanvasPixel, ::testing::Values(true, false),
                         [](auto const& test) { return test.param ? "Deferred" : "Immediate"; });

} // namespace
} // namespace Moka::Testing
