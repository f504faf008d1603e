// Text.h: makes names and messages printable on a terminal.
#pragma once

#include <string>

namespace Moka::Tool {

// Returns UTF-8 with every control character replaced by substitute. File names may contain any bytes.
std::string MakePrintable(std::string const& text, char substitute = '?');

std::string ReplaceAll(std::string text, std::string const& part, std::string const& by);

} // namespace Moka::Tool
