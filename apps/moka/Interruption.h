// Interruption: lets SIGINT, SIGTERM and SIGHUP end the process at any moment without leaving an unfinished
// file. The signals are blocked everywhere and waited for by one thread, which then keeps the process from
// opening any more files. Outside every Saving scope there is nothing to remove and the process dies at once.
// Inside one, the saving code has a temporary file (".name.xxxxxx.tmp") open: the watcher finds it among the
// process's open files, removes it and dies. Or it has just closed it, to give it its real name, or was about
// to make it, which now fails: the watcher looks again until there is one or the last scope has ended. So no
// moment is missed, and no later save leaves anything. Without /proc the scopes end first, with whole files.
// Owner:   one per process, made before any other thread, so that all inherit the blocked signals. Signals
//          that the process was started with ignoring stay ignored.
// Saving:  scopes may overlap, while one thread makes the files, one after the other.
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

    // From before the temporary file is made until the file has its real name, or there is none. Any thread.
    class Saving {
    public:
        explicit Saving(Interruption& interruption) : mInterruption(interruption) { mInterruption.Enter(); }
        ~Saving() { mInterruption.Leave(); }
        Saving(Saving const&) = delete;
        Saving& operator=(Saving const&) = delete;

    private:
        Interruption& mInterruption;
    };

    // What is told on stderr when a signal ends the process; an empty function tells nothing. It is called on
    // any thread.
    void SetLastWords(std::function<std::string()> lastWords);

private:
    void Enter();
    void Leave();
    void Watch();
    bool RemoveOpenTemporary() const;
    [[noreturn]] void End() const;

    sigset_t mSignals{};
    sigset_t mPreviousMask{};
    DIR* const mOpenFiles; // opened in time; null without /proc
    std::mutex mMutex;     // held while the process is ended, so that nothing is told or saved meanwhile
    int mSavings = 0;
    int mSignal = 0; // that ends the process
    bool mDone = false;
    std::function<std::string()> mLastWords;
    std::thread mThread;
};

} // namespace Moka::Tool
