// SceneFile.h: reads scenes from JSON. docs/scene-format.md describes the format.
// All values are checked, and all images decoded, before drawing begins.
// Fails: throws SceneError: "file:line:column: operations[3].DrawRect.rect must be ..., not ...".
#pragma once

#include "scenes/Scene.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace Moka::Scenes {

// Limits of a scene. Image files and generated pictures count alike.
constexpr std::size_t kMaxBitmaps = 1024;
constexpr std::int64_t kMaxPicturePixels = std::int64_t{64} << 20; // together; 256 MiB
constexpr std::size_t kMaxFileBytes = 64u << 20;

// Reads a scene from a file. The scene's name is that of the file, without folder and extension. "-" is
// standard input; the paths of images are then relative to the current folder.
Scene LoadScene(std::string const& path);

// Reads a scene from text. Messages contain name in place of the file's name. The paths of images are
// relative to folder.
Scene ParseScene(std::string_view text, std::string const& name, std::string const& folder);

} // namespace Moka::Scenes
