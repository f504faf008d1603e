#include "moka/base/codec/AtomicFile.h"

#include <cerrno>
#include <climits>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <random>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace Moka::detail {
namespace {

constexpr std::size_t kBufferBytes = 65536;
constexpr int kMaxLinks = 40;
constexpr int kMaxNameAttempts = 100;
// The part of the target's name in the temporary name, because file systems limit the length of names.
constexpr std::size_t kMaxNameBytes = 100;

std::string FolderOf(std::string const& path) {
    std::size_t const slash = path.rfind('/');
    return slash == std::string::npos ? std::string() : path.substr(0, slash + 1);
}

std::string RandomLetters() {
    static constexpr char kLetters[] = "abcdefghijklmnopqrstuvwxyz0123456789";
    std::random_device random;
    std::string letters;
    for (int i = 0; i < 6; ++i) letters += kLetters[random() % (sizeof(kLetters) - 1)];
    return letters;
}

// A rename survives a power failure only if the folder is flushed as well. Not every file system supports
// this. A failure is ignored, because the file itself is complete in any case.
void FlushFolder(std::string const& folder) {
    int const file = open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (file < 0) return;
    fsync(file);
    close(file);
}

} // namespace

AtomicFile::~AtomicFile() {
    if (mFile >= 0) close(mFile);
    if (!mTemporary.empty()) unlink(mTemporary.c_str());
}

bool AtomicFile::Open(std::string const& path) {
    bool replaces = false;
    unsigned mode = 0;
    if (!FollowLinks(path) || !CheckTarget(replaces, mode)) return false;
    mBuffer.reset(new (std::nothrow) unsigned char[kBufferBytes]);
    if (!mBuffer) return Fail("cannot buffer", ENOMEM);
    if (!CreateTemporary()) return false;
    if (replaces && fchmod(mFile, mode) != 0) return Fail("cannot keep its permissions", errno);
    return true;
}

// Resolves links without realpath, which fails if a link points to a file that does not exist yet.
bool AtomicFile::FollowLinks(std::string const& path) {
    mTarget = path;
    for (int i = 0; i < kMaxLinks; ++i) {
        char link[PATH_MAX];
        ssize_t const length = readlink(mTarget.c_str(), link, sizeof(link));
        if (length < 0) return true; // not a link
        std::string const next(link, static_cast<std::size_t>(length));
        mTarget = next[0] == '/' ? next : FolderOf(mTarget) + next;
    }
    return Fail("cannot follow it", ELOOP);
}

bool AtomicFile::CheckTarget(bool& replaces, unsigned& mode) {
    struct stat status = {};
    if (stat(mTarget.c_str(), &status) != 0) {
        // ENOENT is no failure here: creating the temporary file reports a missing folder.
        return errno == ENOENT || Fail("cannot write there", errno);
    }
    if (S_ISDIR(status.st_mode)) return Fail("it is a folder", 0);
    if (!S_ISREG(status.st_mode)) return Fail("it is not a regular file", 0);
    if (access(mTarget.c_str(), W_OK) != 0) return Fail("cannot replace it", errno);
    replaces = true;
    mode = status.st_mode & 0777;
    return true;
}

bool AtomicFile::CreateTemporary() {
    std::string const folder = FolderOf(mTarget);
    std::string const name = mTarget.substr(folder.size(), kMaxNameBytes);
    for (int i = 0; i < kMaxNameAttempts; ++i) {
        std::string candidate = folder;
        candidate.append(".").append(name).append(".").append(RandomLetters()).append(".tmp");
        // Uses open instead of mkstemp, so that the process's umask and the folder's access control lists
        // apply.
        mFile = open(candidate.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
        if (mFile >= 0) {
            mTemporary = std::move(candidate); // does not throw, so that the file is always removed
            return true;
        }
        if (errno != EEXIST && errno != EINTR) break;
    }
    return Fail("cannot create a file in its folder", errno);
}

bool AtomicFile::Write(void const* data, std::size_t count) noexcept {
    if (mFailedStep) return false;
    mWritten += count;
    if (count > kBufferBytes - mBuffered) {
        if (!Flush()) return false;
        if (count >= kBufferBytes) return WriteAll(static_cast<unsigned char const*>(data), count);
    }
    std::memcpy(mBuffer.get() + mBuffered, data, count);
    mBuffered += count;
    return true;
}

bool AtomicFile::WriteStart(void const* data, std::size_t count) noexcept {
    if (mFailedStep || !Flush()) return false;
    if (lseek(mFile, 0, SEEK_SET) < 0) return Fail("cannot write", errno);
    if (!WriteAll(static_cast<unsigned char const*>(data), count)) return false;
    return lseek(mFile, 0, SEEK_END) >= 0 || Fail("cannot write", errno);
}

bool AtomicFile::Commit() {
    if (mFailedStep || !Flush()) return false;
    if (fsync(mFile) != 0) return Fail("cannot flush it to the disk", errno);
    // Some file systems report a full disk only at close. After EINTR the descriptor is closed as well.
    int const closed = close(mFile);
    int const error = errno;
    mFile = -1;
    if (closed != 0 && error != EINTR) return Fail("cannot finish it", error);
    std::string const folder =
        FolderOf(mTarget); // allocated before, because nothing may fail after the rename
    if (rename(mTemporary.c_str(), mTarget.c_str()) != 0) return Fail("cannot rename to it", errno);
    mTemporary.clear();
    FlushFolder(folder);
    return true;
}

std::string AtomicFile::GetReason() const {
    if (!mFailedStep) return {};
    std::string reason = mFailedStep;
    if (mError != 0) reason.append(": ").append(std::strerror(mError));
    return reason;
}

bool AtomicFile::Flush() noexcept {
    std::size_t const count = std::exchange(mBuffered, std::size_t{0});
    return WriteAll(mBuffer.get(), count);
}

bool AtomicFile::WriteAll(unsigned char const* data, std::size_t count) noexcept {
    while (count > 0) {
        ssize_t const written = write(mFile, data, count);
        if (written > 0) {
            data += written;
            count -= static_cast<std::size_t>(written);
        } else if (written == 0 || errno != EINTR) {
            return Fail("cannot write", written == 0 ? ENOSPC : errno);
        }
    }
    return true;
}

bool AtomicFile::Fail(char const* step, int error) noexcept {
    if (!mFailedStep) {
        mFailedStep = step;
        mError = error;
    }
    return false;
}

} // namespace Moka::detail
