#include "tests/support/Queues.h"

#include <utility>

namespace Moka::Testing {
namespace {

// The queue that is running a task on this thread.
thread_local HandPumpedQueue const* tRunning = nullptr;

class RunningScope {
public:
    RunningScope(HandPumpedQueue const* queue, std::function<void()> const& before,
                 std::function<void()> const& after)
        : mOuter(std::exchange(tRunning, queue)), mAfter(after) {
        if (before) before();
    }
    ~RunningScope() {
        if (mAfter) mAfter();
        tRunning = mOuter;
    }
    RunningScope(RunningScope const&) = delete;
    RunningScope& operator=(RunningScope const&) = delete;

private:
    HandPumpedQueue const* mOuter;
    std::function<void()> const& mAfter;
};

} // namespace

HandPumpedQueue::~HandPumpedQueue() = default;

bool HandPumpedQueue::Post(ITask* task) {
    std::lock_guard<std::mutex> lock(mMutex);
    if (!task) return true;
    bool const isRefused = mRefuses(++mOffered, task);
    mRefused += isRefused ? 1 : 0;
    if (!isRefused) mTasks.emplace_back(task);
    return !isRefused;
}

void HandPumpedQueue::WaitForTasks() {
    if (tRunning == this) return;
    {
        std::lock_guard<std::mutex> lock(mMutex);
        ++mWaits;
    }
    RunAll();
}

void HandPumpedQueue::SetAroundRun(std::function<void()> before, std::function<void()> after) {
    mBeforeRun = std::move(before);
    mAfterRun = std::move(after);
}

std::unique_ptr<ITask> HandPumpedQueue::TakeFirst() {
    std::lock_guard<std::mutex> lock(mMutex);
    if (mTasks.empty()) return nullptr;
    std::unique_ptr<ITask> task = std::move(mTasks.front());
    mTasks.pop_front();
    ++mRun;
    return task;
}

bool HandPumpedQueue::RunOne() {
    std::unique_ptr<ITask> task = TakeFirst();
    if (!task) return false;
    RunningScope scope(this, mBeforeRun, mAfterRun);
    // Freed inside the scope: what the task owns dies on the render thread too.
    std::unique_ptr<ITask> const running = std::move(task);
    running->run();
    return true;
}

int HandPumpedQueue::RunAll() {
    int count = 0;
    while (RunOne()) ++count;
    return count;
}

} // namespace Moka::Testing
