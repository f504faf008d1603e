#include "apps/moka/StandardStreams.h"

#include "apps/moka/Failure.h"
#include "apps/moka/Text.h"
#include "moka/base/BitmapFactory.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <random>
#include <sys/mman.h>
#include <unistd.h>
#include <vector>

namespace Moka::Tool {
namespace {

constexpr std::size_t kBlockBytes = 65536;

// Encoded images are rarely larger than decoded ones.
constexpr std::uint64_t kMaxInputBytes = BitmapFactory::kMaxBytes + (std::uint64_t{64} << 20);

std::string PathOf(int file) { return "/proc/self/fd/" + std::to_string(file); }

bool WriteAll(int file, char const* data, std::size_t count) {
    while (count > 0) {
        ssize_t const written = write(file, data, count);
        if (written < 0 && errno == EINTR) continue;
        if (written < 0) return false;
        data += written;
        count -= static_cast<std::size_t>(written);
    }
    return true;
}

// Returns a random name, so that nobody can create a link of this name in advance, whose target would be
// overwritten.
std::string MakeSecret() {
    std::random_device random;
    std::string secret;
    for (int i = 0; i < 4; ++i) secret += std::to_string(random());
    return secret;
}

// Copies until the end of the input. On failure returns false and sets errno.
bool CopyAll(int from, int to, std::uint64_t limit) {
    std::vector<char> block(kBlockBytes);
    for (std::uint64_t total = 0;;) {
        ssize_t const got = read(from, block.data(), block.size());
        if (got == 0) return true;
        if (got < 0 && errno == EINTR) continue;
        if (got < 0) return false;
        total += static_cast<std::uint64_t>(got);
        if (total > limit) {
            errno = EFBIG;
            return false;
        }
        if (!WriteAll(to, block.data(), static_cast<std::size_t>(got))) return false;
    }
}

} // namespace

InputFile::InputFile(std::string const& name) : mName(name), mPath(name) {
    if (!IsStandardStream(name)) return;
    mName = "standard input";
    mCopy = memfd_create("moka", MFD_CLOEXEC);
    mPath = PathOf(mCopy);
    if (mCopy >= 0 && CopyAll(STDIN_FILENO, mCopy, kMaxInputBytes)) return;
    std::string const reason = std::strerror(errno);
    if (mCopy >= 0) close(mCopy);
    throw Failure("cannot read standard input: " + reason);
}

InputFile::~InputFile() {
    if (mCopy >= 0) close(mCopy);
}

std::string InputFile::Explain(std::string const& message) const {
    if (mCopy < 0) return message;
    return ReplaceAll(ReplaceAll(message, "'" + mPath + "'", mName), mPath, mName);
}

OutputFile::OutputFile(std::string const& name, std::string const& format)
    : mIsStream(IsStandardStream(name)), mPath(name) {
    if (!mIsStream) return;
    if (isatty(STDOUT_FILENO))
        throw Failure(ExitStatus::Usage, "an image does not go to a terminal; redirect standard output");
    std::error_code error;
    std::filesystem::path const folder = std::filesystem::temp_directory_path(error);
    if (error) throw Failure("there is no folder for temporary files; name one as TMPDIR");
    mPath = (folder / ("moka-" + MakeSecret() + "." + format)).string();
}

OutputFile::~OutputFile() {
    if (mContent >= 0) close(mContent);
}

void OutputFile::Take() {
    if (!mIsStream) return;
    mContent = open(mPath.c_str(), O_RDONLY | O_CLOEXEC);
    std::string const reason = std::strerror(errno);
    unlink(mPath.c_str());
    if (mContent < 0) throw Failure("cannot read " + mPath + ": " + reason);
    mPath = PathOf(mContent);
}

void OutputFile::Send() const {
    if (!mIsStream) return;
    if (!CopyAll(mContent, STDOUT_FILENO, UINT64_MAX))
        throw Failure(std::string("cannot write to standard output: ") + std::strerror(errno));
}

} // namespace Moka::Tool
