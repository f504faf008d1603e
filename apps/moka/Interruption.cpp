#include "apps/moka/Interruption.h"

#include "apps/moka/Failure.h"
#include "apps/moka/Progress.h"

#include <chrono>
#include <climits>
#include <cstdlib>
#include <fcntl.h>
#include <string_view>
#include <sys/resource.h>
#include <unistd.h>
#include <utility>

namespace Moka::Tool {
namespace {

// The signal that makes the watcher end.
constexpr int kWakeUp = SIGUSR1;
constexpr auto kNextLook = std::chrono::milliseconds(2);

bool IsTemporary(std::string_view file, int descriptor) {
    constexpr std::string_view kSuffix = ".tmp";
    std::string_view const name = file.substr(file.rfind('/') + 1);
    bool const isNamedSo = name.size() > kSuffix.size() && name.front() == '.' &&
                           name.substr(name.size() - kSuffix.size()) == kSuffix;
    return isNamedSo && (fcntl(descriptor, F_GETFL) & O_ACCMODE) == O_WRONLY;
}

// Makes all later opens fail. Open files stay open.
void ForbidOpening() {
    rlimit files{};
    getrlimit(RLIMIT_NOFILE, &files);
    files.rlim_cur = 0;
    setrlimit(RLIMIT_NOFILE, &files);
}

} // namespace

Interruption::Interruption() : mOpenFiles(opendir("/proc/self/fd")) {
    sigemptyset(&mSignals);
    for (int const signal : {SIGINT, SIGTERM, SIGHUP, kWakeUp}) {
        struct sigaction current = {};
        sigaction(signal, nullptr, &current);
        if (current.sa_handler != SIG_IGN || signal == kWakeUp) sigaddset(&mSignals, signal);
    }
    pthread_sigmask(SIG_BLOCK, &mSignals, &mPreviousMask);
    mThread = std::thread([this] { Watch(); });
}

Interruption::~Interruption() {
    {
        std::lock_guard const lock(mMutex);
        mDone = true;
    }
    pthread_kill(mThread.native_handle(), kWakeUp);
    mThread.join();
    pthread_sigmask(SIG_SETMASK, &mPreviousMask, nullptr);
    if (mOpenFiles) closedir(mOpenFiles);
}

void Interruption::SetLastWords(std::function<std::string()> lastWords) {
    std::lock_guard const lock(mMutex);
    mLastWords = std::move(lastWords);
}

void Interruption::Enter() {
    std::lock_guard const lock(mMutex);
    ++mSavings;
}

void Interruption::Leave() {
    std::lock_guard const lock(mMutex);
    // Ends the process before the saving code reports a failure that ForbidOpening has caused.
    if (--mSavings == 0 && mSignal) End();
}

void Interruption::Watch() {
    int signal = 0;
    sigwait(&mSignals, &signal);
    std::unique_lock lock(mMutex);
    if (mDone) return;
    mSignal = signal;
    ForbidOpening();
    for (;;) {
        if (mSavings == 0 || RemoveOpenTemporary()) End();
        lock.unlock();
        std::this_thread::sleep_for(kNextLook);
        lock.lock();
    }
}

// Removes the temporary file if one is open, and returns true. If it was renamed in this moment, there is
// nothing to remove, and the file is complete.
bool Interruption::RemoveOpenTemporary() const {
    if (!mOpenFiles) return false;
    rewinddir(mOpenFiles);
    while (dirent const* const entry = readdir(mOpenFiles)) {
        char file[PATH_MAX];
        ssize_t const length = readlinkat(dirfd(mOpenFiles), entry->d_name, file, sizeof(file) - 1);
        if (length < 0) continue; // "." and ".."
        file[length] = '\0';
        if (!IsTemporary(file, std::atoi(entry->d_name))) continue;
        unlink(file);
        return true;
    }
    return false;
}

// Ends the process by the signal, so that a shell sees the reason.
void Interruption::End() const {
    Progress::EraseLine();
    if (mLastWords) PrintError(mLastWords());
    std::signal(mSignal, SIG_DFL);
    sigset_t only;
    sigemptyset(&only);
    sigaddset(&only, mSignal);
    pthread_sigmask(SIG_UNBLOCK, &only, nullptr);
    raise(mSignal);
    _exit(128 + mSignal);
}

} // namespace Moka::Tool
