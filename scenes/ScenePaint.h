// ScenePaint.h: reads and writes the paints of a scene. The names of fields are those of MKPaint's
// properties.
#pragma once

#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneFields.h"
#include "scenes/SceneLine.h"

#include <map>
#include <string>

namespace Moka::Scenes {

using NamedPaints = std::map<std::string, MKPaint>;

// Reads the name of a paint, or an object; its field "base" names the paint that it modifies.
MKPaint ReadPaint(SceneValue const& value, NamedPaints const& named);

// Returns the fields of an object that ReadPaint reads as the same paint.
SceneLine DescribePaint(MKPaint const& paint);

} // namespace Moka::Scenes
