#include "tests/trust/FileFaults.h"

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstddef>
#include <fcntl.h>
#include <string>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

constexpr std::size_t kMost = 7;

struct {
    bool isArmed = false;
    FileFaults::Mode mode = FileFaults::Mode::Fail;
    int first = 0;
    int error = 0;
    int count = 0;
    std::string calls;
} sweep;

bool Fails(char const* call) {
    if (!sweep.isArmed) return false;
    int const ordinal = ++sweep.count;
    sweep.calls.append(call).append(" ");
    bool const fails = (sweep.mode == FileFaults::Mode::Fail && ordinal == sweep.first) ||
                       (sweep.mode == FileFaults::Mode::FailAll && ordinal >= sweep.first);
    if (fails) errno = sweep.error;
    return fails;
}

bool IsInterrupted() {
    if (!sweep.isArmed || sweep.mode != FileFaults::Mode::Short || sweep.count % 3 != 0) return false;
    errno = EINTR;
    return true;
}

std::size_t Cut(std::size_t count) {
    return sweep.isArmed && sweep.mode == FileFaults::Mode::Short ? std::min(count, kMost) : count;
}

bool IsAtEnd() {
    return sweep.isArmed && sweep.mode == FileFaults::Mode::Truncate && sweep.count >= sweep.first;
}

} // namespace

void FileFaults::Arm(Mode mode, int k, int error) { sweep = {true, mode, k, error, 0, {}}; }

int FileFaults::Disarm() {
    sweep.isArmed = false;
    return sweep.count;
}

std::string const& FileFaults::GetCalls() { return sweep.calls; }

} // namespace Moka::Testing

using Moka::Testing::Cut;
using Moka::Testing::Fails;
using Moka::Testing::IsAtEnd;
using Moka::Testing::IsInterrupted;

// The C library's, for the whole process: its own names, seen by every library.
#define MOKA_INTERPOSED extern "C" __attribute__((visibility("default")))

MOKA_INTERPOSED int open(char const* path, int flags, ...) {
    va_list arguments;
    va_start(arguments, flags);
    // NOLINTNEXTLINE(clang-analyzer-valist.Uninitialized): va_start did that
    unsigned const mode = (flags & O_CREAT) != 0 ? va_arg(arguments, unsigned) : 0;
    va_end(arguments);
    if (Fails("open")) return -1;
    return static_cast<int>(syscall(SYS_openat, AT_FDCWD, path, flags, mode));
}

MOKA_INTERPOSED ssize_t write(int file, void const* data, std::size_t count) {
    if (Fails("write") || IsInterrupted()) return -1;
    return syscall(SYS_write, file, data, Cut(count));
}

MOKA_INTERPOSED ssize_t pread(int file, void* data, std::size_t count, off_t offset) {
    if (Fails("pread") || IsInterrupted()) return -1;
    return IsAtEnd() ? 0 : syscall(SYS_pread64, file, data, Cut(count), offset);
}

MOKA_INTERPOSED int fsync(int file) {
    return Fails("fsync") ? -1 : static_cast<int>(syscall(SYS_fsync, file));
}

// A descriptor is gone whatever close says.
MOKA_INTERPOSED int close(int file) {
    bool const fails = Fails("close");
    int const error = errno;
    int const closed = static_cast<int>(syscall(SYS_close, file));
    if (fails) errno = error;
    return fails ? -1 : closed;
}

MOKA_INTERPOSED int rename(char const* from, char const* to) noexcept {
    return Fails("rename") ? -1 : static_cast<int>(syscall(SYS_renameat2, AT_FDCWD, from, AT_FDCWD, to, 0));
}

MOKA_INTERPOSED int fchmod(int file, mode_t mode) noexcept {
    return Fails("fchmod") ? -1 : static_cast<int>(syscall(SYS_fchmod, file, mode));
}

MOKA_INTERPOSED off_t lseek(int file, off_t offset, int whence) noexcept {
    return Fails("lseek") ? -1 : syscall(SYS_lseek, file, offset, whence);
}
