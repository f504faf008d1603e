// Awaited: a value that threads change and others wait for, without spinning.
// Thread: any.
#pragma once

#include <condition_variable>
#include <mutex>

namespace Moka::Testing {

template <class T>
class Awaited {
public:
    explicit Awaited(T value = T()) : mValue(value) {}

    T Get() const {
        std::lock_guard<std::mutex> const lock(mMutex);
        return mValue;
    }
    // Wakes under the lock: whoever waits may destroy this as soon as it sees the value.
    template <class Change>
    void Update(Change const& change) {
        std::lock_guard<std::mutex> const lock(mMutex);
        change(mValue);
        mChanged.notify_all();
    }
    void Set(T const& value) {
        Update([&](T& own) { own = value; });
    }
    void operator++() {
        Update([](T& own) { ++own; });
    }
    // Until the condition holds for the value.
    template <class Condition>
    void Await(Condition const& condition) const {
        std::unique_lock<std::mutex> lock(mMutex);
        mChanged.wait(lock, [&] { return condition(mValue); });
    }
    void AwaitAtLeast(T const& least) const {
        Await([&](T const& own) { return own >= least; });
    }

private:
    std::mutex mutable mMutex;
    std::condition_variable mutable mChanged;
    T mValue;
};

} // namespace Moka::Testing
