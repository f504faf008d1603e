// PenScenes.h: the scenes whose ink external GL code draws through a pen canvas.
#pragma once

#include "scenes/Scene.h"

#include <vector>

namespace Moka::Scenes {

std::vector<Scene> MakePenScenes();

} // namespace Moka::Scenes
