#include "fuzz/CanvasWorld.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"

#include <algorithm>
#include <string>

namespace Moka::Fuzz {
namespace {

constexpr std::size_t kPixelBytes = 4;

std::size_t CountBytes(int width, int height) {
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * kPixelBytes;
}

int ReadSide(FuzzInput& input) { return input.Below(kMaxSide + 3) - 2; }

Rect ReadRect(FuzzInput& input) {
    int const left = input.Int();
    int const top = input.Int();
    int const right = input.Int();
    return {left, top, right, input.Int()};
}

// Whether memory for all of it can be made: as much as the largest bitmap, and one row of any other.
bool IsSmall(Rect const& r) {
    return r.IsEmpty() || (r.GetWidth() <= 2 * kMaxSide && r.GetHeight() <= 2 * kMaxSide);
}

// A bitmap of pixels that it owns once it is made, of the world's, or of none.
template <class Create>
void MakeOfPixels(CanvasWorld& world, Slot<IMKBitmap>& slot, int width, int height, int flags,
                  Create const& create) {
    bool const hasPixels = (flags & 2) != 0 && width > 0 && height > 0;
    bool const passesPixels = (flags & 4) != 0;
    std::size_t const count = hasPixels ? CountBytes(width, height) : 0;
    auto own = std::make_unique<unsigned char[]>(hasPixels && passesPixels ? count : 0);
    unsigned char* const pixels = passesPixels ? own.get() : world.NewBuffer(count);
    world.Make(slot, (flags & 1) != 0,
               [&](int useQueue) { return create(hasPixels ? pixels : nullptr, passesPixels, useQueue); });
    if (slot.object && hasPixels && passesPixels) static_cast<void>(own.release());
}

void MakeBitmap(CanvasWorld& world) {
    Slot<IMKBitmap>& slot = world.PickBitmap();
    int const flags = world.input.Byte();
    int const width = ReadSide(world.input);
    int const height = ReadSide(world.input);
    MakeOfPixels(world, slot, width, height, flags, [&](auto* pixels, bool passes, int useQueue) {
        return MKGraphicsFactory::CreateBitmap(&world.queue, width, height, pixels, passes, useQueue,
                                               (flags & 8) != 0);
    });
}

void MakeRegion(CanvasWorld& world) {
    Slot<IMKBitmap>& slot = world.PickBitmap();
    int const width = ReadSide(world.input);
    int const height = ReadSide(world.input);
    Rect const region = ReadRect(world.input);
    int const flags = world.input.Bool() ? 6 : 2;
    MakeOfPixels(world, slot, width, height, flags, [&](auto* pixels, bool passes, int) {
        return MKGraphicsFactory::CreateBitmap(&world.queue, region, width, height, pixels, passes ? 0 : 1);
    });
}

void MakeScreen(CanvasWorld& world) {
    Slot<IMKBitmap>& slot = world.PickBitmap();
    int const flags = world.input.Byte();
    int const x = world.input.Int();
    int const y = world.input.Int();
    int const width = ReadSide(world.input);
    int const height = ReadSide(world.input);
    world.Make(slot, (flags & 1) != 0, [&](int useQueue) {
        return MKGraphicsFactory::CreateScreenBitmap(&world.queue, x, y, width, height, flags & 2, useQueue);
    });
}

void MakeShared(CanvasWorld& world) {
    Slot<IMKBitmap>& slot = world.PickBitmap();
    bool const onRenderThread = world.input.Bool();
    IMKBitmap* const parent = world.PickBitmapFor(onRenderThread);
    world.Make(slot, onRenderThread,
               [&](int useQueue) { return MKGraphicsFactory::CreateBitmap(&world.queue, parent, useQueue); });
}

// Of a render-thread bitmap the clone is caller-side, and dropped last it would end the other on this thread.
void CloneBitmap(CanvasWorld& world) {
    IMKBitmap* const from = world.PickBitmapFor(false);
    Slot<IMKBitmap>& to = world.PickBitmap();
    if (from) to.Put(RefPtr<IMKBitmap>::Adopt(from->Clone()), false);
}

void ShareBitmap(CanvasWorld& world) {
    Slot<IMKBitmap> const from = world.PickBitmap();
    world.PickBitmap().Put(from.object, from.onRenderThread);
}

void UpdateBitmap(CanvasWorld& world) {
    Slot<IMKBitmap> const& slot = world.PickBitmap();
    bool const whole = world.input.Bool();
    int const stride = world.input.Int();
    Rect const rect = ReadRect(world.input);
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

void ReadPixel(CanvasWorld& world) {
    Slot<IMKBitmap> const& slot = world.PickBitmap();
    Point const point(world.input.Int(), world.input.Int());
    bool const waits = world.input.Bool();
    Use(slot, [&](IMKBitmap& bitmap) {
        if (waits)
            bitmap.GetPixel(point);
        else
            bitmap.GetPixelAsync(point, nullptr, [](unsigned int, void*) {});
    });
}

void ReadBlock(CanvasWorld& world) {
    Slot<IMKBitmap> const& slot = world.PickBitmap();
    Rect const rect = ReadRect(world.input);
    bool const waits = world.input.Bool();
    if (!slot.object || !IsSmall(rect)) return;
    std::size_t const count = rect.IsEmpty() ? kPixelBytes : CountBytes(rect.GetWidth(), rect.GetHeight());
    unsigned char* const to = world.NewBuffer(count);
    ThreadScope const scope(slot.onRenderThread);
    if (waits)
        slot.object->GetBitmapData(rect, to);
    else
        slot.object->GetBitmapDataAsync(rect, to, nullptr, [](Rect const&, void*, void*) {});
}

void SetSampling(CanvasWorld& world) {
    Slot<IMKBitmap> const& slot = world.PickBitmap();
    bool const filters = world.input.Bool();
    int const value = world.input.Below(4); // what the enumerations have room for
    Use(slot, [&](IMKBitmap& bitmap) {
        IMKBitmapReadable* const readable = bitmap.GetBitmapReadable();
        if (!readable) return;
        if (filters)
            readable->SetTextureFilter(static_cast<TextureParamFilteringValue>(value));
        else
            readable->SetTextureWrap(static_cast<TextureParamWrappingValue>(value));
    });
}

void TagBitmap(CanvasWorld& world) {
    Slot<IMKBitmap> const& slot = world.PickBitmap();
    std::string const tag(static_cast<std::size_t>(world.input.Byte()), 'x');
    Use(slot, [&](IMKBitmap& b) { b.SetTag(world.input.Bool() ? tag.c_str() : b.GetTag()); });
}

} // namespace

std::vector<Operation> const& GetBitmapOperations() {
    static std::vector<Operation> const operations = {
        MakeBitmap,
        MakeRegion,
        MakeScreen,
        MakeShared,
        CloneBitmap,
        ShareBitmap,
        [](CanvasWorld& world) { world.PickBitmap().Drop(); },
        UpdateBitmap,
        ReadPixel,
        ReadBlock,
        SetSampling,
        TagBitmap,
        [](CanvasWorld& world) { Testing::RendererTrace::FailCreation(1 + world.input.Below(16)); },
        [](CanvasWorld& world) { world.queue.RunAll(); }};
    return operations;
}

} // namespace Moka::Fuzz
