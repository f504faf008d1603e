// Interruption: lets SIGINT, SIGTERM and SIGHUP end the process at any moment without leaving an unfinished
// file. The signals are blocked everywhere and waited for by one thread. Outside a Saving scope there is
// nothing to remove and the process dies at once. Inside one, the saving code has a temporary file
// (".name.xxxxxx.tmp") open, or is about to, or has just given it its real name: the watcher finds it among
// the process's open files, removes it and dies; it looks again until there is one or the scope ends, so no
// moment in between is missed. Without /proc the scope ends first, with a whole file.
// Owner:   one per process, made before any other thread, so that all inherit the blocked signals. Signals
//          that the process was started with ignoring stay ignored.
#pragma once

#include <csignal>
#include <mutex>
#include <thread>

namespace Moka::Tool {

class Interruption {
public:
    Interruption();
    ~Interruption();
    Interruption(Interruption const&) = delete;
    Interruption& operator=(Interruption const&) = delete;

    class Saving {
    public:
        explicit Saving(Interruption& interruption) : mInterruption(interruption) { Set(true); }
        ~Saving() { Set(false); }
        Saving(Saving const&) = delete;
        Saving& operator=(Saving const&) = delete;

    private:
        void Set(bool isSaving);
        Interruption& mInterruption;
    };

private:
    void Watch();
    [[noreturn]] void End(int signal);

    sigset_t mSignals{};
    sigset_t mPreviousMask{};
    std::mutex mMutex; // held by the watcher while it ends the process, so that nothing is saved meanwhile
    bool mIsSaving = false;
    bool mDone = false;
    std::thread mThread;
};

} // namespace Moka::Tool
