// SceneStage: what a scene needs besides a canvas: bitmaps that the canvas can draw, and for scenes that make
// objects of the GPU, the queue, and ink.
// Thread: one at a time, the one that draws the scene.
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

    // With one reference for the caller, given back with Unref(). The stage keeps a copy of the pixels if it
    // needs them later. Null when there is no room.
    virtual IMKBitmap* MakeBitmap(Picture const& picture) = 0;

    // Null where there is no GPU; see Scene::needsGpu.
    virtual IGLMsgQueue* GetQueue() = 0;

    // Null where nobody brought one; see Scene::needsPen.
    virtual ScenePen* GetPen() { return nullptr; }
};

} // namespace Moka::Scenes
