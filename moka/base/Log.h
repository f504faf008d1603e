/// Log: hides file names in log lines.
#pragma once

#include "moka/base/Export.h"

#include <string>

namespace Moka {

class String;

class MOKA_API Log {
public:
    /// The text as it may be logged: unchanged in an engineering build; otherwise only the slashes and the
    /// extension (one to five ASCII letters or digits after the last dot) are kept, every other character
    /// becomes '*'. UTF-8.
    static std::string ConvertSecureLog(String const& text);
};

} // namespace Moka
