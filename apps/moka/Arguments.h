// Arguments.h: checks of arguments that are made in several places.
#pragma once

#include "apps/moka/Failure.h"

#include <string>

namespace Moka::Tool {

// Returns what is wrong, empty when nothing. The library's paths are UTF-8; any other byte would name another
// file.
std::string CheckPath(std::string const& path);

// Throws Failure, which begins with subject, unless files can be made in the folder. missing is the status
// when there is no such folder.
void CheckFolder(std::string const& subject, std::string const& folder, ExitStatus missing);

// Before any work, so that nobody waits for what cannot be saved: throws Failure unless a file of this name
// can be written and its extension says the format.
void CheckOutput(std::string const& output);

// What a picture of this name is saved with when nobody says: 90 as JPEG, else every pixel.
int GetUsualQuality(std::string const& output);

} // namespace Moka::Tool
