#include "apps/moka/Arguments.h"

#include "moka/base/String.h"

namespace Moka::Tool {

std::string CheckPath(std::string const& path) {
    if (path.empty()) return "the name of the file is empty";
    std::string const understood = String(path).ToUtf8();
    return understood == path ? std::string() : understood + ": the name is not valid UTF-8; rename the file";
}

} // namespace Moka::Tool
