// CanvasCalls: every call that changes a canvas or draws on it, with arguments out of a fuzzer's bytes.
#pragma once

#include "fuzz/FuzzInput.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/paint/MKPaint.h"

#include <string>
#include <vector>

namespace Moka::Fuzz {

inline PointF ReadPoint(FuzzInput& i) { return {i.Float(), i.Float()}; }
inline RectF ReadRectF(FuzzInput& i) { return {i.Float(), i.Float(), i.Float(), i.Float()}; }
inline std::string ReadTag(FuzzInput& i) { return std::string(static_cast<std::size_t>(i.Byte()), 'x'); }

template <class Value>
std::vector<Value> ReadMany(FuzzInput& input, Value (*read)(FuzzInput&)) {
    std::vector<Value> values(static_cast<std::size_t>(input.Below(12)));
    for (Value& value : values) value = read(input);
    return values;
}

inline Matrix3<float> ReadMatrix(FuzzInput& input) {
    Matrix3<float> matrix;
    int const count = input.Below(10); // the rest stays the identity's
    for (int i = 0; i < count; ++i) matrix[i] = input.Float();
    return matrix;
}

using Step = void (*)(IMKCanvasBase& canvas, FuzzInput& input);
constexpr Step kSteps[] = {
    [](auto& c, auto& i) { c.Clear(i.Int()); },
    [](auto& c, auto& i) { c.Clear(i.Float(), i.Float(), i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.ClearAll(i.Int()); },
    [](auto& c, auto& i) { c.ClearAll(i.Float(), i.Float(), i.Float(), i.Float()); },
    [](auto& c, auto& i) {
        c.SetClipRect(i.Int(), i.Int(), i.Int(), i.Int(), static_cast<IMKCanvasBase::ClipOp>(i.Int()));
    },
    [](auto& c, auto& i) { c.PreScale(i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PostScale(i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PreRotate(i.Float()); },
    [](auto& c, auto& i) { c.PreRotate(i.Float(), i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PostRotate(i.Float()); },
    [](auto& c, auto& i) { c.PostRotate(i.Float(), i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PreTranslate(i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PostTranslate(i.Float(), i.Float()); },
    [](auto& c, auto& i) { c.PreConcat(ReadMatrix(i)); },
    [](auto& c, auto& i) { c.PostConcat(ReadMatrix(i)); },
    [](auto& c, auto& i) { c.SetMatrix(ReadMatrix(i)); },
    [](auto& c, auto& i) { c.Save(static_cast<IMKCanvasBase::SaveFlag>(i.Int())); },
    [](auto& c, auto& i) { c.Restore(i.Int()); },
    [](auto& c, auto& i) { c.SetTag(ReadTag(i).c_str()); },
};

// Enumerations get any number: their owners check nothing.
inline void ReadPaint(FuzzInput& i, MKPaint& paint) {
    int const flags = i.Byte();
    if ((flags & 1) != 0) paint.SetColor(i.Float(), i.Float(), i.Float(), i.Float());
    if ((flags & 2) != 0) paint.SetTintColor(i.Int());
    if ((flags & 4) != 0) paint.SetXFermode(static_cast<MKPaint::XFermode>(i.Int()));
    if ((flags & 8) != 0) paint.SetStyle(static_cast<MKPaint::Style>(i.Int()));
    if ((flags & 16) != 0) paint.SetLineWidth(i.Float());
    if ((flags & 32) != 0) paint.SetDashedLinePattern({i.Float(), i.Float(), i.Float(), i.Float()});
    if ((flags & 32) != 0) paint.SetLineCapType(static_cast<MKPaint::LineCapType>(i.Int()));
    if ((flags & 64) != 0)
        paint.SetTileMode(static_cast<MKPaint::TileMode>(i.Int()), static_cast<MKPaint::TileMode>(i.Int()));
    paint.SetAntiAliasing((flags & 128) != 0);
}

using Shape = void (*)(IMKCanvas& canvas, FuzzInput& input, IMKBitmap* bitmap, MKPaint const* paint);
constexpr Shape kShapes[] = {
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawLine(ReadPoint(i), ReadPoint(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawSimpleLine(ReadPoint(i), ReadPoint(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawSimpleLines(ReadMany(i, ReadPoint), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawRect(ReadRectF(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawRoundRect(ReadRectF(i), i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawCircle(i.Float(), i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmap(bitmap, i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmap(bitmap, ReadRectF(i), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* p) { c.DrawBitmap(bitmap, ReadRectF(i), ReadRectF(i), p); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) {
        std::vector<PointF> points = ReadMany(i, ReadPoint);
        c.DrawBitmaps(bitmap, points, paint);
    },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmaps(bitmap, ReadMany(i, ReadRectF), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* p) {
        c.DrawBitmaps(bitmap, ReadRectF(i), ReadMany(i, ReadRectF), p);
    },
};

} // namespace Moka::Fuzz
