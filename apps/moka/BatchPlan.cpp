#include "apps/moka/BatchPlan.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"

#include <algorithm>
#include <filesystem>
#include <unordered_map>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

constexpr char const* kFormats[] = {"png", "jpg", "jpeg", "webp", "mki"};

std::string NameOutput(std::string const& input, std::string const& format, fs::path const& folder) {
    return (folder / fs::path(input).stem()).string() + "." + format;
}

} // namespace

std::string CheckFormat(std::string const& format) {
    bool const isKnown = std::find(std::begin(kFormats), std::end(kFormats), format) != std::end(kFormats);
    return isKnown ? std::string() : "'" + format + "' is no format; use png, jpg, jpeg, webp or mki";
}

std::vector<BatchFile> PlanBatch(std::vector<std::string> const& inputs, std::string const& format,
                                 std::string const& folder) {
    CheckFolder("--out", folder, ExitStatus::Usage);
    std::vector<BatchFile> files;
    std::unordered_map<std::string, std::string> inputOf;
    for (std::string const& input : inputs) {
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
