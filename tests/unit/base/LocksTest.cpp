#include "moka/base/ConditionalVariable.h"
#include "moka/base/CriticalSection.h"

#include <gtest/gtest.h>

#include <chrono>
#include <thread>
#include <vector>

namespace Moka {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

class LocksTest : public testing::TestWithParam<bool> {};
INSTANTIATE_TEST_SUITE_P(Kinds, LocksTest, testing::Bool(),
                         [](auto const& kind) { return kind.param ? "Recursive" : "Plain"; });

TEST_P(LocksTest, KeepsOthersOut) {
    CriticalSection lock(GetParam());
    int count = 0;
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&] {
            for (int i = 0; i < 5000; ++i) {
                AutoCriticalSection const inside(lock);
                ++count;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(count, 20000);
}

TEST_P(LocksTest, WaitTimesOutWithTheLockHeldAgain) {
    CriticalSection lock(GetParam());
    ConditionalVariable condition;
    int guarded = 0;
    std::thread other;
    {
        AutoCriticalSection const inside(lock);
        auto const start = Clock::now();
        EXPECT_FALSE(condition.Wait(lock, 30));
        EXPECT_GE(Clock::now() - start, 29ms);
        EXPECT_FALSE(condition.Wait(lock, 0));
        other = std::thread([&] {
            AutoCriticalSection const alsoInside(lock);
            ++guarded;
        });
        std::this_thread::sleep_for(20ms);
        EXPECT_EQ(guarded, 0);
    }
    other.join();
    EXPECT_EQ(guarded, 1);
}

TEST_P(LocksTest, SignalWakesEveryWaiter) {
    constexpr int kWaiters = 4;
    CriticalSection lock(GetParam());
    ConditionalVariable condition;
    int waiting = 0;
    bool go = false;
    int woken = 0;
    std::vector<std::thread> threads;
    for (int t = 0; t < kWaiters; ++t) {
        threads.emplace_back([&, limited = t % 2 == 0] {
            AutoCriticalSection const inside(lock);
            ++waiting;
            while (!go) condition.Wait(lock, limited ? 60'000 : -1);
            ++woken;
        });
    }
    auto const allWait = [&] {
        AutoCriticalSection const inside(lock);
        return waiting == kWaiters;
    };
    while (!allWait()) std::this_thread::yield();
    {
        AutoCriticalSection const inside(lock);
        go = true;
        condition.Signal(); // once: whoever it passes over never ends
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(woken, kWaiters);
}

TEST(CriticalSectionTest, ARecursiveOneIsLeftWithTheLastLeave) {
    CriticalSection lock(true);
    bool entered = false;
    lock.Enter();
    lock.Enter();
    lock.Leave();
    std::thread other([&] {
        AutoCriticalSection const inside(lock);
        entered = true;
    });
    std::this_thread::sleep_for(20ms);
    EXPECT_FALSE(entered);
    lock.Leave();
    other.join();
    EXPECT_TRUE(entered);
}

// A wait inside one level, nested levels before and after it.
TEST(CriticalSectionTest, ARecursiveOneCanBeNestedAroundAWait) {
    CriticalSection lock(true);
    ConditionalVariable condition;
    int turn = 0;
    auto const step = [&](int mine) {
        AutoCriticalSection const outer(lock);
        while (turn != mine) condition.Wait(lock);
        AutoCriticalSection const inner(lock);
        ++turn;
        condition.Signal();
    };
    std::thread odd([&] {
        for (int i = 1; i < 200; i += 2) step(i);
    });
    for (int i = 0; i < 200; i += 2) step(i);
    odd.join();
    EXPECT_EQ(turn, 200);
}

} // namespace
} // namespace Moka
