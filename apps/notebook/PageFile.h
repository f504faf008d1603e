// PageFile: converts a page to the text of a scene (docs/scene-format.md), one operation a line, and back.
// Strokes are DrawStroke, images DrawBitmap; a bitmap's name is its file. Files inside the page's folder are named
// relative to it.
// Thread: any.
// Fails:  ReadPage does not throw. It omits what it cannot read and reports a problem with the line.
#pragma once

#include "apps/notebook/Page.h"

#include <string>
#include <string_view>
#include <vector>

namespace Moka::Notebook {

// Converts one object to an operation, and back. ReadOperation throws Scenes::SceneError.
std::string WriteOperation(Object const& object, std::string const& folder);
ObjectPtr ReadOperation(std::string_view text, std::string const& folder);

std::string WritePage(Objects const& objects, int height, std::string const& folder);

struct PageText {
    Objects objects;
    std::vector<std::string> problems; // not empty if something was omitted
};
// Messages use name as the file's name.
PageText ReadPage(std::string_view text, std::string const& name, std::string const& folder);

// True if the path is UTF-8, so that a JSON file can contain it.
bool IsWritablePath(std::string const& path);

} // namespace Moka::Notebook
