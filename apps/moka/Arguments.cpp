#include "apps/moka/Arguments.h"

#include "moka/base/String.h"

#include <filesystem>
#include <unistd.h>

namespace Moka::Tool {

std::string CheckPath(std::string const& path) {
    if (path.empty()) return "the name of the file is empty";
    std::string const understood = String(path).ToUtf8();
    return understood == path ? std::string() : understood + ": the name is not valid UTF-8; rename the file";
}

void CheckFolder(std::string const& subject, std::string const& folder, ExitStatus missing) {
    std::error_code error;
    if (!std::filesystem::is_directory(folder, error))
        throw Failure(missing, subject + ": there is no folder " + folder + "; create it first");
    if (access(folder.c_str(), W_OK | X_OK) != 0)
        throw Failure(subject + ": no permission to write in the folder " + folder);
}

} // namespace Moka::Tool
