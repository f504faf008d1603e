#include "scenes/SceneRenderer.h"

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/task/IGLMsgQueue.h"
#include "scenes/SceneError.h"

#include <algorithm>
#include <memory>
#include <new>

namespace Moka::Scenes {
namespace {

RefPtr<IMKBitmap> MakeTarget(Scene const& scene, IGLMsgQueue& queue) {
    auto target = scene.onScreen ? NewScreenBitmap(queue, scene.width, scene.height)
                                 : NewBitmap(queue, scene.width, scene.height);
    if (!target) throw SceneError(scene.name + ": there is no room for its picture");
    return target;
}

// Throws if a strip has no texture. Strips are created on the render thread, which does not report failures.
void CheckStrips(Scene const& scene, IMKBitmap& target, IGLMsgQueue& queue) {
    IMKTextureBitmap* const strips = target.GetTextureBitmap();
    if (!strips) return;
    queue.WaitForTasks();
    for (int i = 0; i < strips->GetSubBitmapCount(); ++i) {
        IMKSubBitmap* const strip = strips->GetSubBitmap(i);
        if (!strip || !strip->GetTexture())
            throw SceneError(scene.name + ": the GPU has no room for its picture");
    }
}

// A screen bitmap is read with its bottom row first.
void FlipRows(Picture& picture) {
    for (int y = 0; y < picture.height / 2; ++y)
        std::swap_ranges(picture.At(0, y), picture.At(0, y) + picture.GetStride(),
                         picture.At(0, picture.height - 1 - y));
}

} // namespace

IMKBitmap* QueueStage::MakeBitmap(Picture const& picture) {
    std::unique_ptr<unsigned char[]> pixels(new (std::nothrow) unsigned char[picture.CountBytes()]);
    if (!pixels) return nullptr;
    std::copy(picture.pixels.begin(), picture.pixels.end(), pixels.get());
    IMKBitmap* const bitmap =
        MKGraphicsFactory::CreateBitmap(&mQueue, picture.width, picture.height, pixels.get(), true, 1, false);
    if (bitmap) pixels.release();
    return bitmap;
}

Picture RenderScene(Scene const& scene, IGLMsgQueue& queue, ScenePen* pen,
                    std::function<void()> const& onDrawn) {
    RefPtr<IMKBitmap> const target = MakeTarget(scene, queue);
    CheckStrips(scene, *target, queue);
    auto const canvas = NewCanvas(queue, target);
    if (!canvas) throw SceneError(scene.name + ": there is no room for a canvas");
    QueueStage stage(queue, pen);
    DrawScene(scene, *canvas, stage);
    Picture picture(scene.width, scene.height);
    target->GetBitmapData(target->GetBitmapRect(), picture.pixels.data());
    if (onDrawn) onDrawn();
    if (scene.onScreen) FlipRows(picture);
    return picture;
}

} // namespace Moka::Scenes
