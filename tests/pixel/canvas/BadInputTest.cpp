// Input that makes no sense: nothing crashes, no GL error, and the next draw is right. And input that the
// caller changes at once: it has been copied.
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/task/ITask.h"
#include "tests/pixel/canvas/CanvasDrawing.h"

#include <future>
#include <limits>
#include <thread>

namespace Moka::Testing {
namespace {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kHuge = std::numeric_limits<float>::max();
constexpr float kStrange[] = {kNaN, kInfinity, -kInfinity, kHuge, -kHuge, 0};

MKPaint MakePaint(MKPaint::Style style = MKPaint::FillAndStroke) {
    MKPaint paint;
    paint.SetColor(0.9f, 0.4f, 0.1f, 0.6f);
    paint.SetAntiAliasing(true);
    paint.SetStyle(style);
    paint.SetLineWidth(3);
    return paint;
}

void DrawSomething(IMKCanvas& canvas) {
    MKPaint const paint = MakePaint();
    canvas.DrawRect(4.25f, 5, 30, 31.5f, &paint);
    canvas.DrawCircle(30, 30, 9, &paint);
    canvas.DrawLine(5, 40, 40, 42, &paint);
}

void DrawOneOfEach(IMKCanvas& canvas, Scenes::SceneStage& stage, float a, float b) {
    MKPaint const paint = MakePaint();
    auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
    canvas.DrawRect(a, 5, b, 30, &paint);
    canvas.DrawRoundRect(a, 5, b, 30, 4, 6, &paint);
    canvas.DrawRoundRect(4, 5, 40, 30, a, b, &paint);
    canvas.DrawCircle(a, b, 5, &paint);
    canvas.DrawCircle(20, 20, a, &paint);
    canvas.DrawLine(a, 5, b, 30, &paint);
    canvas.DrawSimpleLine(5, a, 20, b, &paint);
    canvas.DrawSimpleLines({{a, b}, {4, 5}, {b, a}}, &paint);
    canvas.DrawBitmap(bitmap.Get(), a, b, &paint);
    canvas.DrawBitmap(bitmap.Get(), RectF(a, 0, 10, b), RectF(b, 0, 20, 20), &paint);
    std::vector<PointF> points{{a, b}, {3, b}};
    canvas.DrawBitmaps(bitmap.Get(), points, &paint);
    canvas.DrawBitmaps(bitmap.Get(), RectF(0, a, 10, 10), {RectF(a, b, 5, 5), RectF(0, 0, a, b)}, &paint);
}

class BadInputTest : public CanvasDrawing {
protected:
    // What bad leaves behind on the target is cleared; what follows must not know of it.
    void ExpectNextDrawRight(Drawing::Function const& bad, std::string const& what) {
        auto const good = [](IMKCanvas& canvas) {
            canvas.ClearAll(0x60203040);
            DrawSomething(canvas);
        };
        Picture const start = MakeBackdrop(48, 48);
        Drawing const undisturbed{start, [&](IMKCanvas& canvas, Scenes::SceneStage&) { good(canvas); }};
        Drawing const disturbed{start, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                    canvas.Save(IMKCanvasBase::SaveAll);
                                    bad(canvas, stage);
                                    canvas.Restore(0);
                                    good(canvas);
                                }};
        Picture const expected = Draw(undisturbed);
        for (Way const way : {Way::Deferred, Way::RenderThread})
            ExpectSame(expected, Draw(disturbed, way), what);
    }
};

TEST_F(BadInputTest, StrangeNumbersDisturbNothing) {
    for (float const a : kStrange) {
        for (float const b : kStrange) {
            ExpectNextDrawRight(
                [=](IMKCanvas& canvas, Scenes::SceneStage& stage) { DrawOneOfEach(canvas, stage, a, b); },
                std::to_string(a) + " and " + std::to_string(b));
        }
    }
}

TEST_F(BadInputTest, StrangeMatricesAndClipsDisturbNothing) {
    Matrix3f const singular(1, 2, 0, 2, 4, 0, 0, 0, 1);
    Matrix3f const behind(1, 0, -0.1f, 0, 1, -0.2f, 0, 0, 1);
    for (Matrix3f const& matrix : {singular, behind, Matrix3f(0.0f), Matrix3f(kNaN), Matrix3f(kHuge)}) {
        ExpectNextDrawRight(
            [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                canvas.SetMatrix(matrix);
                DrawOneOfEach(canvas, stage, 3, 30);
                canvas.SetClipRect(1, 2, 30, 30, IMKCanvasBase::Union);
                DrawOneOfEach(canvas, stage, 3, 30);
                canvas.SetClipRect(2000000000, -2000000000, 2000000000, -5, IMKCanvasBase::Xor);
                DrawOneOfEach(canvas, stage, 3, 30);
            },
            "matrix of " + std::to_string(matrix[0]));
    }
}

TEST_F(BadInputTest, NullsEmptyListsAndPicturesOutsideDisturbNothing) {
    ExpectNextDrawRight(
        [](IMKCanvas& canvas, Scenes::SceneStage& stage) {
            std::vector<PointF> none;
            auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
            canvas.Draw(nullptr, nullptr);
            canvas.DrawBitmap(nullptr, 0, 0, nullptr);
            canvas.DrawBitmap(nullptr, RectF(0, 0, 5, 5), nullptr);
            canvas.DrawBitmaps(nullptr, none, nullptr);
            canvas.DrawBitmaps(nullptr, {RectF(0, 0, 5, 5)}, nullptr);
            canvas.DrawBitmaps(bitmap.Get(), none, nullptr);
            canvas.DrawBitmaps(bitmap.Get(), RectF(50, 50, 60, 60), {RectF(0, 0, 5, 5)}, nullptr);
            canvas.DrawBitmap(bitmap.Get(), RectF(50, 50, 60, 60), RectF(0, 0, 5, 5), nullptr);
            canvas.DrawSimpleLines({}, nullptr);
            canvas.DrawSimpleLines({{5, 5}}, nullptr);
            canvas.DrawLine(5, 5, 5, 5, nullptr);
            canvas.Restore(17);
            canvas.SetTag(nullptr);
        },
        "nulls");
}

TEST_F(BadInputTest, ThousandsOfClipsAreOnlySlow) {
    for (bool const stencil : {false, true}) {
        // They come again after 35; so do not more of them leave less.
        auto const make = [&](int count) {
            return Drawing{MakeBackdrop(48, 48), [=](IMKCanvas& canvas, Scenes::SceneStage&) {
                               for (int i = 0; i < count; ++i) {
                                   canvas.SetClipRect(i % 7, i % 5, 30, 20, IMKCanvasBase::Intersect);
                               }
                               if (stencil) canvas.SetClipRect(1, 1, 9, 9, IMKCanvasBase::Union);
                               canvas.Clear(1, 0, 0, 1);
                           }};
        };
        ExpectLike(DrawReference(make(35), kLarge), Draw(make(10000)),
                   stencil ? "many stencil clips" : "many clips");
    }
}

TEST_F(BadInputTest, WhatHasAnAnswerDrawsIt) {
    ExpectLikeReference(
        {MakeBackdrop(60, 60),
         [](IMKCanvas& canvas, Scenes::SceneStage& stage) {
             auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
             MKPaint const paint = MakePaint();
             canvas.DrawRoundRect(4, 4, 24, 20, -3, 4, &paint); // a plain one
             canvas.DrawBitmap(bitmap.Get(), RectF(-10, -10, 12, 40), RectF(30, 2, 58, 30), nullptr);
             canvas.DrawBitmap(bitmap.Get(), RectF(20, 20, 0, 0), RectF(4, 34, 24, 54), nullptr);
             MKPaint clamped;
             clamped.SetTileMode(MKPaint::Clamp);
             canvas.DrawBitmap(bitmap.Get(), RectF(20, 20, 0, 0), RectF(4, 34, 24, 54), &clamped);
             MKPaint const hard;
             canvas.DrawRect(50, 50, 34, 36, &hard); // inside out
         }},
        "odd but drawable");
}

TEST_F(BadInputTest, ABitmapIsDrawnOntoItselfAndOntoItsClone) {
    kept = 2; // a texture and its frame buffer
    for (bool const clone : {false, true}) {
        ExpectLikeReference({MakeBackdrop(40, 40),
                             [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                 IMKBitmap* const target = canvas.GetBitmap();
                                 auto const source = clone ? RefPtr<IMKBitmap>::Adopt(target->Clone())
                                                           : RefPtr<IMKBitmap>::Share(target);
                                 MKPaint paint;
                                 paint.SetXFermode(MKPaint::Src);
                                 canvas.DrawBitmap(source.Get(), RectF(0, 0, 20, 30), RectF(7, 5, 27, 35),
                                                   &paint);
                             }},
                            clone ? "onto its clone" : "onto itself");
    }
}

TEST_F(BadInputTest, APostedDrawHasItsOwnCopyOfEverything) {
    Picture const start(40, 40);
    std::vector<RectF> const places{RectF(2, 22, 12, 32)};
    auto const draw = [&](IMKCanvas& canvas, Scenes::SceneStage& stage, bool disturb) {
        auto bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
        MKPaint paint = MakePaint(MKPaint::Fill);
        std::vector<PointF> points{{20, 20}, {35, 30}};
        std::vector<RectF> dsts = places;
        canvas.PreTranslate(1.5f, 2);
        canvas.SetClipRect(1, 1, 30, 30, IMKCanvasBase::Intersect);
        canvas.DrawRect(3, 3, 15, 15, &paint);
        canvas.DrawSimpleLines(points, &paint);
        canvas.DrawBitmaps(bitmap.Get(), dsts, &paint);
        if (!disturb) return;
        paint.SetColor(0, 0, 0, 0);
        points = {{0, 0}, {40, 40}};
        dsts.clear();
        bitmap = {};
        canvas.SetMatrix(Matrix3f(0.0f));
    };
    Drawing const plain{start, [&](IMKCanvas& c, Scenes::SceneStage& s) { draw(c, s, false); }};
    // Held back until everything has been changed.
    Drawing const held{start, [&](IMKCanvas& c, Scenes::SceneStage& s) {
                           std::promise<void> begun;
                           std::promise<void> release;
                           std::thread holder([&] {
                               GetRenderThread().Call([&] {
                                   begun.set_value();
                                   release.get_future().wait();
                               });
                           });
                           begun.get_future().wait();
                           draw(c, s, true);
                           release.set_value();
                           holder.join();
                       }};
    ExpectSame(Draw(plain), Draw(held), "changed after the call");
    EXPECT_NE(Draw(plain).GetColor(10, 10), (Color{0, 0, 0, 0}));
}

// A queue that takes only some of what it is offered.
class ForgetfulQueue final : public IGLMsgQueue {
public:
    ForgetfulQueue(IGLMsgQueue& queue, int refused) : mQueue(queue), mRefused(refused) {}
    bool Post(ITask* task) override { return ++mOffered != mRefused && mQueue.Post(task); }
    void WaitForTasks() override { mQueue.WaitForTasks(); }
    int GetOffered() const { return mOffered; }

private:
    IGLMsgQueue& mQueue;
    int const mRefused;
    int mOffered = 0;
};

TEST_F(BadInputTest, ARefusedDrawLeavesTheOthersRight) {
    Picture const start = MakeBackdrop(40, 40);
    auto const drawRect = [](IMKCanvas& canvas, int i) {
        MKPaint const paint = MakePaint();
        auto const x = static_cast<float>(10 * i);
        canvas.DrawRect(x + 2, x + 2, x + 9, x + 9, &paint);
    };
    // The canvas comes first: clipping, then three rectangles.
    for (int refused = 2; refused <= 4; ++refused) {
        auto const target = NewBitmap(GetRenderThread(), 40, 40, start.pixels.data());
        ForgetfulQueue queue(GetRenderThread(), refused);
        auto canvas = NewCanvas(queue, target);
        for (int i = 0; i < 3; ++i) drawRect(*canvas, i);
        canvas = {};
        EXPECT_EQ(queue.GetOffered(), 5); // the last one deletes
        Picture actual(40, 40);
        target->GetBitmapData(target->GetBitmapRect(), actual.pixels.data());
        ExpectSame(Draw({start,
                         [&](IMKCanvas& c, Scenes::SceneStage&) {
                             for (int i = 0; i < 3; ++i) {
                                 if (i != refused - 2) drawRect(c, i);
                             }
                         }}),
                   actual, "refused " + std::to_string(refused));
    }
}

} // namespace
} // namespace Moka::Testing
