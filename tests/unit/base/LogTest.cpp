#include "moka/base/Log.h"

#include "moka/base/String.h"
#include "moka/base/System.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"

#include <gmock/gmock.h>

#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include <sys/socket.h>
#include <unistd.h>

namespace Moka {
namespace {

using testing::ElementsAre;

// Collects what is written to stderr; each write is one packet, so a line in pieces is seen as pieces.
class StderrPackets {
public:
    StderrPackets() {
        EXPECT_EQ(socketpair(AF_UNIX, SOCK_SEQPACKET, 0, mEnds), 0);
        mSaved = dup(STDERR_FILENO);
        dup2(mEnds[0], STDERR_FILENO);
    }
    ~StderrPackets() {
        dup2(mSaved, STDERR_FILENO);
        for (int const file : {mSaved, mEnds[0], mEnds[1]}) close(file);
    }
    StderrPackets(StderrPackets const&) = delete;
    StderrPackets& operator=(StderrPackets const&) = delete;

    std::vector<std::string> Take() {
        std::vector<std::string> packets;
        std::string buffer(1 << 17, '\0');
        while (true) {
            auto const size = recv(mEnds[1], buffer.data(), buffer.size(), MSG_DONTWAIT);
            if (size <= 0) return packets;
            packets.push_back(buffer.substr(0, static_cast<std::size_t>(size)));
        }
    }

private:
    int mEnds[2] = {-1, -1};
    int mSaved = -1;
};

class LogTest : public testing::Test {
protected:
    ~LogTest() override {
        SetLogSink(nullptr);
        SetLogPriority(ANDROID_LOG_INFO);
    }

    void Collect() {
        SetLogSink([this](LogLine const& line) { mLines.push_back(line); });
    }

    StderrPackets mStderr;
    std::vector<LogLine> mLines;
};

TEST_F(LogTest, WritesEachLineInOnePieceToStderrFromTheLowestPriorityOn) {
    std::string const text(50'000, 'x');
    EXPECT_EQ(__android_log_print(ANDROID_LOG_DEBUG, "t", "hidden"), 0);
    __android_log_print(ANDROID_LOG_INFO, "t", "i");
    __android_log_print(ANDROID_LOG_WARN, "t", "%s", text.c_str());
    EXPECT_EQ(__android_log_print(ANDROID_LOG_ERROR, "t", "e"), 7);
    __android_log_print(ANDROID_LOG_FATAL, "t", "f");
    SetLogPriority(ANDROID_LOG_DEBUG);
    __android_log_print(ANDROID_LOG_DEBUG, nullptr, "%s", "");
    char const* noFormat = nullptr;
    __android_log_print(ANDROID_LOG_INFO, "t", noFormat, 1);
    EXPECT_THAT(mStderr.Take(), ElementsAre("I t: i\n", "W t: " + text + "\n", "E t: e\n", "F t: f\n",
                                            "D (null): \n", "I t: (null)\n"));
}

TEST_F(LogTest, ASinkMayLogAndReplaceItself) {
    SetLogSink([this, kept = std::string(100, 'k')](LogLine const& line) {
        __android_log_print(ANDROID_LOG_WARN, "t", "inside %s", line.text.c_str());
        Collect();
        EXPECT_EQ(kept, std::string(100, 'k')) << "the closure outlives its replacement";
    });
    __android_log_print(ANDROID_LOG_INFO, "t", "first");
    __android_log_print(ANDROID_LOG_INFO, "t", "second");
    EXPECT_THAT(mStderr.Take(), ElementsAre("W t: inside first\n"));
    ASSERT_EQ(mLines.size(), 1U);
    EXPECT_EQ(mLines[0].text, "second");
}

TEST_F(LogTest, AThrowingSinkLosesNoLineAndStaysInstalled) {
    int calls = 0;
    SetLogSink([&](LogLine const&) {
        ++calls;
        throw std::runtime_error("sink");
    });
    __android_log_print(ANDROID_LOG_ERROR, "t", "one");
    __android_log_print(ANDROID_LOG_ERROR, "t", "two");
    EXPECT_EQ(calls, 2);
    EXPECT_THAT(mStderr.Take(), ElementsAre("E t: one\n", "E t: two\n"));
}

TEST_F(LogTest, SinksRunOneAtATimeAndRemovingOneWaitsForIt) {
    int seen = 0; // not atomic: the sinks' taking turns is what guards it
    auto const count = [&](LogLine const&) { ++seen; };
    SetLogSink(count);
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([] {
            for (int i = 0; i < 500; ++i) __android_log_print(ANDROID_LOG_INFO, "t", "%d", i);
        });
    }
    for (int i = 0; i < 100; ++i) SetLogSink(count);
    for (std::thread& thread : threads) thread.join();
    SetLogSink(nullptr);
    EXPECT_EQ(seen, 4 * 500);
}

TEST(SecureLogTest, KeepsOnlyFolderDepthAndExtension) {
    std::pair<char const*, char const*> const cases[] = {
        {"", ""},
        {"/data/user/my diary.png", "/****/****/********.png"},
        {"a.tar.gz", "*****.gz"},
        {"/a.b/c", "/***/*"},
        {"/home/.profile", "/****/********"},
        {"name.", "*****"},
        {"x.jpeg2000", "**********"},
        {"Dr. No", "******"},
        {"//x.JPG/", "//*****/"},
        {"\xe2\x82\xac\xf0\x9f\x98\x80.mki", "**.mki"}, // one star a character
    };
    for (auto const& [text, masked] : cases) EXPECT_EQ(Log::ConvertSecureLog(text), masked);
    System::SetBuildTypeEngMode(true);
    EXPECT_EQ(Log::ConvertSecureLog("/data/\xe2\x82\xac.png"), "/data/\xe2\x82\xac.png");
    System::SetBuildTypeEngMode(false);
}

} // namespace
} // namespace Moka
