// SceneRenderer.h: draws scenes on the GPU and reads them back.
// Thread: any except the render thread, because reading back waits for it.
#pragma once

#include "scenes/Picture.h"
#include "scenes/Scene.h"

#include <functional>

namespace Moka::Scenes {

// Creates bitmaps on the GPU, for canvases on any thread except the render thread.
class QueueStage final : public SceneStage {
public:
    // Both must outlive the stage. The pen may be null.
    explicit QueueStage(IGLMsgQueue& queue, ScenePen* pen = nullptr) : mQueue(queue), mPen(pen) {}

    IMKBitmap* MakeBitmap(Picture const& picture) override;
    IGLMsgQueue* GetQueue() override { return &mQueue; }
    ScenePen* GetPen() override { return mPen; }

private:
    IGLMsgQueue& mQueue;
    ScenePen* const mPen;
};

// Draws a scene and reads it back. A scene with onScreen is drawn on the default frame buffer, which must
// have the scene's size. onDrawn is called after the last draw, while the canvas and its programs exist.
// Fails: throws SceneError if memory for the target or a bitmap runs out.
Picture RenderScene(Scene const& scene, IGLMsgQueue& queue, ScenePen* pen = nullptr,
                    std::function<void()> const& onDrawn = {});

} // namespace Moka::Scenes
