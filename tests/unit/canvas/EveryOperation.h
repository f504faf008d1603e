// EveryOperation.h: what a canvas can do, once each, so that one way of calling it can be held against
// another.
#pragma once

#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/math/Matrix3.h"
#include "moka/graphics/paint/MKPaint.h"

#include <gtest/gtest.h>

#include <vector>

namespace Moka::Testing {

inline void TransformInEveryWay(IMKCanvasBase& canvas) {
    Matrix3<float> const skewed(1, 0.2f, 0, 0.3f, 1, 0, 5, 6, 1);
    canvas.SetMatrix(skewed);
    canvas.PreConcat(skewed);
    canvas.PostConcat(skewed);
    canvas.PreScale(2, 3);
    canvas.PostScale(0.5f, 0.75f);
    canvas.PreRotate(10);
    canvas.PreRotate(20, 1, 2);
    canvas.PostRotate(30);
    canvas.PostRotate(40, 3, 4);
    canvas.PreTranslate(7, 8);
    canvas.PostTranslate(9, 10);
}

inline void DrawEverything(IMKCanvas& canvas, IMKBitmap* source, IMKCustomDrawable* drawable) {
    MKPaint paint;
    paint.SetColor(0.5f, 0.25f, 1, 0.75f);
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(3);
    std::vector<PointF> points{{1, 2}, {20, 30}};
    std::vector<RectF> const rects{{1, 2, 3, 4}, {5, 6, 9, 10}};
    canvas.Clear(static_cast<int>(0x80FF0040u));
    canvas.Clear(0.4f, 0.3f, 0.2f, 0.1f);
    canvas.ClearAll(static_cast<int>(0x40FF0080u));
    canvas.ClearAll(0.1f, 0.2f, 0.3f, 0.4f);
    canvas.PreRotate(10, 5, 6);
    EXPECT_EQ(canvas.Save(IMKCanvasBase::SaveAll), 0);
    canvas.PostScale(1.5f, 0.5f);
    canvas.SetClipRect(1, 2, 30, 40, IMKCanvasBase::Union);
    canvas.Draw(drawable, &paint);
    canvas.DrawLine(1, 2, 30, 40, &paint);
    canvas.DrawLine(points[0], points[1], nullptr);
    canvas.DrawSimpleLine(1, 2, 30, 40, &paint);
    canvas.DrawSimpleLine(points[0], points[1], &paint);
    canvas.DrawSimpleLines(points, &paint);
    canvas.DrawRect(1, 2, 30, 40, &paint);
    canvas.DrawRect(rects[0], &paint);
    canvas.DrawRoundRect(1, 2, 30, 40, 3, 5, &paint);
    canvas.DrawRoundRect(rects[1], 1, 2, &paint);
    canvas.DrawRoundRect(rects[1], 1, 0, &paint);
    canvas.DrawCircle(20, 25, 9, &paint);
    canvas.DrawBitmap(source, 3, 4, &paint);
    canvas.DrawBitmap(source, rects[0], &paint);
    canvas.DrawBitmap(source, rects[0], rects[1], &paint);
    canvas.Restore(0);
    canvas.DrawBitmaps(source, points, &paint);
    canvas.DrawBitmaps(source, rects, &paint);
    canvas.DrawBitmaps(source, rects[0], rects, &paint);
}

} // namespace Moka::Testing
