// SceneStage: provides what a scene needs besides a canvas: bitmaps for the canvas, the queue for scenes that
// create GPU objects, and the pen.
// Thread: the thread that draws the scene.
#pragma once

namespace Moka {

class IGLMsgQueue;
class IMKBitmap;

} // namespace Moka

namespace Moka::Scenes {

struct Picture;
class ScenePen;

class SceneStage {
public:
    virtual ~SceneStage() = default;

    // Creates a bitmap. The caller gets one reference. The stage copies the pixels if it needs them later.
    // Returns null if memory runs out.
    virtual IMKBitmap* MakeBitmap(Picture const& picture) = 0;

    // The queue; null if there is no GPU. See Scene::needsGpu.
    virtual IGLMsgQueue* GetQueue() = 0;

    // The pen; null if there is none. See Scene::needsPen.
    virtual ScenePen* GetPen() { return nullptr; }
};

} // namespace Moka::Scenes
