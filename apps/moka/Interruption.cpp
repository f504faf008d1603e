#include "apps/moka/Interruption.h"

#include "apps/moka/Progress.h"

#include <chrono>
#include <fcntl.h>
#include <filesystem>
#include <string>
#include <string_view>
#include <unistd.h>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

// Also wakes the watcher for its end.
constexpr int kWakeUp = SIGUSR1;
constexpr auto kNextLook = std::chrono::milliseconds(2);

bool IsTemporary(std::string const& file, int descriptor) {
    constexpr std::string_view kSuffix = ".tmp";
    std::string const name = file.substr(file.rfind('/') + 1);
    bool const isNamedSo = name.size() > kSuffix.size() && name.front() == '.' &&
                           name.compare(name.size() - kSuffix.size(), kSuffix.size(), kSuffix) == 0;
    return isNamedSo && (fcntl(descriptor, F_GETFL) & O_ACCMODE) == O_WRONLY;
}

// Whether there was one. When it has been renamed in this moment, there is nothing to remove and the file is
// whole.
bool RemoveOpenTemporary() {
    std::error_code error;
    for (fs::directory_iterator entry("/proc/self/fd", error), end; !error && entry != end;
         entry.increment(error)) {
        std::error_code unreadable;
        std::string const file = fs::read_symlink(entry->path(), unreadable).string();
        if (unreadable || !IsTemporary(file, std::stoi(entry->path().filename().string()))) continue;
        unlink(file.c_str());
        return true;
    }
    return false;
}

} // namespace

void Interruption::Saving::Set(bool isSaving) {
    std::lock_guard const lock(mInterruption.mMutex);
    mInterruption.mIsSaving = isSaving;
}

Interruption::Interruption() {
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
}

void Interruption::Watch() {
    int signal = 0;
    sigwait(&mSignals, &signal);
    std::unique_lock lock(mMutex);
    while (!mDone) {
        if (!mIsSaving || RemoveOpenTemporary()) End(signal);
        lock.unlock();
        std::this_thread::sleep_for(kNextLook);
        lock.lock();
    }
}

// By the signal itself, so that a shell sees what happened.
void Interruption::End(int signal) {
    Progress::EraseLine();
    std::signal(signal, SIG_DFL);
    sigset_t only;
    sigemptyset(&only);
    sigaddset(&only, signal);
    pthread_sigmask(SIG_UNBLOCK, &only, nullptr);
    raise(signal);
    _exit(128 + signal);
}

} // namespace Moka::Tool
