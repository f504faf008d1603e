#include "fuzz/CanvasWorld.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"

#include <string>

namespace Moka::Fuzz {
namespace {

Matrix3<float> ReadMatrix(FuzzInput& input) {
    Matrix3<float> matrix;
    int const count = input.Below(10); // the rest stays the identity's
    for (int i = 0; i < count; ++i) matrix[i] = input.Float();
    return matrix;
}

template <class Canvas>
void Make(CanvasWorld& world, Slot<Canvas>& slot, Canvas* (*create)(IGLMsgQueue*, IMKBitmap*, int)) {
    bool const onRenderThread = world.input.Bool();
    IMKBitmap* const target = world.PickBitmapFor(onRenderThread);
    world.Make(slot, onRenderThread, [&](int useQueue) { return create(&world.queue, target, useQueue); });
}

void ShareCanvas(CanvasWorld& world) {
    Slot<IMKCanvas> const from = world.PickCanvas();
    world.PickCanvas().Put(from.object, from.onRenderThread);
}

using Step = void (*)(IMKCanvasBase& canvas, FuzzInput& input);

Step const kSteps[] = {
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
    [](auto& c, auto& i) { c.SetTag(std::string(static_cast<std::size_t>(i.Byte()), 'x').c_str()); },
};

void ChangeCanvas(CanvasWorld& world) {
    Use(world.PickCanvas(), [&](IMKCanvas& canvas) { DoOne(kSteps, world.input, canvas, world.input); });
}

// As foreign code does it.
void UsePen(CanvasWorld& world) {
    Slot<IMKPenCanvas> const& slot = world.PickPenCanvas();
    int const frameBuffer = world.input.Int();
    int const discard = world.input.Int();
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

} // namespace

std::vector<Operation> const& GetCanvasOperations() {
    static std::vector<Operation> const operations = {
        [](CanvasWorld& world) { Make(world, world.PickCanvas(), MKGraphicsFactory::CreateCanvas); },
        [](CanvasWorld& world) { Make(world, world.PickPenCanvas(), MKGraphicsFactory::CreatePenCanvas); },
        ShareCanvas,
        [](CanvasWorld& world) { world.PickCanvas().Drop(); },
        [](CanvasWorld& world) { world.PickPenCanvas().Drop(); },
        ChangeCanvas,
        ChangeCanvas,
        ChangeCanvas,
        ChangeCanvas,
        ChangeCanvas,
        [](CanvasWorld& world) {
            Use(world.PickPenCanvas(),
                [&](auto& canvas) { DoOne(kSteps, world.input, canvas, world.input); });
        },
        UsePen};
    return operations;
}

} // namespace Moka::Fuzz
