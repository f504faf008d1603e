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

template <class Canvas, class Create>
void Make(CanvasWorld& world, Slot<Canvas>& slot, Create const& create) {
    bool const onRenderThread = world.input.Bool();
    IMKBitmap* const target = world.PickBitmapFor(onRenderThread);
    RefPtr<Canvas> made;
    {
        ThreadScope const scope(onRenderThread);
        made = RefPtr<Canvas>::Adopt(create(&world.queue, target, onRenderThread ? 0 : 1));
    }
    slot.Put(std::move(made), onRenderThread);
}

void MakeCanvas(CanvasWorld& world) { Make(world, world.PickCanvas(), MKGraphicsFactory::CreateCanvas); }

void MakePenCanvas(CanvasWorld& world) {
    Make(world, world.PickPenCanvas(), MKGraphicsFactory::CreatePenCanvas);
}

void ShareCanvas(CanvasWorld& world) {
    Slot<IMKCanvas> const from = world.PickCanvas();
    world.PickCanvas().Put(from.object, from.onRenderThread);
}

void DropCanvas(CanvasWorld& world) { world.PickCanvas().Drop(); }

void DropPenCanvas(CanvasWorld& world) { world.PickPenCanvas().Drop(); }

void ClearOrClip(IMKCanvasBase& canvas, FuzzInput& input) {
    float const r = input.Float();
    int const x = input.Int();
    int const y = input.Int();
    switch (input.Below(5)) {
    case 0:
        return canvas.Clear(x);
    case 1:
        return canvas.Clear(r, input.Float(), input.Float(), input.Float());
    case 2:
        return canvas.ClearAll(x);
    case 3:
        return canvas.ClearAll(r, input.Float(), input.Float(), input.Float());
    default:
        int const width = input.Int();
        int const height = input.Int();
        return canvas.SetClipRect(x, y, width, height, static_cast<IMKCanvasBase::ClipOp>(input.Int()));
    }
}

void Transform(IMKCanvasBase& canvas, FuzzInput& input) {
    int const operation = input.Below(10);
    float const a = input.Float();
    float const b = input.Float();
    switch (operation) {
    case 0:
        return canvas.PreScale(a, b);
    case 1:
        return canvas.PostScale(a, b);
    case 2:
        return canvas.PreRotate(a);
    case 3:
        return canvas.PreRotate(a, b, input.Float());
    case 4:
        return canvas.PostRotate(a);
    case 5:
        return canvas.PostRotate(a, b, input.Float());
    case 6:
        return canvas.PreTranslate(a, b);
    case 7:
        return canvas.PostTranslate(a, b);
    case 8:
        return canvas.PreConcat(ReadMatrix(input));
    default:
        return canvas.PostConcat(ReadMatrix(input));
    }
}

void ChangeState(IMKCanvasBase& canvas, FuzzInput& input) {
    switch (input.Below(6)) {
    case 0:
        canvas.Save(static_cast<IMKCanvasBase::SaveFlag>(input.Int()));
        return;
    case 1:
        return canvas.Restore(input.Int());
    case 2:
        return canvas.SetMatrix(ReadMatrix(input));
    case 3:
        return Transform(canvas, input);
    case 4:
        return canvas.SetTag(std::string(static_cast<std::size_t>(input.Byte()), 'x').c_str());
    default:
        return ClearOrClip(canvas, input);
    }
}

void ChangeCanvas(CanvasWorld& world) {
    Slot<IMKCanvas> const& slot = world.PickCanvas();
    ThreadScope const scope(slot.onRenderThread);
    if (slot.object) ChangeState(*slot.object, world.input);
}

void ChangePenCanvas(CanvasWorld& world) {
    Slot<IMKPenCanvas> const& slot = world.PickPenCanvas();
    ThreadScope const scope(slot.onRenderThread);
    if (slot.object) ChangeState(*slot.object, world.input);
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
        MakeCanvas,   MakePenCanvas, ShareCanvas,  DropCanvas,   DropPenCanvas,   ChangeCanvas,
        ChangeCanvas, ChangeCanvas,  ChangeCanvas, ChangeCanvas, ChangePenCanvas, UsePen};
    return operations;
}

} // namespace Moka::Fuzz
