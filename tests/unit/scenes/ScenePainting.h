// ScenePainting.h: what scenes draw, without a GPU, on the reference canvas.
#pragma once

#include "moka/base/RefPtr.h"
#include "scenes/Scene.h"
#include "tests/support/reference/ReferenceCanvas.h"
#include "tests/support/reference/ReferenceStage.h"

namespace Moka::Testing {

inline Picture Paint(int width, int height,
                     std::function<void(IMKCanvas&, Scenes::SceneStage&)> const& draw) {
    auto const bitmap = RefPtr<ReferenceBitmap>::Adopt(new ReferenceBitmap(Picture(width, height)));
    auto const canvas = RefPtr<ReferenceCanvas>::Adopt(new ReferenceCanvas(*bitmap, {}));
    ReferenceStage stage;
    draw(*canvas, stage);
    return bitmap->image;
}

} // namespace Moka::Testing
