#include "tests/app/ToolTest.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <functional>
#include <thread>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::EndsWith;

// Random colours, which give an encoder work.
TestImage MakeNoise(int side) {
    TestImage image(side, side);
    unsigned state = 1;
    for (std::size_t i = 0; i < image.pixels.size(); ++i) {
        state = state * 1664525 + 1013904223;
        image.pixels[i] = i % 4 == 3 ? 255 : static_cast<unsigned char>(state >> 24);
    }
    return image;
}

class InterruptionTest : public ToolTest {
protected:
    InterruptionTest() { Save(MakeNoise(2000), "in.mki"); }

    bool WaitFor(std::function<bool()> const& isSo) const {
        for (int i = 0; i < 10000; ++i) {
            if (isSo()) return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return false;
    }

    bool HasTemporary() const {
        std::vector<std::string> const names = List();
        return std::any_of(names.begin(), names.end(),
                           [](std::string const& name) { return name[0] == '.'; });
    }
};

TEST_F(InterruptionTest, WhileSavingLeavesNothing) {
    for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
        MokaProcess process(mFolder.string(), {"convert", "in.mki", "out.webp"});
        ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
        process.Signal(signal);
        ProcessResult const result = process.Wait();
        EXPECT_EQ(result.signal, signal) << result.status << result.err;
        EXPECT_EQ(result.out, "");
        EXPECT_THAT(List(), ElementsAre("in.mki"));
    }
}

TEST_F(InterruptionTest, WhileSavingKeepsWhatWasThere) {
    WriteFile("out.webp", "what was there before");
    MokaProcess process(mFolder.string(), {"convert", "in.mki", "out.webp"});
    ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
    process.Signal(SIGINT);
    EXPECT_EQ(process.Wait().signal, SIGINT);
    EXPECT_THAT(List(), ElementsAre("in.mki", "out.webp"));
    EXPECT_EQ(ReadFile("out.webp"), "what was there before");
}

// At moments from the first instruction to after the end.
TEST_F(InterruptionTest, AtAnyMomentLeavesNothingUnfinished) {
    Save(MakeNoise(300), "in.png");
    Save(MakeNoise(300), "expected.mki");
    std::string const whole = ReadFile("expected.mki");
    int interrupted = 0;
    for (int i = 0; i < 40; ++i) {
        MokaProcess process(mFolder.string(), {"convert", "in.png", "out.mki", "-q"});
        std::this_thread::sleep_for(std::chrono::microseconds(2500 * i));
        process.Signal(SIGINT);
        interrupted += process.Wait().signal == SIGINT;
        EXPECT_FALSE(HasTemporary()) << i;
        if (std::filesystem::exists(Path("out.mki"))) {
            EXPECT_TRUE(ReadFile("out.mki") == whole) << i;
        }
        std::filesystem::remove(Path("out.mki"));
    }
    EXPECT_GT(interrupted, 0);
}

TEST_F(InterruptionTest, ASignalThatWasIgnoredStaysIgnored) {
    Save(MakeNoise(1000), "short.mki");
    auto const before = std::signal(SIGHUP, SIG_IGN);
    MokaProcess process(mFolder.string(), {"convert", "short.mki", "out.webp"});
    std::signal(SIGHUP, before);
    ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
    process.Signal(SIGHUP);
    EXPECT_EQ(process.Wait().status, 0);
    EXPECT_THAT(List(), ElementsAre("in.mki", "out.webp", "short.mki"));
}

TEST_F(InterruptionTest, ATerminalShowsProgressAndIsLeftClean) {
    int const terminal = posix_openpt(O_RDWR | O_NOCTTY);
    ASSERT_GE(terminal, 0);
    ASSERT_EQ(grantpt(terminal), 0);
    ASSERT_EQ(unlockpt(terminal), 0);
    ProcessOptions options;
    options.terminal = open(ptsname(terminal), O_RDWR | O_NOCTTY);
    ASSERT_GE(options.terminal, 0);
    MokaProcess process(mFolder.string(), {"convert", "in.mki", "out.webp"}, options);
    ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
    // Makes the work take long without making the machine work.
    process.Signal(SIGSTOP);
    std::this_thread::sleep_for(std::chrono::milliseconds(1200));
    process.Signal(SIGCONT);
    std::string shown;
    fcntl(terminal, F_SETFL, O_NONBLOCK);
    auto const isShown = [&](char const* text) {
        char block[512];
        ssize_t const got = read(terminal, block, sizeof(block));
        if (got > 0) shown.append(block, static_cast<std::size_t>(got));
        return shown.find(text) != std::string::npos;
    };
    EXPECT_TRUE(WaitFor([&] { return isShown("\r\033[Kencode, 1."); })) << shown;
    ProcessResult const result = process.Wait();
    EXPECT_EQ(result.status, 0);
    isShown("");
    EXPECT_THAT(shown, EndsWith("\r\033[K"));
    EXPECT_EQ(shown.find('\n'), std::string::npos);
    close(options.terminal);
    close(terminal);
}

} // namespace
} // namespace Moka::Testing
