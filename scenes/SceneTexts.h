// SceneTexts.h: the files of scenes/data, which the build embeds in the library.
#pragma once

#include <cstddef>

namespace Moka::Scenes {

struct SceneText {
    char const* name;
    char const* text;
};

extern SceneText const kSceneTexts[];
extern std::size_t const kSceneTextCount;

} // namespace Moka::Scenes
