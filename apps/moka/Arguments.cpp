#include "apps/moka/Arguments.h"

#include "apps/moka/StandardStreams.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <unistd.h>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

constexpr char const* kFormats[] = {"png", "jpg", "jpeg", "webp", "mki"};
constexpr int kJpegQuality = 90;
constexpr int kLosslessQuality = 100;

void CheckWritable(std::string const& subject, std::string const& folder) {
    if (access(folder.c_str(), W_OK | X_OK) != 0)
        throw Failure(subject + ": no permission to write in the folder " + folder);
}

ImageFormat GetFormat(std::string const& output) {
    String const name(output);
    return BitmapFactory::GetFormatByExtension(&name);
}

} // namespace

std::string CheckPath(std::string const& path) {
    if (path.empty()) return "the name of the file is empty";
    return {};
}

std::string CheckFormat(std::string const& format) {
    bool const isKnown = std::find(std::begin(kFormats), std::end(kFormats), format) != std::end(kFormats);
    return isKnown ? std::string() : "'" + format + "' is not a format; use png, jpg, jpeg, webp or mki";
}

void MakeFolder(std::string const& folder) {
    std::error_code error;
    fs::create_directories(folder, error);
    if (!error && !fs::is_directory(folder)) error = std::make_error_code(std::errc::not_a_directory);
    if (error) throw Failure("cannot create the folder " + folder + ": " + error.message());
    CheckWritable(folder, folder);
}

void CheckOutput(std::string const& output) {
    if (IsStandardStream(output)) return;
    if (GetFormat(output) == ImageFormat::Unknown)
        throw Failure(ExitStatus::Usage,
                      output + ": its extension names no format; use .png, .jpg, .jpeg, .webp or .mki");
    std::error_code error;
    fs::path const path(output);
    if (fs::is_directory(path, error)) throw Failure(output + " is a folder; name a file to write");
    // The target of a link is checked when the file is saved.
    if (fs::is_symlink(path, error)) return;
    std::string const folder = path.has_parent_path() ? path.parent_path().string() : ".";
    if (!fs::is_directory(folder, error))
        throw Failure(output + ": there is no folder " + folder + "; create it first");
    CheckWritable(output, folder);
}

int GetUsualQuality(std::string const& output) {
    return GetFormat(output) == ImageFormat::Jpeg ? kJpegQuality : kLosslessQuality;
}

} // namespace Moka::Tool
