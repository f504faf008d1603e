// PlainQueue: the simplest queue: a deque of tasks with a mutex, a notification for each post, and the
// default allocator. TaskQueue is compared with it.
#pragma once

#include <condition_variable>
#include <deque>
#include <memory>
#include <mutex>
#include <tuple>
#include <utility>

namespace Moka::Bench {

class PlainTask {
public:
    virtual ~PlainTask() = default;
    virtual void Run() = 0;
};

template <class T, class... Arguments>
class PlainMember final : public PlainTask {
public:
    PlainMember(T* object, void (T::*function)(Arguments const&...), Arguments const&... arguments)
        : mObject(object), mFunction(function), mArguments(arguments...) {}
    void Run() override {
        std::apply([this](Arguments const&... arguments) { (mObject->*mFunction)(arguments...); },
                   mArguments);
    }

private:
    T* mObject;
    void (T::*mFunction)(Arguments const&...);
    std::tuple<Arguments...> mArguments;
};

class PlainQueue {
public:
    template <class T, class... Arguments>
    void Post(T* object, void (T::*function)(Arguments const&...), Arguments const&... arguments) {
        auto task = std::make_unique<PlainMember<T, Arguments...>>(object, function, arguments...);
        {
            std::lock_guard<std::mutex> const lock(mMutex);
            mTasks.push_back(std::move(task));
        }
        mWork.notify_one();
    }

    void Run() {
        std::unique_lock<std::mutex> lock(mMutex);
        for (;;) {
            mWork.wait(lock, [this] { return !mTasks.empty() || mStopping; });
            if (mTasks.empty()) return;
            {
                std::unique_ptr<PlainTask> const task = std::move(mTasks.front());
                mTasks.pop_front();
                lock.unlock();
                task->Run();
            }
            lock.lock();
        }
    }

    void RequestStop() {
        {
            std::lock_guard<std::mutex> const lock(mMutex);
            mStopping = true;
        }
        mWork.notify_one();
    }

private:
    std::mutex mMutex;
    std::condition_variable mWork;
    std::deque<std::unique_ptr<PlainTask>> mTasks;
    bool mStopping = false;
};

} // namespace Moka::Bench
