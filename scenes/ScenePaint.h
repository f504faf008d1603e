// ScenePaint.h: paints of a scene, under the names that MKPaint gives its properties.
#pragma once

#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneFields.h"
#include "scenes/SceneLine.h"

#include <map>
#include <string>

namespace Moka::Scenes {

using NamedPaints = std::map<std::string, MKPaint>;

// A name out of those given, or an object; "base" in it names the paint that it changes.
MKPaint ReadPaint(SceneValue const& value, NamedPaints const& named);

// What ReadPaint makes the same paint of: an object's fields.
SceneLine DescribePaint(MKPaint const& paint);

} // namespace Moka::Scenes
