// SceneRenderer.h: draws scenes on the GPU and reads them back.
// Thread: any but the render thread, which reading back waits for.
#pragma once

#include "scenes/Picture.h"
#include "scenes/Scene.h"

#include <functional>

namespace Moka::Scenes {

// Bitmaps on the GPU, for canvases on any thread but the render thread.
class QueueStage final : public SceneStage {
public:
    // Both outlive the stage; the pen may be null.
    explicit QueueStage(IGLMsgQueue& queue, ScenePen* pen = nullptr) : mQueue(queue), mPen(pen) {}

    IMKBitmap* MakeBitmap(Picture const& picture) override;
    IGLMsgQueue* GetQueue() override { return &mQueue; }
    ScenePen* GetPen() override { return mPen; }

private:
    IGLMsgQueue& mQueue;
    ScenePen* const mPen;
};

// A scene for the screen is drawn on the default frame buffer, which has to be as large as the scene. onDrawn
// is called after the last draw, while the canvas and its programs exist.
// Fails: throws SceneError when there is no room for the target or a bitmap.
Picture RenderScene(Scene const& scene, IGLMsgQueue& queue, ScenePen* pen = nullptr,
                    std::function<void()> const& onDrawn = {});

} // namespace Moka::Scenes
