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

class LocksTest : public testing::TestWithParam<bool> {
protected:
    CriticalSection lock{GetParam()};
    ConditionalVariable condition;
};
INSTANTIATE_TEST_SUITE_P(Kinds, LocksTest, testing::Bool(),
                         [](auto const& kind) { return kind.param ? "Recursive" : "Plain"; });

TEST_P(LocksTest, WaitTimesOutWithTheLockHeldAgain) {
    int guarded = 0;
    std::thread other;
    // The time runs out in the next second.
    std::this_thread::sleep_until(std::chrono::ceil<std::chrono::seconds>(Clock::now()) - 15ms);
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
    int waiting = 0;
    bool go = false;
    std::vector<std::thread> threads;
    for (int t = 0; t < kWaiters; ++t) {
        threads.emplace_back([&, limited = t % 2 == 0] {
            AutoCriticalSection const inside(lock);
            ++waiting;
            while (!go) condition.Wait(lock, limited ? 60'000 : -1);
        });
    }
    while (!go) {
        std::this_thread::yield();
        AutoCriticalSection const inside(lock);
        if (waiting < kWaiters) continue;
        go = true;
        condition.Signal(); // once: whoever it passes over never ends
    }
    for (std::thread& thread : threads) thread.join();
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

} // namespace
} // namespace Moka
