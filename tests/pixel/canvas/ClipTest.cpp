// Clips: the area they leave, on one strip and on several, for every primitive, and that none stays behind.
#include "tests/pixel/canvas/CanvasDrawing.h"

namespace Moka::Testing {
namespace {

using Ops = std::vector<IMKCanvasBase::ClipOp>;

constexpr int kWidth = 64;
constexpr int kHeight = 3 * 64 - 20; // three strips of 64

void SetClips(IMKCanvas& canvas, Ops const& ops, float degrees) {
    int number = 0;
    for (IMKCanvasBase::ClipOp const op : ops) {
        canvas.Save(IMKCanvasBase::SaveMatrix);
        canvas.PreRotate(degrees * static_cast<float>(number + 1), 32, 86);
        canvas.SetClipRect(6 + 12 * number, 10 + 24 * number, 36, 96 - 8 * number, op);
        Matrix3f const identity;
        canvas.SetMatrix(identity);
        ++number;
    }
}

std::string Name(Ops const& ops, float degrees) {
    std::string name = "clips";
    for (IMKCanvasBase::ClipOp const op : ops) name += " " + std::to_string(op);
    return name + " at " + std::to_string(degrees);
}

MKPaint MakePaint() {
    MKPaint paint;
    paint.SetColor(0.2f, 0.6f, 0.9f, 0.7f);
    return paint;
}

class ClipTest : public CanvasDrawing {};

TEST_F(ClipTest, PairsAndTriplesLeaveTheirSetOnOneStripAndOnThree) {
    using C = IMKCanvasBase;
    std::vector<Ops> all{
        {C::Intersect, C::Union, C::Difference},    {C::Replace, C::Xor, C::ReverseDifference},
        {C::Union, C::Replace, C::Intersect},       {C::Replace, C::Union, C::Union},
        {C::Difference, C::Difference, C::Xor},     {C::ReverseDifference, C::Union, C::Replace},
        {C::Intersect, C::Intersect, C::Intersect}, {C::Xor, C::Xor, C::ReverseDifference}};
    for (int pair = 0; pair < 49; ++pair) {
        all.push_back({static_cast<C::ClipOp>(pair / 7), static_cast<C::ClipOp>(pair % 7)});
    }
    for (int const side : {kLarge, 64}) {
        UseLargestSide(side);
        for (Ops const& ops : all) {
            for (float const degrees : {0.0f, 7.5f}) {
                ExpectLikeReference({MakeBackdrop(kWidth, kHeight),
                                     [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                         SetClips(canvas, ops, degrees);
                                         MKPaint const paint = MakePaint();
                                         canvas.DrawRect(-1, -1, kWidth + 1, kHeight + 1, &paint);
                                     }},
                                    Name(ops, degrees));
            }
        }
    }
}

TEST_F(ClipTest, StraightClipsCutFractionsTowardsZero) {
    for (int const side : {64, kLarge}) {
        UseLargestSide(side);
        for (float const offset : {0.25f, 8.25f, 60.75f, -3.5f}) {
            ExpectLikeReference({MakeBackdrop(kWidth, kHeight),
                                 [&](IMKCanvas& canvas, Scenes::SceneStage&) {
                                     canvas.SetMatrix(Matrix3f::translateMatrix(offset, offset));
                                     canvas.PreScale(1.3f, 0.7f);
                                     canvas.SetClipRect(3, 5, 25, 101, IMKCanvasBase::Difference);
                                     canvas.Clear(0.1f, 0.9f, 0.3f, 1);
                                 }},
                                "fraction " + std::to_string(offset));
        }
    }
}

// Each in its own place, all cut by the same clip.
void DrawOneOfEach(IMKCanvas& canvas, Scenes::SceneStage& stage) {
    MKPaint paint = MakePaint();
    paint.SetAntiAliasing(true);
    MKPaint stroke = paint;
    stroke.SetStyle(MKPaint::Stroke);
    stroke.SetLineWidth(5);
    MKPaint darken = paint;
    darken.SetXFermode(MKPaint::Darken);
    auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
    canvas.DrawRect(4, 4, 30, 20, &paint);
    canvas.DrawRect(36, 6, 58, 20, &stroke);
    canvas.DrawRoundRect(4, 26, 30, 46, 6, 6, &paint);
    canvas.DrawRoundRect(36, 28, 58, 44, 5, 6, &stroke);
    canvas.DrawCircle(16, 62, 12, &paint);
    canvas.DrawCircle(46, 62, 9, &stroke);
    canvas.DrawLine(6, 82, 56, 90, &stroke);
    canvas.DrawSimpleLine(6, 94, 56, 98, &stroke);
    canvas.DrawSimpleLines({{6, 104}, {56, 104}, {6, 110}, {56, 114}}, &stroke);
    canvas.DrawBitmap(bitmap.Get(), RectF(4, 120, 30, 140), &paint);
    canvas.DrawBitmap(bitmap.Get(), 36, 120, &darken);
    paint.SetTileMode(MKPaint::Repeat);
    canvas.DrawBitmap(bitmap.Get(), RectF(0, 0, 40, 20), RectF(4, 146, 58, 166), &paint);
}

void SetStencilClip(IMKCanvas& canvas) {
    canvas.PreRotate(4, 32, 80);
    canvas.SetClipRect(10, 2, 40, 160, IMKCanvasBase::Intersect);
    canvas.SetMatrix(Matrix3f());
    canvas.SetClipRect(20, 10, 6, 140, IMKCanvasBase::Difference);
}

TEST_F(ClipTest, EveryPrimitiveStaysInsideAStencilClip) {
    for (int const side : {64, kLarge}) {
        UseLargestSide(side);
        Drawing const drawing{MakeBackdrop(kWidth, kHeight),
                              [](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                  SetStencilClip(canvas);
                                  DrawOneOfEach(canvas, stage);
                              }};
        std::string const what = "primitives side " + std::to_string(side);
        ExpectLikeReference(drawing, what);
        ExpectSame(Draw(drawing), Draw(drawing, Way::Immediate), what + " immediate");
        ExpectSame(Draw(drawing), Draw(drawing, Way::RenderThread), what + " on the render thread");
    }
}

TEST_F(ClipTest, ClearingStaysInsideAStencilClipAndClearingAllDoesNot) {
    for (int const side : {64, kLarge}) {
        UseLargestSide(side);
        ExpectLikeReference({MakeBackdrop(kWidth, kHeight),
                             [](IMKCanvas& canvas, Scenes::SceneStage&) {
                                 SetStencilClip(canvas);
                                 canvas.Clear(0.5f, 0.25f, 0.1f, 0.8f);
                             }},
                            "clear side " + std::to_string(side));
        ExpectLikeReference({MakeBackdrop(kWidth, kHeight),
                             [](IMKCanvas& canvas, Scenes::SceneStage&) {
                                 SetStencilClip(canvas);
                                 canvas.ClearAll(static_cast<int>(0x80402010));
                                 canvas.Restore(-1);
                                 canvas.Clear(static_cast<int>(0xFF00FF00));
                             }},
                            "clear all side " + std::to_string(side));
    }
}

// A batch draws into one strip's frame buffer and takes no stencil along.
TEST_F(ClipTest, BatchesObeyStraightClipsAndPassStencilClips) {
    for (bool const straight : {true, false}) {
        ExpectLikeReference(
            {MakeBackdrop(kWidth, 60),
             [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                 auto const bitmap = MakeBitmap(stage, MakeBackdrop(20, 20));
                 canvas.SetClipRect(10, 10, 30, 40, IMKCanvasBase::Intersect);
                 if (!straight) canvas.SetClipRect(5, 5, 10, 10, IMKCanvasBase::Union);
                 canvas.DrawBitmaps(bitmap.Get(), {RectF(0, 0, 30, 30), RectF(20, 25, 62, 58)}, nullptr);
             }},
            straight ? "batch straight" : "batch stencil");
    }
}

TEST_F(ClipTest, WhatComesAfterAClippedDrawIsNotClipped) {
    for (bool const stencil : {false, true}) {
        Drawing const drawing{MakeBackdrop(kWidth, kHeight),
                              [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                                  canvas.Save(IMKCanvasBase::SaveAll);
                                  canvas.SetClipRect(20, 20, 20, 20, IMKCanvasBase::Intersect);
                                  if (stencil) canvas.SetClipRect(10, 30, 20, 60, IMKCanvasBase::Xor);
                                  MKPaint const paint = MakePaint();
                                  canvas.DrawRect(0, 0, kWidth, kHeight, &paint);
                                  canvas.Restore(-1);
                                  DrawOneOfEach(canvas, stage);
                              }};
        ExpectLikeReference(drawing, stencil ? "after a stencil clip" : "after a straight clip");
        // Also on another target.
        Drawing const plain{Picture(8, 8), [](IMKCanvas& canvas, Scenes::SceneStage&) {
                                canvas.DrawRect(0, 0, 8, 8, nullptr);
                            }};
        EXPECT_EQ(Draw(plain).GetColor(7, 7), (Color{255, 255, 255, 255}));
    }
}

} // namespace
} // namespace Moka::Testing
