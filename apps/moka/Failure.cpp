#include "apps/moka/Failure.h"

#include <cstdio>

namespace Moka::Tool {

std::string TellCannot(char const* action, std::string const& path, std::string const& reason) {
    std::string told = "cannot ";
    told.append(action).append(" image '").append(path).append("'");
    if (!reason.empty()) told.append(": ").append(reason);
    return told;
}

void PrintError(std::string const& message) {
    std::string line = message.substr(0, message.find_last_not_of(" \n") + 1);
    for (char& c : line) {
        if (static_cast<unsigned char>(c) < ' ' || c == 0x7F) c = ' ';
    }
    std::fflush(stdout);
    std::fprintf(stderr, "moka: %s\n", line.c_str());
}

} // namespace Moka::Tool
