// Arguments.h: checks of arguments that several commands take. Each returns what is wrong, empty when
// nothing.
#pragma once

#include <string>

namespace Moka::Tool {

// The library's paths are UTF-8; any other byte would name another file.
std::string CheckPath(std::string const& path);

} // namespace Moka::Tool
