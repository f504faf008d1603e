#include "apps/moka/Failure.h"

#include "apps/moka/Text.h"

#include <cstdio>

namespace Moka::Tool {

std::string TellCannot(char const* action, std::string const& path, std::string const& reason) {
    std::string told = "cannot ";
    told.append(action).append(" image '").append(path).append("'");
    if (!reason.empty()) told.append(": ").append(reason);
    return told;
}

void PrintError(std::string const& message) {
    std::string const line = MakePrintable(message.substr(0, message.find_last_not_of(" \n") + 1), ' ');
    std::fflush(stdout);
    std::fprintf(stderr, "moka: %s\n", line.c_str());
}

} // namespace Moka::Tool
