// Every file operation of loading and saving fails in turn: the disk is full, broken or forbidden.
#include "moka/base/log/AndroidLog.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstddef>
#include <cstring>
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>
#include <vector>

namespace Moka::Testing {
namespace {

enum class Mode {
    Fail,     // the k-th call fails with the error
    FailAll,  // all from the k-th on do
    Short,    // every read or write does at most 7 bytes, and is interrupted every third time
    Truncate, // all reads from the k-th on find the end of the file
};
constexpr std::size_t kMost = 7;

// Makes file operations of the process fail or fall short, in the libraries under test too. Thread: one.
struct {
    bool isArmed = false;
    Mode mode = Mode::Fail;
    int first = 0;
    int error = 0;
    int count = 0;
    std::string calls; // "open write fsync close "
} sweep;

bool Is(Mode mode) { return sweep.isArmed && sweep.mode == mode; }

bool Fails(char const* call) {
    if (!sweep.isArmed) return false;
    int const ordinal = ++sweep.count;
    sweep.calls.append(call).append(" ");
    bool const fails =
        (Is(Mode::Fail) && ordinal == sweep.first) || (Is(Mode::FailAll) && ordinal >= sweep.first);
    if (fails) errno = sweep.error;
    return fails;
}

bool IsInterrupted() {
    if (!Is(Mode::Short) || sweep.count % 3 != 0) return false;
    errno = EINTR;
    return true;
}

std::size_t Cut(std::size_t count) { return Is(Mode::Short) ? std::min(count, kMost) : count; }
bool IsAtEnd() { return Is(Mode::Truncate) && sweep.count >= sweep.first; }

} // namespace

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

namespace {

constexpr int kErrors[] = {ENOSPC, EACCES, EIO};

class FileFault : public ::testing::TestWithParam<char const*> {
protected:
    bool Save(Picture const& image) const { return SaveImage(image, mPath, 90); }
    Picture Load() const { return LoadImage(mPath); }
    std::string ReadFile() const { return Testing::ReadFile(mPath); }
    // The picture, and no temporary file beside it.
    bool IsAlone() const { return mFolder.List().size() == 1; }
    template <class Action>
    static int Disturb(Mode mode, int k, int error, Action const& action) {
        sweep = {true, mode, k, error, 0, {}};
        action();
        sweep.isArmed = false;
        return sweep.count;
    }

    // Large enough for several blocks of any codec.
    Picture const mOld = MakeChecker(90, 70, 5, {255, 0, 0, 255}, {0, 0, 255, 255});
    Picture const mNew = MakeGradient(300, 200);
    LogCapture mLog;

private:
    TempFolder const mFolder;
    std::string const mPath = mFolder.Path(std::string("picture.") + GetParam());
};

TEST_P(FileFault, ASaveShowsTheOldFileOrTheWholeNewOne) {
    ASSERT_TRUE(Save(mNew));
    std::string const newBytes = ReadFile();
    ASSERT_TRUE(Save(mOld));
    std::string const oldBytes = ReadFile();
    int const count = Disturb(Mode::Fail, 0, 0, [&] { ASSERT_TRUE(Save(mNew)); });
    ASSERT_GE(count, 5); // made, written, flushed, closed, renamed
    // The file is on the disk before it takes the name, and the folder after.
    EXPECT_THAT(sweep.calls, ::testing::EndsWith(" fsync close rename open fsync close "));
    int failures = 0;
    for (Mode const mode : {Mode::Fail, Mode::FailAll})
        for (int const error : kErrors)
            for (int k = 1; k <= count; ++k) {
                SCOPED_TRACE(std::to_string(k) + " of " + std::to_string(count) + " error " +
                             std::to_string(error));
                ASSERT_TRUE(Save(mOld));
                mLog.Clear();
                bool isSaved = false;
                Disturb(mode, k, error, [&] { isSaved = Save(mNew); });
                EXPECT_EQ(ReadFile() == newBytes, isSaved);
                EXPECT_EQ(ReadFile() == oldBytes, !isSaved);
                EXPECT_EQ(mLog.Count(ANDROID_LOG_ERROR), isSaved ? 0 : 1);
                EXPECT_EQ(mLog.Count(ANDROID_LOG_ERROR, std::strerror(error)), isSaved ? 0 : 1);
                EXPECT_TRUE(IsAlone());
                if (!isSaved) ++failures;
            }
    RecordProperty("faults", failures);
    EXPECT_GE(failures, 5 * 6);
}

TEST_P(FileFault, ALoadGivesTheWholePictureOrNothing) {
    ASSERT_TRUE(Save(mNew));
    Picture const pixels = Load();
    ASSERT_FALSE(pixels.pixels.empty());
    int const count = Disturb(Mode::Fail, 0, 0, [&] { Load(); });
    int failures = 0;
    for (Mode const mode : {Mode::Fail, Mode::FailAll, Mode::Truncate})
        for (int k = 1; k <= count; ++k) {
            SCOPED_TRACE(std::to_string(k) + " of " + std::to_string(count));
            mLog.Clear();
            Picture loaded;
            Disturb(mode, k, EIO, [&] { loaded = Load(); });
            EXPECT_TRUE(loaded.pixels.empty() || loaded == pixels);
            EXPECT_EQ(mLog.Count(ANDROID_LOG_ERROR), loaded.pixels.empty() ? 1 : 0);
            if (loaded.pixels.empty()) ++failures;
        }
    RecordProperty("faults", failures);
    EXPECT_GE(failures, 4);
    EXPECT_EQ(Load(), pixels);
}

TEST_P(FileFault, ShortAndInterruptedReadsAndWritesChangeNothing) {
    ASSERT_TRUE(Save(mNew));
    std::string const bytes = ReadFile();
    Picture const pixels = Load();
    ASSERT_TRUE(Save(mOld));
    bool isSaved = false;
    Disturb(Mode::Short, 0, 0, [&] { isSaved = Save(mNew); });
    EXPECT_TRUE(isSaved);
    EXPECT_EQ(ReadFile(), bytes);
    Picture loaded;
    Disturb(Mode::Short, 0, 0, [&] { loaded = Load(); });
    EXPECT_EQ(loaded, pixels);
}

INSTANTIATE_TEST_SUITE_P(Of, FileFault, ::testing::Values("png", "jpg", "webp", "mki"),
                         [](auto const& format) { return std::string(format.param); });

} // namespace
} // namespace Moka::Testing
