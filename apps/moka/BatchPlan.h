// BatchPlan: which file of many becomes which, settled before any work.
#pragma once

#include <string>
#include <vector>

namespace Moka::Tool {

struct BatchFile {
    std::string input;
    std::string output;
};

// Each input's name, with format as its extension, in folder. Throws Failure when two inputs would become one
// file.
std::vector<BatchFile> PlanBatch(std::vector<std::string> const& inputs, std::string const& format,
                                 std::string const& folder);

} // namespace Moka::Tool
