// QueueThread: a TaskQueue with a thread that runs it, and tasks for the tests of it.
#pragma once

#include "moka/graphics/task/ITask.h"
#include "moka/host/TaskQueue.h"

#include <atomic>
#include <functional>
#include <future>
#include <new>
#include <thread>
#include <utility>

namespace Moka::Testing {

// A queue whose thread starts and stops when the test says so.
class QueueThread final : public TaskQueue {
public:
    ~QueueThread() override { Stop(); }

    void Start() {
        mThread = std::thread([this] { Run({}); });
    }
    void Stop() {
        RequestStop();
        if (mThread.joinable()) mThread.join();
    }

    using TaskQueue::RequestStop;
    using TaskQueue::Run;

private:
    std::thread mThread;
};

// Calls a function when run; counts the tasks that are alive.
class FunctionTask final : public ITask {
public:
    explicit FunctionTask(std::function<void()> function) : mFunction(std::move(function)) { ++sAlive; }
    ~FunctionTask() override { --sAlive; }
    void run() override { mFunction(); }

    static int CountAlive() { return sAlive; }

private:
    std::function<void()> mFunction;
    inline static std::atomic<int> sAlive{0};
};

inline FunctionTask* MakeTask(std::function<void()> function) {
    return new (std::nothrow) FunctionTask(std::move(function));
}

// Holds the consumer inside a task until opened, so that a test decides what is queued behind it.
class Gate {
public:
    explicit Gate(TaskQueue& queue) {
        queue.Post(MakeTask([this] {
            mEntered.set_value();
            mOpened.get_future().wait();
        }));
    }
    void AwaitEntered() { mEntered.get_future().wait(); }
    void Open() { mOpened.set_value(); }

private:
    std::promise<void> mEntered;
    std::promise<void> mOpened;
};

} // namespace Moka::Testing
