// SceneRenderer.h: draws scenes on the GPU and reads them back.
// Thread: any but the render thread, which reading back waits for.
#pragma once

#include "scenes/Picture.h"
#include "scenes/Scene.h"

namespace Moka::Scenes {

// Bitmaps on the GPU, for canvases on any thread but the render thread.
class QueueStage final : public SceneStage {
public:
    explicit QueueStage(IGLMsgQueue& queue) : mQueue(queue) {}

    IMKBitmap* MakeBitmap(Picture const& picture) override;
    IGLMsgQueue* GetQueue() override { return &mQueue; }

private:
    IGLMsgQueue& mQueue;
};

// A scene for the screen is drawn on the default frame buffer, which has to be as large as the scene.
// Fails: throws SceneError when there is no room for the target or a bitmap.
Picture RenderScene(Scene const& scene, IGLMsgQueue& queue);

} // namespace Moka::Scenes
