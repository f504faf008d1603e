// Progress: a line on the terminal for work that takes more than a second. It shows the stage and its
// duration, or for many files the number of finished files, the rate, and the remaining time. It is erased at
// the end. If stderr is not a terminal, nothing is printed. With Verbose it prints a line for each event, and
// the duration of each stage, instead.
// Thread:  created, updated and destroyed on one thread. Another thread prints.
#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>

namespace Moka::Tool {

class Progress {
public:
    enum Kind { Silent, Line, Verbose };
    explicit Progress(Kind kind);
    ~Progress();
    Progress(Progress const&) = delete;
    Progress& operator=(Progress const&) = delete;

    // Ends the previous stage and begins a new one. stage must be a string literal.
    void SetStage(char const* stage);

    // With Verbose, prints "moka: what" to stderr.
    void Tell(std::string const& what) const;

    // Makes the line show the number of files instead of the stage.
    void SetCount(int done, int total) {
        mDoneCount = done;
        mTotalCount = total;
    }

    // Erases the line. Any thread.
    static void EraseLine();

private:
    using Clock = std::chrono::steady_clock;

    void Draw();
    void TellStage();
    std::string Describe() const;

    Kind const mKind;
    std::atomic<char const*> mStage{"start"};
    Clock::time_point mStageStart = Clock::now();
    std::atomic<int> mDoneCount{0};
    std::atomic<int> mTotalCount{0};
    Clock::time_point const mStart = Clock::now();
    std::mutex mMutex;
    std::condition_variable mChanged;
    bool mDone = false;
    std::thread mThread;
};

} // namespace Moka::Tool
