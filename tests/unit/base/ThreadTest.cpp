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
    seen->priority = getpriority(PRIO_PROCESS, static_cast<id_t>(gettid()));
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
    seen->done = true;
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
    struct Case {
        char const* given;
        char const* got;
    };
    for (Case const& c : {
             Case{"worker", "worker"},
             Case{"fifteen bytes !", "fifteen bytes !"},
             Case{"MokaBitmapLoader thread", "MokaBitmapLoade"},
             Case{"12345678901234\xc3\xa4", "12345678901234"},
             Case{"1234567890123\xc3\xa4", "1234567890123\xc3\xa4"},
             Case{"123456789012\xf0\x9f\x98\x80", "123456789012"},
             Case{"12345678901\xf0\x9f\x98\x80z", "12345678901\xf0\x9f\x98\x80"},
         }) {
        Seen seen;
        std::string given(c.given);
        Thread thread(Look, &seen, given.c_str());
        given.assign(given.size(), '#'); // the name was copied
        ASSERT_TRUE(thread.Start());
        thread.Join();
        EXPECT_EQ(seen.name, c.got);
    }
    Seen seen;
    Thread unnamed(Look, &seen, nullptr);
    ASSERT_TRUE(unnamed.Start());
    unnamed.Join();
    EXPECT_TRUE(seen.done);
}

TEST_F(ThreadTest, PriorityIsItsOwnAndARefusedOneIsIgnored) {
    int const own = getpriority(PRIO_PROCESS, static_cast<id_t>(gettid()));
    Seen lower;
    Thread low(Look, &lower, "low", own + 3);
    ASSERT_TRUE(low.Start());
    low.Join();
    EXPECT_EQ(lower.priority, own + 3);
    EXPECT_EQ(getpriority(PRIO_PROCESS, static_cast<id_t>(gettid())), own);
    for (int const refusable : {-20, -1000, 1000}) {
        Seen seen;
        Thread thread(Look, &seen, "p", refusable);
        ASSERT_TRUE(thread.Start());
        thread.Join();
        EXPECT_TRUE(seen.done);
    }
    EXPECT_TRUE(mLines.empty());
}

TEST_F(ThreadTest, StartsOnceAndJoinsHarmlessly) {
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

TEST_F(ThreadTest, DestructionWaitsForTheFunction) {
    Seen seen;
    {
        Thread thread(Look, &seen, "waited for");
        ASSERT_TRUE(thread.Start());
    }
    EXPECT_TRUE(seen.done);
    { Thread const never(Look, &seen, "never started"); }
}

struct SelfDeleting {
    Thread* thread = nullptr;
    std::atomic<bool>* done = nullptr;
};

void DeleteOwnThread(void* argument) {
    SelfDeleting const own = *static_cast<SelfDeleting*>(argument);
    own.thread->Join(); // an error line, not a deadlock
    delete own.thread;
    *own.done = true;
}

// Often enough that the function at times runs before Start has returned.
TEST_F(ThreadTest, AFunctionMayDeleteItsOwnThread) {
    constexpr int kRounds = 300;
    for (int i = 0; i < kRounds; ++i) {
        std::atomic<bool> done{false};
        SelfDeleting own;
        own.done = &done;
        own.thread = new Thread(DeleteOwnThread, &own, "self");
        ASSERT_TRUE(own.thread->Start());
        while (!done) std::this_thread::yield();
    }
    SetLogSink(nullptr);
    EXPECT_EQ(mLines.size(), static_cast<std::size_t>(kRounds));
}

} // namespace
} // namespace Moka
