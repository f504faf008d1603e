// BatchPlan: which file of many becomes which, settled before any work.
#pragma once

#include <string>
#include <vector>

namespace Moka::Tool {

struct BatchFile {
    std::string input;
    std::string output;
};

// What is wrong with the name of a format, empty when nothing.
std::string CheckFormat(std::string const& format);

// Each input's name, with format as its extension, in folder. Throws Failure when the folder cannot be
// written to or two inputs would become one file.
std::vector<BatchFile> PlanBatch(std::vector<std::string> const& inputs, std::string const& format,
                                 std::string const& folder);

} // namespace Moka::Tool
