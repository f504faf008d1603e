/// Log: hides file names in log lines.
#pragma once

#include "moka/base/Export.h"

#include <string>

namespace Moka {

class String;

class MOKA_API Log {
public:
    /// Returns the text in a form that may be logged, in UTF-8. In engineering builds the text is unchanged.
    /// In others, every character becomes '*', except the slashes and the extension (one to five ASCII
    /// letters or digits after the last dot).
    static std::string ConvertSecureLog(String const& text);
};

} // namespace Moka
