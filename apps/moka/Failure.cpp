#include "apps/moka/Failure.h"

#include <cstdio>

namespace Moka::Tool {

void PrintError(std::string const& message) {
    std::string line = message.substr(0, message.find_last_not_of(" \n") + 1);
    for (char& c : line) {
        if (static_cast<unsigned char>(c) < ' ' || c == 0x7F) c = ' ';
    }
    std::fflush(stdout);
    std::fprintf(stderr, "moka: %s\n", line.c_str());
}

} // namespace Moka::Tool
