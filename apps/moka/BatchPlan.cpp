#include "apps/moka/BatchPlan.h"

#include "apps/moka/Failure.h"
#include "apps/moka/StandardStreams.h"

#include <filesystem>
#include <unordered_map>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

std::string NameOutput(std::string const& input, std::string const& format, fs::path const& folder) {
    return (folder / fs::path(input).stem()).string() + "." + format;
}

} // namespace

std::vector<BatchFile> PlanBatch(std::vector<std::string> const& inputs, std::string const& format,
                                 std::string const& folder) {
    std::vector<BatchFile> files;
    std::unordered_map<std::string, std::string> inputOf;
    for (std::string const& input : inputs) {
        if (IsStandardStream(input))
            throw Failure(ExitStatus::Usage, "standard input (-) has no name for a file in " + folder +
                                                 "; convert it alone, into an OUTPUT");
        std::string const output = NameOutput(input, format, folder);
        auto const [other, isNew] = inputOf.emplace(output, input);
        if (!isNew)
            throw Failure(ExitStatus::Usage, other->second + " and " + input + " would both become " +
                                                 output + "; rename one, or convert them into two folders");
        files.push_back({input, output});
    }
    return files;
}

} // namespace Moka::Tool
