// Progress: one line on the terminal that tells what is being done and for how long, for work that takes more
// than a second; or, for many files, how many are done, how fast, and how long the rest will take. It is gone
// when the work is done. Writes nothing where stderr is no terminal.
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
    explicit Progress(bool enabled);
    ~Progress();
    Progress(Progress const&) = delete;
    Progress& operator=(Progress const&) = delete;

    // A literal.
    void SetStage(char const* stage) { mStage = stage; }

    // From now on the line counts files instead.
    void SetCount(int done, int total) {
        mDoneCount = done;
        mTotalCount = total;
    }

    // Any thread.
    static void EraseLine();

private:
    void Draw();
    std::string Describe() const;

    std::atomic<char const*> mStage{"start"};
    std::atomic<int> mDoneCount{0};
    std::atomic<int> mTotalCount{0};
    std::chrono::steady_clock::time_point const mStart = std::chrono::steady_clock::now();
    std::mutex mMutex;
    std::condition_variable mChanged;
    bool mDone = false;
    std::thread mThread;
};

} // namespace Moka::Tool
