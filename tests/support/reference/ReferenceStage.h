// ReferenceStage: makes the bitmaps that a ReferenceCanvas draws. No queue: nothing of a GPU.
#pragma once

#include "scenes/Picture.h"
#include "scenes/SceneStage.h"
#include "tests/support/reference/ReferenceBitmap.h"

namespace Moka::Testing {

class ReferenceStage final : public Scenes::SceneStage {
public:
    IMKBitmap* MakeBitmap(Scenes::Picture const& picture) override {
        TestImage image(picture.width, picture.height);
        image.pixels = picture.pixels;
        return new ReferenceBitmap(image);
    }
    IGLMsgQueue* GetQueue() override { return nullptr; }
};

} // namespace Moka::Testing
