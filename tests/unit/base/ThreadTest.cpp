// Threads, the locks between them, and the counts of references that they share.
#include "moka/base/Thread.h"
#include "moka/base/ConditionalVariable.h"
#include "moka/base/CriticalSection.h"
#include "moka/base/RefCount.h"

#include "tests/support/LogCapture.h"

#include <gtest/gtest.h>

#include <chrono>
#include <thread>

#include <pthread.h>

namespace Moka {
namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;
using Testing::Awaited;

struct Seen {
    std::string name;
    bool done = false; // not atomic: joining is what makes it visible
};

void Look(void* argument) {
    auto* const seen = static_cast<Seen*>(argument);
    char name[64] = {};
    pthread_getname_np(pthread_self(), name, sizeof name);
    seen->name = name;
    std::this_thread::sleep_for(5ms);
    seen->done = true;
}

class ThreadTest : public testing::Test {
protected:
    Testing::LogCapture log;
};

TEST_F(ThreadTest, NamesAreCutAtACharacter) {
    std::pair<char const*, char const*> const cases[] = {
        {"worker", "worker"},
        {"fifteen bytes !", "fifteen bytes !"},
        {"MokaBitmapLoader thread", "MokaBitmapLoade"},
        {"12345678901234\xc3\xa4", "12345678901234"},
        {"1234567890123\xc3\xa4", "1234567890123\xc3\xa4"},
        {"12345678901\xf0\x9f\x98\x80z", "12345678901\xf0\x9f\x98\x80"},
    };
    for (auto const& [name, got] : cases) {
        Seen seen;
        std::string given(name);
        {
            Thread thread(Look, &seen, given.c_str());
            given.assign(given.size(), '#'); // the name was copied
            EXPECT_TRUE(thread.Start());
        } // waits for its end
        EXPECT_TRUE(seen.done);
        EXPECT_EQ(seen.name, got);
    }
}

TEST_F(ThreadTest, StartsOnceAndJoinsHarmlessly) {
    { Thread const never(Look, nullptr, "never started"); }
    Seen seen;
    Thread thread(Look, &seen, "once");
    thread.Join();
    EXPECT_FALSE(seen.done);
    EXPECT_TRUE(thread.Start());
    EXPECT_FALSE(thread.Start());
    thread.Join();
    EXPECT_TRUE(seen.done);
    thread.Join();
    EXPECT_FALSE(thread.Start());
    ASSERT_EQ(log.GetLines().size(), 2U);
    EXPECT_NE(log.GetTexts()[0].find("once"), std::string::npos);
}

// Often enough that the function at times runs before Start has returned.
TEST_F(ThreadTest, AFunctionMayDeleteItsOwnThread) {
    constexpr int kRounds = 300;
    struct SelfDeleting {
        Thread* thread = nullptr;
        Awaited<bool> done;
    };
    for (int i = 0; i < kRounds; ++i) {
        SelfDeleting own;
        own.thread = new Thread(
            [](void* argument) {
                auto& self = *static_cast<SelfDeleting*>(argument);
                self.thread->Join(); // an error line, not a deadlock
                delete self.thread;
                self.done.Set(true);
            },
            &own, "self");
        ASSERT_TRUE(own.thread->Start());
        own.done.AwaitAtLeast(true);
    }
    EXPECT_EQ(log.GetLines().size(), static_cast<std::size_t>(kRounds));
}

class LocksTest : public testing::TestWithParam<bool> {
protected:
    CriticalSection lock{GetParam()};
    ConditionalVariable condition;
};
INSTANTIATE_TEST_SUITE_P(Kinds, LocksTest, testing::Bool(),
                         [](auto const& kind) { return kind.param ? "Recursive" : "Plain"; });

TEST_P(LocksTest, WaitTimesOutWithTheLockHeldUntilTheLastLeave) {
    int guarded = 0;
    // The time runs out in the next second.
    std::this_thread::sleep_until(std::chrono::ceil<std::chrono::seconds>(Clock::now()) - 15ms);
    lock.Enter();
    auto const start = Clock::now();
    EXPECT_FALSE(condition.Wait(lock, 30));
    EXPECT_GE(Clock::now() - start, 29ms);
    EXPECT_FALSE(condition.Wait(lock, 0));
    if (GetParam()) lock.Enter();
    std::thread other([&] {
        AutoCriticalSection const alsoInside(lock);
        ++guarded;
    });
    if (GetParam()) lock.Leave();
    std::this_thread::sleep_for(20ms);
    EXPECT_EQ(guarded, 0);
    lock.Leave();
    other.join();
    EXPECT_EQ(guarded, 1);
}

TEST_P(LocksTest, SignalWakesEveryWaiter) {
    constexpr int kWaiters = 4;
    Awaited<int> waiting;
    bool go = false;
    std::vector<std::thread> threads;
    for (int t = 0; t < kWaiters; ++t) {
        threads.emplace_back([&, limited = t % 2 == 0] {
            AutoCriticalSection const inside(lock);
            ++waiting;
            while (!go) condition.Wait(lock, limited ? 60'000 : -1);
        });
    }
    waiting.AwaitAtLeast(kWaiters);
    {
        AutoCriticalSection const inside(lock); // so all of them wait
        go = true;
        condition.Signal(); // once: whoever it passes over never ends
    }
    for (std::thread& thread : threads) thread.join();
}

// Under the thread sanitizer: the destructor reads what the other threads wrote before they let go.
TEST(RefCountTest, TheLastUnrefSeesWhatTheOthersDid) {
    constexpr std::size_t kThreads = 4;
    struct Shared : RefCount {
        explicit Shared(int* total) : sum(total) {}
        ~Shared() override {
            for (int const part : parts) *sum += part;
        }
        int* sum;
        int parts[kThreads] = {};
    };
    for (int round = 0; round < 200; ++round) {
        int sum = 0;
        auto* const object = new Shared(&sum);
        std::vector<std::thread> threads;
        for (int& part : object->parts) {
            object->Ref();
            threads.emplace_back([object, &part] {
                object->Ref();
                part = 1;
                object->Unref();
                object->Unref();
            });
        }
        object->Unref();
        for (std::thread& thread : threads) thread.join();
        ASSERT_EQ(sum, static_cast<int>(kThreads));
    }
}

} // namespace
} // namespace Moka
