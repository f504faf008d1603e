// Arguments.h: checks of arguments that are made in several places.
#pragma once

#include "apps/moka/Failure.h"

#include <string>

namespace Moka::Tool {

// Returns what is wrong, empty when nothing.
std::string CheckPath(std::string const& path);
// The same of a format's name, which is an extension.
std::string CheckFormat(std::string const& format);

// Makes the folder where it is missing, with those above it. Throws Failure unless files can be made in it.
void MakeFolder(std::string const& folder);

// Before any work, so that nobody waits for what cannot be saved: throws Failure unless a file of this name
// can be written and its extension says the format. "-" is well.
void CheckOutput(std::string const& output);

// What a picture of this name is saved with when nobody says: 90 as JPEG, else every pixel.
int GetUsualQuality(std::string const& output);

} // namespace Moka::Tool
