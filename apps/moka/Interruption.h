// Interruption: SIGINT, SIGTERM and SIGHUP end the process at any moment without leaving an unfinished file.
// All threads block the signals. One thread, the watcher, waits for them and then prevents the process from
// opening more files. Outside of all Saving scopes the process ends at once. Inside a scope there are two
// cases. If the saving code has a temporary file (".name.xxxxxx.tmp") open, the watcher finds it among the
// open files of the process, removes it and ends the process. If the saving code has just closed the file to
// rename it, or was about to create it, which now fails, the watcher looks again until it finds a file or the
// last scope has ended. Without /proc it waits for the scopes to end, with complete files.
// Owner:   one per process, created before all other threads, so that they inherit the blocked signals.
//          Signals that the process was started to ignore stay ignored.
// Saving:  scopes may overlap, but only one thread writes files, one after the other.
#pragma once

#include <csignal>
#include <dirent.h>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

namespace Moka::Tool {

class Interruption {
public:
    Interruption();
    ~Interruption();
    Interruption(Interruption const&) = delete;
    Interruption& operator=(Interruption const&) = delete;

    // A scope from before the temporary file is created until it is renamed or removed. Any thread.
    class Saving {
    public:
        explicit Saving(Interruption& interruption) : mInterruption(interruption) { mInterruption.Enter(); }
        ~Saving() { mInterruption.Leave(); }
        Saving(Saving const&) = delete;
        Saving& operator=(Saving const&) = delete;

    private:
        Interruption& mInterruption;
    };

    // Sets a function whose text is printed to stderr when a signal ends the process. It may be called on any
    // thread. An empty function prints nothing.
    void SetLastWords(std::function<std::string()> lastWords);

private:
    void Enter();
    void Leave();
    void Watch();
    bool RemoveOpenTemporary() const;
    [[noreturn]] void End() const;

    sigset_t mSignals{};
    sigset_t mPreviousMask{};
    DIR* const mOpenFiles; // /proc/self/fd, opened in advance; null without /proc
    std::mutex mMutex;     // held while the process ends, so that nothing is printed or saved meanwhile
    int mSavings = 0;
    int mSignal = 0; // the signal that ends the process
    bool mDone = false;
    std::function<std::string()> mLastWords;
    std::thread mThread;
};

} // namespace Moka::Tool
