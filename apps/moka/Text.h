// Text.h: names and messages as a terminal may show them.
#pragma once

#include <string>

namespace Moka::Tool {

// In UTF-8, with substitute for every control character: names of files may hold any byte.
std::string MakePrintable(std::string const& text, char substitute = '?');

std::string ReplaceAll(std::string text, std::string const& part, std::string const& by);

} // namespace Moka::Tool
