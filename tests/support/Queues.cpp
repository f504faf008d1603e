#include "tests/support/Queues.h"

#include <utility>

namespace Moka::Testing {
namespace {

// The queue that is running a task on this thread.
thread_local HandPumpedQueue const* tRunning = nullptr;

} // namespace

bool HandPumpedQueue::Post(ITask* task) {
    std::lock_guard<std::mutex> lock(mMutex);
    if (!task) return true;
    if (mRefuses && mRefuses()) return false;
    mTasks.emplace_back(task);
    ++mPosted;
    return true;
}

void HandPumpedQueue::WaitForTasks() {
    if (tRunning == this) return;
    {
        std::lock_guard<std::mutex> lock(mMutex);
        ++mWaits;
    }
    RunAll();
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
    struct Scope {
        explicit Scope(HandPumpedQueue& q) : queue(q), outer(std::exchange(tRunning, &q)) {
            queue.BeforeRun();
        }
        ~Scope() {
            queue.AfterRun();
            tRunning = outer;
        }
        HandPumpedQueue& queue;
        HandPumpedQueue const* const outer;
    } const scope(*this);
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
