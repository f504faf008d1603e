#include "fuzz/CanvasWorld.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/paint/MKPaint.h"

namespace Moka::Fuzz {
namespace {

PointF ReadPoint(FuzzInput& input) {
    float const x = input.Float();
    return {x, input.Float()};
}

RectF ReadRectF(FuzzInput& input) {
    float const left = input.Float();
    float const top = input.Float();
    float const right = input.Float();
    return {left, top, right, input.Float()};
}

template <class Value>
std::vector<Value> ReadMany(FuzzInput& input, Value (*read)(FuzzInput&)) {
    std::vector<Value> values(static_cast<std::size_t>(input.Below(12)));
    for (Value& value : values) value = read(input);
    return values;
}

// Enumerations get any number: their owners check nothing.
void ReadPaint(FuzzInput& input, MKPaint& paint) {
    int const flags = input.Byte();
    if ((flags & 1) != 0) paint.SetColor(input.Float(), input.Float(), input.Float(), input.Float());
    if ((flags & 2) != 0) paint.SetTintColor(input.Int());
    if ((flags & 4) != 0) paint.SetXFermode(static_cast<MKPaint::XFermode>(input.Int()));
    if ((flags & 8) != 0) paint.SetStyle(static_cast<MKPaint::Style>(input.Int()));
    if ((flags & 16) != 0) paint.SetLineWidth(input.Float());
    if ((flags & 32) != 0) {
        RectF const lengths = ReadRectF(input);
        paint.SetDashedLinePattern(Vector4<float>(lengths.left, lengths.top, lengths.right, lengths.bottom));
        paint.SetLineCapType(static_cast<MKPaint::LineCapType>(input.Int()));
    }
    if ((flags & 64) != 0) {
        auto const tileX = static_cast<MKPaint::TileMode>(input.Int());
        paint.SetTileMode(tileX, static_cast<MKPaint::TileMode>(input.Int()));
    }
    paint.SetAntiAliasing((flags & 128) != 0);
}

using Shape = void (*)(IMKCanvas& canvas, FuzzInput& input, IMKBitmap* bitmap, MKPaint const* paint);

Shape const kShapes[] = {
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawLine(ReadPoint(i), ReadPoint(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawSimpleLine(ReadPoint(i), ReadPoint(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawSimpleLines(ReadMany(i, ReadPoint), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawRect(ReadRectF(i), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawRoundRect(ReadRectF(i), i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto*, auto* paint) { c.DrawCircle(i.Float(), i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmap(bitmap, i.Float(), i.Float(), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmap(bitmap, ReadRectF(i), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) {
        c.DrawBitmap(bitmap, ReadRectF(i), ReadRectF(i), paint);
    },
    [](auto& c, auto& i, auto* bitmap, auto* paint) {
        std::vector<PointF> points = ReadMany(i, ReadPoint);
        c.DrawBitmaps(bitmap, points, paint);
    },
    [](auto& c, auto& i, auto* bitmap, auto* paint) { c.DrawBitmaps(bitmap, ReadMany(i, ReadRectF), paint); },
    [](auto& c, auto& i, auto* bitmap, auto* paint) {
        c.DrawBitmaps(bitmap, ReadRectF(i), ReadMany(i, ReadRectF), paint);
    },
};

// With a paint, or with null, which stands for a new one.
template <class Action>
void DrawWithPaint(CanvasWorld& world, Slot<IMKCanvas> const& slot, Action const& action) {
    MKPaint paint;
    bool const hasPaint = world.input.Bool();
    if (hasPaint) ReadPaint(world.input, paint);
    Use(slot, [&](IMKCanvas& canvas) { action(canvas, hasPaint ? &paint : nullptr); });
}

void DrawShape(CanvasWorld& world) {
    Slot<IMKCanvas> const& slot = world.PickCanvas();
    IMKBitmap* bitmap = world.PickBitmapFor(slot.onRenderThread);
    DrawWithPaint(world, slot, [&](IMKCanvas& canvas, MKPaint const* paint) {
        DoOne(kShapes, world.input, canvas, world.input, bitmap, paint);
    });
}

IMKCustomDrawable* NewDrawable(CanvasWorld& world) {
    FuzzInput& input = world.input;
    int const kind = input.Below(5);
    IMKBitmap* const first = world.PickBitmapFor(false);
    IMKBitmap* const second = world.PickBitmapFor(false);
    if (kind == 0) {
        auto* const blur = new MKGaussianBlurDrawable(&world.queue);
        blur->SetBitmap(first);
        blur->SetHorizotalDirection(input.Bool());
        blur->SetBlurAmount(input.Float());
        blur->SetOffset(input.Float(), input.Float());
        return blur;
    }
    if (kind == 1) {
        auto* const over = new MKNonPremultipliedColorDrawable(&world.queue);
        over->SetBitmap(first, second);
        return over;
    }
    if (kind == 2) {
        auto* const mask = new MKTextMaskBitmapDrawable(&world.queue);
        mask->SetBitmap(first);
        mask->SetDstPosition(input.Float(), input.Float());
        return mask;
    }
    if (kind == 3) {
        auto* const stroke = new MKStrokeDrawable(&world.queue);
        for (int i = input.Below(12); i > 0; --i) {
            MKStrokePoint const point{input.Float(), input.Float(), input.Float()};
            stroke->Append(&point, input.Below(2));
        }
        return stroke;
    }
    RectF const src = ReadRectF(input);
    RectF const dst = ReadRectF(input);
    // It takes the references over.
    return new MKBlendedBitmapDrawable(&world.queue, RefPtr<IMKBitmap>::Share(first).Release(),
                                       RefPtr<IMKBitmap>::Share(second).Release(), src, dst, input.Float(),
                                       input.Float());
}

void DrawDrawable(CanvasWorld& world) {
    IMKCustomDrawable* const drawable = world.PickDrawable().object.Get();
    DrawWithPaint(world, world.PickCanvas(),
                  [&](IMKCanvas& canvas, MKPaint const* paint) { canvas.Draw(drawable, paint); });
}

} // namespace

std::vector<Operation> const& GetDrawOperations() {
    static std::vector<Operation> const operations = {
        DrawShape,
        DrawShape,
        DrawShape,
        DrawShape,
        [](CanvasWorld& world) {
            world.PickDrawable().Put(RefPtr<IMKCustomDrawable>::Adopt(NewDrawable(world)), false);
        },
        [](CanvasWorld& world) { world.PickDrawable().Drop(); },
        DrawDrawable};
    return operations;
}

} // namespace Moka::Fuzz
