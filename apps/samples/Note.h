// Note.h: a page of a notebook with handwriting and a sketch, in ink that foreign GL code draws.
#pragma once

#include "scenes/Scene.h"

#include <string>

namespace Moka::Samples {

// page is the scene's file of the paper, which the ink is laid on. Needs a pen.
// Fails: throws SceneError.
Scenes::Scene MakeNote(std::string const& page);

} // namespace Moka::Samples
