// PenScenes.h: the scenes whose ink is drawn by foreign GL code through a pen canvas.
#pragma once

#include "scenes/Scene.h"

#include <vector>

namespace Moka::Scenes {

std::vector<Scene> MakePenScenes();

} // namespace Moka::Scenes
