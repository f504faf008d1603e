#include "moka/base/Thread.h"

#include "moka/base/log/LogSink.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include <pthread.h>
#include <sys/resource.h>
#include <unistd.h>

namespace Moka {
namespace {

int GetPriority() { return getpriority(PRIO_PROCESS, static_cast<id_t>(gettid())); }

struct Seen {
    std::string name;
    int priority = 0;
    bool done = false; // not atomic: joining is what makes it visible
};

void Look(void* argument) {
    auto* const seen = static_cast<Seen*>(argument);
    char name[64] = {};
    pthread_getname_np(pthread_self(), name, sizeof name);
    seen->name = name;
    seen->priority = GetPriority();
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
    seen->done = true;
}

// What a thread of this name and priority sees, waited for by its destructor.
Seen LookAround(char const* name, int priority = GetPriority()) {
    Seen seen;
    std::string given(name ? name : "");
    {
        Thread thread(Look, &seen, name ? given.c_str() : nullptr, priority);
        given.assign(given.size(), '#'); // the name was copied
        EXPECT_TRUE(thread.Start());
    }
    EXPECT_TRUE(seen.done);
    return seen;
}

class ThreadTest : public testing::Test {
protected:
    ThreadTest() {
        SetLogSink([this](LogLine const& line) { mLines.push_back(line.text); });
    }
    ~ThreadTest() override { SetLogSink(nullptr); }

    std::vector<std::string> mLines;
};

TEST_F(ThreadTest, NamesAreCutAtACharacter) {
    std::pair<char const*, char const*> const cases[] = {
        {"worker", "worker"},
        {"fifteen bytes !", "fifteen bytes !"},
        {"MokaBitmapLoader thread", "MokaBitmapLoade"},
        {"12345678901234\xc3\xa4", "12345678901234"},
        {"1234567890123\xc3\xa4", "1234567890123\xc3\xa4"},
        {"123456789012\xf0\x9f\x98\x80", "123456789012"},
        {"12345678901\xf0\x9f\x98\x80z", "12345678901\xf0\x9f\x98\x80"},
    };
    for (auto const& [given, got] : cases) EXPECT_EQ(LookAround(given).name, got);
    LookAround(nullptr);
}

TEST_F(ThreadTest, PriorityIsItsOwnAndARefusedOneIsIgnored) {
    int const own = GetPriority();
    EXPECT_EQ(LookAround("low", own + 3).priority, own + 3);
    EXPECT_EQ(GetPriority(), own);
    for (int const refusable : {-20, -1000, 1000}) LookAround("p", refusable);
    EXPECT_TRUE(mLines.empty());
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
    ASSERT_EQ(mLines.size(), 2U);
    EXPECT_NE(mLines[0].find("once"), std::string::npos);
}

struct SelfDeleting {
    Thread* thread = nullptr;
    std::atomic<bool> done{false};
};

void DeleteOwnThread(void* argument) {
    auto& own = *static_cast<SelfDeleting*>(argument);
    own.thread->Join(); // an error line, not a deadlock
    delete own.thread;
    own.done = true;
}

// Often enough that the function at times runs before Start has returned.
TEST_F(ThreadTest, AFunctionMayDeleteItsOwnThread) {
    constexpr int kRounds = 300;
    for (int i = 0; i < kRounds; ++i) {
        SelfDeleting own;
        own.thread = new Thread(DeleteOwnThread, &own, "self");
        ASSERT_TRUE(own.thread->Start());
        while (!own.done) std::this_thread::yield();
    }
    SetLogSink(nullptr);
    EXPECT_EQ(mLines.size(), static_cast<std::size_t>(kRounds));
}

} // namespace
} // namespace Moka
