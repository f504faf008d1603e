#include "apps/moka/Failure.h"

#include "apps/moka/Text.h"

#include <cstdio>

namespace Moka::Tool {

void PrintError(std::string const& message) {
    std::string const line = MakePrintable(message.substr(0, message.find_last_not_of(" \n") + 1), ' ');
    std::fflush(stdout);
    std::fprintf(stderr, "moka: %s\n", line.c_str());
}

} // namespace Moka::Tool
