#include "fuzz/CanvasWorld.h"

namespace Moka::Fuzz {

using Testing::RendererTrace;

CanvasWorld::~CanvasWorld() {
    DropAll();
    queue.RunAll();
    for (std::string const& violation : RendererTrace::GetViolations()) Require(false, violation.c_str());
    Require(RendererTrace::CountLiveObjects() == 0, "GPU objects are left");
}

IMKBitmap* CanvasWorld::PickBitmapFor(bool onRenderThread) {
    Slot<IMKBitmap> const& slot = PickBitmap();
    return slot.onRenderThread && !onRenderThread ? nullptr : slot.object.Get();
}

unsigned char* CanvasWorld::NewBuffer(std::size_t count) {
    return mBuffers.emplace_back(std::make_unique<unsigned char[]>(count)).get();
}

void CanvasWorld::DropAll() {
    int const order = input.Byte();
    auto const drop = [](auto& slots) {
        for (auto& slot : slots) slot.Drop();
    };
    if ((order & 1) != 0) drop(bitmaps);
    if ((order & 2) != 0) drop(canvases);
    if ((order & 4) != 0) queue.RunAll();
    drop(drawables);
    drop(penCanvases);
    drop(canvases);
    drop(bitmaps);
}

} // namespace Moka::Fuzz
