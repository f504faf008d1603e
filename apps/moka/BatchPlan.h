// BatchPlan: determines the output file of each input, before any work.
#pragma once

#include <string>
#include <vector>

namespace Moka::Tool {

struct BatchFile {
    std::string input;
    std::string output;
};

// The output has the input's name, with format as its extension, in folder. Throws Failure if two inputs
// would have the same output.
std::vector<BatchFile> PlanBatch(std::vector<std::string> const& inputs, std::string const& format,
                                 std::string const& folder);

} // namespace Moka::Tool
