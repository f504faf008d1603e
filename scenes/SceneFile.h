// SceneFile.h: scenes out of JSON. docs/scene-format.md describes the format.
// Everything is checked, and images are decoded, before anything is drawn.
// Fails: throws SceneError: "file:line:column: operations[3].DrawRect.rect must be ..., not ...".
#pragma once

#include "scenes/Scene.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace Moka::Scenes {

// Files and pictures made by rule alike.
constexpr std::size_t kMaxBitmaps = 1024;
constexpr std::int64_t kMaxPicturePixels = std::int64_t{64} << 20; // together; 256 MiB
constexpr std::size_t kMaxFileBytes = 64u << 20;

// The scene's name is the file's, without folder and extension. "-" is standard input; images then lie relative
// to the current folder.
Scene LoadScene(std::string const& path);

// name stands for the file in messages; images lie relative to folder.
Scene ParseScene(std::string_view text, std::string const& name, std::string const& folder);

} // namespace Moka::Scenes
