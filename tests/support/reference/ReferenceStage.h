// ReferenceStage: makes the bitmaps that a ReferenceCanvas draws. No queue: nothing of a GPU.
#pragma once

#include "scenes/SceneStage.h"
#include "tests/support/reference/ReferenceBitmap.h"

namespace Moka::Testing {

class ReferenceStage final : public Scenes::SceneStage {
public:
    IMKBitmap* MakeBitmap(Scenes::Picture const& picture) override { return new ReferenceBitmap(picture); }
    IGLMsgQueue* GetQueue() override { return nullptr; }
};

} // namespace Moka::Testing
