#include "fuzz/CanvasWorld.h"

#include "moka/renderer/RendererFactory.h"

namespace Moka::Fuzz {

using Testing::RecordingRenderer;

CanvasWorld::CanvasWorld(FuzzInput& bytes) : input(bytes) {
    RecordingRenderer::Reset();
    RecordingRenderer::SetMaxTextureSize(kMaxTexture);
    RecordingRenderer::KeepRecords(false);
    RecordingRenderer::DeclareRenderThread();
    RendererFactory::AttachContext();
    RecordingRenderer::DeclareNoRenderThread();
    queue.SetAroundRun([] { RecordingRenderer::DeclareRenderThread(); },
                       [] { RecordingRenderer::DeclareNoRenderThread(); });
}

CanvasWorld::~CanvasWorld() {
    DropAll();
    queue.RunAll();
    for (std::string const& violation : RecordingRenderer::GetViolations()) Require(false, violation.c_str());
    Require(RecordingRenderer::CountLiveObjects() == 0, "GPU objects are left");
    RecordingRenderer::DeclareRenderThread();
    RendererFactory::DetachContext();
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
