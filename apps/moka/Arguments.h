// Arguments.h: checks of arguments that several commands use.
#pragma once

#include "apps/moka/Failure.h"

#include <string>

namespace Moka::Tool {

// Returns an error message, or an empty text if the path is valid.
std::string CheckPath(std::string const& path);
// The same for the name of a format, which is an extension.
std::string CheckFormat(std::string const& format);

// Creates the folder and its parents if they are missing. Throws Failure if files cannot be created in it.
void MakeFolder(std::string const& folder);

// Throws Failure if a file of this name cannot be written or its extension is unknown. Call it before any
// work, so that nobody waits for a result that cannot be saved. "-" is valid.
void CheckOutput(std::string const& output);

// Returns the default quality for a file of this name: 90 for JPEG, else 100.
int GetUsualQuality(std::string const& output);

} // namespace Moka::Tool
