// Progress: one line on the terminal that tells what is being done and for how long, for work that takes more
// than a second; or, for many files, how many are done, how fast, and how long the rest will take. It is gone
// when the work is done. Writes nothing where stderr is no terminal. Verbose instead, it tells on a line of its
// own what has happened, and how long each stage took.
// Thread:  made, told and destroyed by one thread; a thread of its own draws.
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

    // A literal. The stage before it has ended.
    void SetStage(char const* stage);

    // When verbose, "moka: what" on stderr.
    void Tell(std::string const& what) const;

    // From now on the line counts files instead.
    void SetCount(int done, int total) {
        mDoneCount = done;
        mTotalCount = total;
    }

    // Any thread.
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
