#include "apps/moka/Arguments.h"

#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <filesystem>
#include <unistd.h>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

constexpr int kJpegQuality = 90;
constexpr int kLosslessQuality = 100;

ImageFormat GetFormat(std::string const& output) {
    String const name(output);
    return BitmapFactory::GetFormatByExtension(&name);
}

} // namespace

std::string CheckPath(std::string const& path) {
    if (path.empty()) return "the name of the file is empty";
    std::string const understood = String(path).ToUtf8();
    return understood == path ? std::string() : understood + ": the name is not valid UTF-8; rename the file";
}

void CheckFolder(std::string const& subject, std::string const& folder, ExitStatus missing) {
    std::error_code error;
    if (!fs::is_directory(folder, error))
        throw Failure(missing, subject + ": there is no folder " + folder + "; create it first");
    if (access(folder.c_str(), W_OK | X_OK) != 0)
        throw Failure(subject + ": no permission to write in the folder " + folder);
}

void CheckOutput(std::string const& output) {
    if (GetFormat(output) == ImageFormat::Unknown)
        throw Failure(ExitStatus::Usage,
                      output + ": its extension names no format; use .png, .jpg, .jpeg, .webp or .mki");
    std::error_code error;
    fs::path const path(output);
    if (fs::is_directory(path, error)) throw Failure(output + " is a folder; name a file to write");
    // Where a link leads is found out when saving.
    if (fs::is_symlink(path, error)) return;
    CheckFolder(output, path.has_parent_path() ? path.parent_path().string() : ".", ExitStatus::Failed);
}

int GetUsualQuality(std::string const& output) {
    return GetFormat(output) == ImageFormat::Jpeg ? kJpegQuality : kLosslessQuality;
}

} // namespace Moka::Tool
