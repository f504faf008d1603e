// NoteScene.h: a notebook page with handwriting and a sketch, drawn by external GL code.
#pragma once

#include "scenes/Scene.h"

namespace Moka::Scenes {

// Adds the ink to the scene of the empty page, which then needs a GPU and a pen.
void AddHandwriting(Scene& paper);

} // namespace Moka::Scenes
