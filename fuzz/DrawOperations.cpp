#include "fuzz/CanvasWorld.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
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

// A canvas and what to draw with: null stands for a new paint.
class Draw {
public:
    explicit Draw(CanvasWorld& world)
        : input(world.input), mSlot(world.PickCanvas()), mScope(mSlot.onRenderThread) {
        mHasPaint = input.Bool();
        if (mHasPaint) ReadPaint(input, mPaint);
    }

    explicit operator bool() const { return static_cast<bool>(mSlot.object); }
    IMKCanvas* operator->() const { return mSlot.object.Get(); }
    MKPaint const* GetPaint() const { return mHasPaint ? &mPaint : nullptr; }
    bool IsOnRenderThread() const { return mSlot.onRenderThread; }

    FuzzInput& input;

private:
    Slot<IMKCanvas> const& mSlot;
    ThreadScope const mScope;
    MKPaint mPaint;
    bool mHasPaint = false;
};

void DrawLines(CanvasWorld& world) {
    Draw draw(world);
    if (!draw) return;
    PointF const from = ReadPoint(draw.input);
    PointF const to = ReadPoint(draw.input);
    switch (draw.input.Below(3)) {
    case 0:
        return draw->DrawLine(from, to, draw.GetPaint());
    case 1:
        return draw->DrawSimpleLine(from, to, draw.GetPaint());
    default:
        return draw->DrawSimpleLines(ReadMany(draw.input, ReadPoint), draw.GetPaint());
    }
}

void DrawShape(CanvasWorld& world) {
    Draw draw(world);
    if (!draw) return;
    RectF const rect = ReadRectF(draw.input);
    switch (draw.input.Below(3)) {
    case 0:
        return draw->DrawRect(rect, draw.GetPaint());
    case 1:
        return draw->DrawRoundRect(rect, draw.input.Float(), draw.input.Float(), draw.GetPaint());
    default:
        return draw->DrawCircle(rect.left, rect.top, rect.right, draw.GetPaint());
    }
}

void DrawBitmap(CanvasWorld& world) {
    Draw draw(world);
    IMKBitmap* const bitmap = world.PickBitmapFor(draw.IsOnRenderThread());
    if (!draw) return;
    RectF const src = ReadRectF(draw.input);
    RectF const dst = ReadRectF(draw.input);
    switch (draw.input.Below(3)) {
    case 0:
        return draw->DrawBitmap(bitmap, src.left, src.top, draw.GetPaint());
    case 1:
        return draw->DrawBitmap(bitmap, dst, draw.GetPaint());
    default:
        return draw->DrawBitmap(bitmap, src, dst, draw.GetPaint());
    }
}

void DrawBitmaps(CanvasWorld& world) {
    Draw draw(world);
    IMKBitmap* const bitmap = world.PickBitmapFor(draw.IsOnRenderThread());
    if (!draw) return;
    RectF const src = ReadRectF(draw.input);
    int const form = draw.input.Below(3);
    if (form == 0) {
        std::vector<PointF> points = ReadMany(draw.input, ReadPoint);
        return draw->DrawBitmaps(bitmap, points, draw.GetPaint());
    }
    std::vector<RectF> const dsts = ReadMany(draw.input, ReadRectF);
    if (form == 1)
        draw->DrawBitmaps(bitmap, dsts, draw.GetPaint());
    else
        draw->DrawBitmaps(bitmap, src, dsts, draw.GetPaint());
}

IMKCustomDrawable* NewDrawable(CanvasWorld& world) {
    FuzzInput& input = world.input;
    int const kind = input.Below(4);
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
    RectF const src = ReadRectF(input);
    RectF const dst = ReadRectF(input);
    // It takes the references over.
    return new MKBlendedBitmapDrawable(&world.queue, RefPtr<IMKBitmap>::Share(first).Release(),
                                       RefPtr<IMKBitmap>::Share(second).Release(), src, dst, input.Float(),
                                       input.Float());
}

void MakeDrawable(CanvasWorld& world) {
    Slot<IMKCustomDrawable>& slot = world.PickDrawable();
    slot.Put(RefPtr<IMKCustomDrawable>::Adopt(NewDrawable(world)), false);
}

void DropDrawable(CanvasWorld& world) { world.PickDrawable().Drop(); }

void DrawDrawable(CanvasWorld& world) {
    IMKCustomDrawable* const drawable = world.PickDrawable().object.Get();
    Draw draw(world);
    if (draw) draw->Draw(drawable, draw.GetPaint());
}

} // namespace

std::vector<Operation> const& GetDrawOperations() {
    static std::vector<Operation> const operations = {DrawLines,   DrawShape,    DrawShape,    DrawBitmap,
                                                      DrawBitmaps, MakeDrawable, DropDrawable, DrawDrawable};
    return operations;
}

} // namespace Moka::Fuzz
