// PageFile: a page as the text of a scene (docs/scene-format.md), one operation a line, and back.
// Strokes are DrawStroke, images DrawBitmap; a bitmap's name is its file. Files inside the page's folder are named
// relative to it.
// Thread: any.
// Fails:  reading never throws. What cannot be read is left out and told, with its line.
#pragma once

#include "apps/notebook/Page.h"

#include <string>
#include <string_view>
#include <vector>

namespace Moka::Notebook {

// One object as an operation, and back: throws Scenes::SceneError.
std::string WriteOperation(Object const& object, std::string const& folder);
ObjectPtr ReadOperation(std::string_view text, std::string const& folder);

std::string WritePage(Objects const& objects, int height, std::string const& folder);

struct PageText {
    Objects objects;
    std::vector<std::string> problems; // if any, not everything was read
};
// name stands for the file in messages.
PageText ReadPage(std::string_view text, std::string const& name, std::string const& folder);

// Whether the path can stand in a file of JSON: it is UTF-8.
bool IsWritablePath(std::string const& path);

} // namespace Moka::Notebook
