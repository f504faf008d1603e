// Turns bytes into calls on bitmaps and canvases over the tracing renderer: whatever they are, nothing is
// left, nothing is misused and no memory error happens.
#include "fuzz/CanvasCalls.h"
#include "fuzz/CanvasWorld.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"

#include <algorithm>

namespace Moka::Fuzz {
namespace {

using BitmapSlot = Slot<IMKBitmap>;
using DrawableSlot = Slot<IMKCustomDrawable>;

std::size_t CountBytes(int width, int height) {
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4;
}

int ReadSide(FuzzInput& i) { return i.Below(kMaxSide + 3) - 2; }
Rect ReadRect(FuzzInput& i) { return {i.Int(), i.Int(), i.Int(), i.Int()}; }

// Whether memory for all of it can be made: as much as the largest bitmap, and one row of any other.
bool IsSmall(Rect const& r) {
    return r.IsEmpty() || (r.GetWidth() <= 2 * kMaxSide && r.GetHeight() <= 2 * kMaxSide);
}

// --- bitmaps

// Of pixels that the bitmap owns once it is made, of the world's, or of none.
template <class Create>
void MakeOfPixels(CanvasWorld& world, BitmapSlot& slot, int width, int height, int flags,
                  Create const& create) {
    bool const hasPixels = (flags & 2) != 0 && width > 0 && height > 0;
    bool const passesPixels = hasPixels && (flags & 4) != 0;
    std::size_t const count = hasPixels ? CountBytes(width, height) : 0;
    auto own = std::make_unique<unsigned char[]>(passesPixels ? count : 0);
    unsigned char* const pixels = passesPixels ? own.get() : hasPixels ? world.NewBuffer(count) : nullptr;
    world.Make(slot, (flags & 1) != 0, [&](int useQueue) { return create(pixels, passesPixels, useQueue); });
    if (slot.object && passesPixels) static_cast<void>(own.release());
}

void MakeBitmap(CanvasWorld& world, FuzzInput& i, BitmapSlot& slot) {
    int const flags = i.Byte();
    int const width = ReadSide(i);
    int const height = ReadSide(i);
    MakeOfPixels(world, slot, width, height, flags, [&](auto* pixels, bool passes, int useQueue) {
        return MKGraphicsFactory::CreateBitmap(&world.queue, width, height, pixels, passes, useQueue,
                                               (flags & 8) != 0);
    });
}

void MakeRegion(CanvasWorld& world, FuzzInput& i, BitmapSlot& slot) {
    int const width = ReadSide(i);
    int const height = ReadSide(i);
    Rect const region = ReadRect(i);
    MakeOfPixels(world, slot, width, height, i.Bool() ? 6 : 2, [&](auto* pixels, bool passes, int) {
        return MKGraphicsFactory::CreateBitmap(&world.queue, region, width, height, pixels, passes ? 0 : 1);
    });
}

void MakeScreen(CanvasWorld& world, FuzzInput& i, BitmapSlot& slot) {
    int const flags = i.Byte();
    world.Make(slot, (flags & 1) != 0, [&](int useQueue) {
        return MKGraphicsFactory::CreateScreenBitmap(&world.queue, i.Int(), i.Int(), ReadSide(i), ReadSide(i),
                                                     flags & 2, useQueue);
    });
}

// Over another bitmap's image; or a canvas over the bitmap.
template <class T>
void MakeOver(CanvasWorld& world, Slot<T>& slot, T* (*create)(IGLMsgQueue*, IMKBitmap*, int)) {
    bool const onRenderThread = world.input.Bool();
    IMKBitmap* const under = world.PickBitmapFor(onRenderThread);
    world.Make(slot, onRenderThread, [&](int useQueue) { return create(&world.queue, under, useQueue); });
}

void UpdateBitmap(CanvasWorld& world, FuzzInput& i, BitmapSlot& slot) {
    bool const whole = i.Bool();
    int const stride = i.Int();
    Rect const rect = ReadRect(i);
    IMKTextureBitmap* const texture = slot.object ? slot.object->GetTextureBitmap() : nullptr;
    if (!texture || !IsSmall(rect) || stride > 4096) return;
    std::size_t const row =
        std::max(CountBytes(2 * kMaxSide, 1), static_cast<std::size_t>(std::max(stride, 0)));
    unsigned char const* const pixels = world.NewBuffer(row * 2 * kMaxSide);
    ThreadScope const scope(slot.onRenderThread);
    if (whole)
        texture->UpdateBitmap(pixels, stride);
    else
        texture->UpdateBitmap(rect, pixels, stride);
}

void ReadPixel(IMKBitmap& bitmap, FuzzInput& i) {
    Point const point{i.Int(), i.Int()};
    if (i.Bool())
        bitmap.GetPixel(point);
    else
        bitmap.GetPixelAsync(point, nullptr, [](unsigned int, void*) {});
}

void ReadBlock(CanvasWorld& world, IMKBitmap& bitmap, FuzzInput& i) {
    Rect const rect = ReadRect(i);
    bool const waits = i.Bool();
    if (!IsSmall(rect)) return;
    unsigned char* const to =
        world.NewBuffer(rect.IsEmpty() ? 4 : CountBytes(rect.GetWidth(), rect.GetHeight()));
    if (waits)
        bitmap.GetBitmapData(rect, to);
    else
        bitmap.GetBitmapDataAsync(rect, to, nullptr, [](Rect const&, void*, void*) {});
}

void SetSampling(IMKBitmap& bitmap, FuzzInput& i) {
    bool const filters = i.Bool();
    int const value = i.Below(4); // what the enumerations have room for
    IMKBitmapReadable* const readable = bitmap.GetBitmapReadable();
    if (readable && filters) readable->SetTextureFilter(static_cast<TextureParamFilteringValue>(value));
    if (readable && !filters) readable->SetTextureWrap(static_cast<TextureParamWrappingValue>(value));
}

// Of a render-thread bitmap the clone is caller-side, and dropped last it would end the other on this thread.
void CloneBitmap(CanvasWorld& world) {
    IMKBitmap* const from = world.PickBitmapFor(false);
    BitmapSlot& to = world.PickBitmap();
    if (from) to.Put(RefPtr<IMKBitmap>::Adopt(from->Clone()), false);
}

// --- canvases

template <class Canvas>
void ChangeCanvas(CanvasWorld& world, Slot<Canvas> const& slot) {
    Use(slot, [&](Canvas& canvas) { DoOne(kSteps, world.input, canvas, world.input); });
}

// As foreign code does it.
void UsePen(FuzzInput& i, Slot<IMKPenCanvas> const& slot) {
    int const frameBuffer = i.Int();
    int const discard = i.Int();
    if (!slot.object) return;
    slot.object->GetModelMatrix();
    slot.object->GetCanvasMatrix();
    ThreadScope const scope(true);
    IMKBitmap* const bitmap = slot.object->GetBitmap();
    IMKBitmapWritable* const writable = bitmap ? bitmap->GetBitmapWritable() : nullptr;
    slot.object->EnableClipRT(frameBuffer);
    if (writable) writable->ActivateFrameBufferRT(false);
    slot.object->DisableClipRT();
    if (writable) writable->DeactivateFrameBufferRT(false, static_cast<DiscardFramebufferType>(discard));
}

// --- what a canvas draws

// With a paint, or with null, which stands for a new one.
template <class Action>
void DrawWithPaint(CanvasWorld& world, Slot<IMKCanvas> const& slot, Action const& action) {
    MKPaint paint;
    bool const hasPaint = world.input.Bool();
    if (hasPaint) ReadPaint(world.input, paint);
    Use(slot, [&](IMKCanvas& canvas) { action(canvas, hasPaint ? &paint : nullptr); });
}

void DrawShape(CanvasWorld& world, FuzzInput& i, Slot<IMKCanvas> const& slot) {
    IMKBitmap* const bitmap = world.PickBitmapFor(slot.onRenderThread);
    DrawWithPaint(world, slot, [&](IMKCanvas& canvas, MKPaint const* paint) {
        DoOne(kShapes, i, canvas, i, bitmap, paint);
    });
}

using Bitmap = RefPtr<IMKBitmap>;

IMKCustomDrawable* MakeDrawable(int kind, IGLMsgQueue* queue, FuzzInput& i, Bitmap first, Bitmap second) {
    if (kind == 0) {
        auto* const blur = new MKGaussianBlurDrawable(queue);
        blur->SetBitmap(first.Get());
        blur->SetHorizotalDirection(i.Bool());
        blur->SetBlurAmount(i.Float());
        blur->SetOffset(i.Float(), i.Float());
        return blur;
    }
    if (kind == 1) {
        auto* const over = new MKNonPremultipliedColorDrawable(queue);
        over->SetBitmap(first.Get(), second.Get());
        return over;
    }
    if (kind == 2) {
        auto* const mask = new MKTextMaskBitmapDrawable(queue);
        mask->SetBitmap(first.Get());
        mask->SetDstPosition(i.Float(), i.Float());
        return mask;
    }
    if (kind == 3) {
        auto* const stroke = new MKStrokeDrawable(queue);
        for (int count = i.Below(12); count > 0; --count) {
            MKStrokePoint const point{i.Float(), i.Float(), i.Float()};
            stroke->Append(&point, i.Below(2));
        }
        return stroke;
    }
    // It takes the references over.
    return new MKBlendedBitmapDrawable(queue, first.Release(), second.Release(), ReadRectF(i), ReadRectF(i),
                                       i.Float(), i.Float());
}

void MakeCustom(CanvasWorld& world, FuzzInput& i, DrawableSlot& slot) {
    int const kind = i.Below(5);
    auto const first = Bitmap::Share(world.PickBitmapFor(false));
    auto const second = Bitmap::Share(world.PickBitmapFor(false));
    slot.Put(RefPtr<IMKCustomDrawable>::Adopt(MakeDrawable(kind, &world.queue, i, first, second)), false);
}

// --- the tables

using Operation = void (*)(CanvasWorld& world);

template <class T>
void Share(Slot<T> const& from, Slot<T>& to) {
    to.Put(RefPtr<T>(from.object), bool{from.onRenderThread});
}

constexpr Operation kBitmaps[] = {
    [](auto& w) { MakeBitmap(w, w.input, w.PickBitmap()); },
    [](auto& w) { MakeRegion(w, w.input, w.PickBitmap()); },
    [](auto& w) { MakeScreen(w, w.input, w.PickBitmap()); },
    [](auto& w) { MakeOver<IMKBitmap>(w, w.PickBitmap(), MKGraphicsFactory::CreateBitmap); },
    CloneBitmap,
    [](auto& w) { Share(w.PickBitmap(), w.PickBitmap()); },
    [](auto& w) { w.PickBitmap().Drop(); },
    [](auto& w) { UpdateBitmap(w, w.input, w.PickBitmap()); },
    [](auto& w) { Use(w.PickBitmap(), [&](auto& bitmap) { ReadPixel(bitmap, w.input); }); },
    [](auto& w) { Use(w.PickBitmap(), [&](auto& bitmap) { ReadBlock(w, bitmap, w.input); }); },
    [](auto& w) { Use(w.PickBitmap(), [&](auto& bitmap) { SetSampling(bitmap, w.input); }); },
    [](auto& w) { Use(w.PickBitmap(), [&](auto& bitmap) { bitmap.SetTag(ReadTag(w.input).c_str()); }); },
    [](auto& w) { Testing::RendererTrace::FailCreation(1 + w.input.Below(16)); },
    [](auto& w) { w.queue.RunAll(); },
};

constexpr Operation kCanvases[] = {
    [](auto& w) { MakeOver(w, w.PickCanvas(), MKGraphicsFactory::CreateCanvas); },
    [](auto& w) { MakeOver(w, w.PickPenCanvas(), MKGraphicsFactory::CreatePenCanvas); },
    [](auto& w) { Share(w.PickCanvas(), w.PickCanvas()); },
    [](auto& w) { w.PickCanvas().Drop(); },
    [](auto& w) { w.PickPenCanvas().Drop(); },
    [](auto& w) { UsePen(w.input, w.PickPenCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickPenCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickCanvas()); },
    [](auto& w) { ChangeCanvas(w, w.PickCanvas()); },
};

void DrawCustom(CanvasWorld& world) {
    IMKCustomDrawable* const drawable = world.PickDrawable().object.Get();
    DrawWithPaint(world, world.PickCanvas(),
                  [&](IMKCanvas& canvas, MKPaint const* paint) { canvas.Draw(drawable, paint); });
}

constexpr Operation kDraws[] = {
    [](auto& w) { DrawShape(w, w.input, w.PickCanvas()); },
    [](auto& w) { DrawShape(w, w.input, w.PickCanvas()); },
    [](auto& w) { DrawShape(w, w.input, w.PickCanvas()); },
    [](auto& w) { DrawShape(w, w.input, w.PickCanvas()); },
    [](auto& w) { MakeCustom(w, w.input, w.PickDrawable()); },
    [](auto& w) { w.PickDrawable().Drop(); },
    DrawCustom,
};

constexpr Operation kKinds[] = {
    [](auto& w) { DoOne(kBitmaps, w.input, w); },
    [](auto& w) { DoOne(kCanvases, w.input, w); },
    [](auto& w) { DoOne(kDraws, w.input, w); },
    [](auto& w) { DoOne(kDraws, w.input, w); },
    [](auto& w) { w.queue.RunOne(); },
};

} // namespace
} // namespace Moka::Fuzz

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Moka::Fuzz::FuzzInput input(data, size);
    Moka::Fuzz::CanvasWorld world(input);
    while (!input.IsEmpty()) DoOne(Moka::Fuzz::kKinds, input, world);
    return 0;
}
