// CustomScenes.h: the scenes with custom drawables, which need a queue and bitmaps on the GPU.
#pragma once

#include "scenes/Scene.h"

#include <vector>

namespace Moka::Scenes {

std::vector<Scene> MakeCustomScenes();

} // namespace Moka::Scenes
