// NoteScene.h: handwriting and a sketch on a page of a notebook, in ink that external GL code draws.
#pragma once

#include "scenes/Scene.h"

namespace Moka::Scenes {

// paper becomes the page with the ink on it, and then needs a GPU and a pen.
void AddHandwriting(Scene& paper);

} // namespace Moka::Scenes
