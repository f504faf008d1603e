// Burst: one queue with its consumer and producers. In each burst every producer posts the same number of
// tasks to a sleeping consumer. The result is the producers' time for each post.
#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>
#include <vector>

#include <sys/resource.h>

namespace Moka::Bench {

struct Matrix {
    float values[9];
};
struct Rectangle {
    float edges[4];
};
struct Paint {
    float color[4];
    float shadow[4];
    int blend;
    int filter;
    int flags[6];
};

// The receiver of the tasks: stands in for the render side of a canvas, and draws nothing.
class Receiver {
public:
    explicit Receiver(std::chrono::nanoseconds work) : mWork(work) {}

    void Draw(Rectangle const& rectangle, Matrix const& matrix, Paint const& paint) {
        mSum += rectangle.edges[0] + matrix.values[8] + paint.color[3];
        if (mWork.count() > 0) {
            auto const end = std::chrono::steady_clock::now() + mWork;
            while (std::chrono::steady_clock::now() < end) {
            }
        }
        mCount.store(mCount.load(std::memory_order_relaxed) + 1, std::memory_order_release);
    }
    long GetCount() const { return mCount.load(std::memory_order_acquire); }

private:
    std::chrono::nanoseconds mWork;
    float mSum = 0;
    std::atomic<long> mCount{0};
};

// Queue must have Post(Receiver*, Rectangle const&, Matrix const&, Paint const&), Run() and Stop().
template <class Queue>
class Burst {
public:
    static constexpr int kPosts = 1000; // by each producer: the order of a busy frame

    Burst(int producers, std::chrono::nanoseconds work) : mReceiver(work) {
        mConsumer = std::thread([this] {
            mQueue.Run();
            rusage usage{};
            getrusage(RUSAGE_THREAD, &usage);
            mSleeps = usage.ru_nvcsw;
        });
        for (int i = 0; i < producers; ++i) mProducers.emplace_back([this] { Produce(); });
    }

    // Returns the producers' nanoseconds for each post, including the consumer's first wake-up.
    double Run() {
        long const goal = mReceiver.GetCount() + GetPostsInBurst();
        {
            std::unique_lock<std::mutex> lock(mMutex);
            mElapsed = {};
            mUnfinished = static_cast<int>(mProducers.size());
            ++mRound;
            mChanged.notify_all();
            mChanged.wait(lock, [this] { return mUnfinished == 0; });
        }
        while (mReceiver.GetCount() < goal) std::this_thread::sleep_for(std::chrono::microseconds(50));
        // Gives the consumer time to fall asleep.
        std::this_thread::sleep_for(std::chrono::microseconds(200));
        return static_cast<double>(mElapsed.count()) / static_cast<double>(GetPostsInBurst());
    }

    // Ends the threads. Returns the number of times that the consumer slept, divided by the number of posts.
    double StopAndCountSleeps() {
        {
            std::lock_guard<std::mutex> const lock(mMutex);
            mStopping = true;
            mChanged.notify_all();
        }
        for (std::thread& producer : mProducers) producer.join();
        mQueue.Stop();
        mConsumer.join();
        return static_cast<double>(mSleeps) / static_cast<double>(mReceiver.GetCount());
    }

private:
    long GetPostsInBurst() const { return static_cast<long>(mProducers.size()) * kPosts; }

    void Produce() {
        std::unique_lock<std::mutex> lock(mMutex);
        for (int round = 0;;) {
            mChanged.wait(lock, [&] { return mRound != round || mStopping; });
            if (mStopping) return;
            round = mRound;
            lock.unlock();
            std::chrono::nanoseconds const elapsed = PostAll();
            lock.lock();
            mElapsed += elapsed;
            if (--mUnfinished == 0) mChanged.notify_all();
        }
    }

    std::chrono::nanoseconds PostAll() {
        Rectangle rectangle{{0, 0, 64, 64}};
        Matrix const matrix{{1, 0, 0, 0, 1, 0, 0, 0, 1}};
        Paint const paint{{1, 1, 1, 1}, {0, 0, 0, 1}, 3, 1, {}};
        auto const start = std::chrono::steady_clock::now();
        for (int i = 0; i < kPosts; ++i) {
            rectangle.edges[0] = static_cast<float>(i);
            mQueue.Post(&mReceiver, rectangle, matrix, paint);
        }
        return std::chrono::steady_clock::now() - start;
    }

    Queue mQueue;
    Receiver mReceiver;
    long mSleeps = 0;
    std::thread mConsumer;
    std::vector<std::thread> mProducers;

    std::mutex mMutex;
    std::condition_variable mChanged;
    int mRound = 0;
    int mUnfinished = 0;
    bool mStopping = false;
    std::chrono::nanoseconds mElapsed{};
};

} // namespace Moka::Bench
