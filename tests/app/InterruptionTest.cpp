#include "tests/app/ToolTest.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <functional>
#include <pty.h>
#include <thread>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::MatchesRegex;

// Random colours, which give an encoder work.
Picture MakeNoise(int side) {
    Picture image(side, side);
    unsigned state = 1;
    for (std::size_t i = 0; i < image.pixels.size(); ++i) {
        state = state * 1664525 + 1013904223;
        image.pixels[i] = i % 4 == 3 ? 255 : static_cast<unsigned char>(state >> 24);
    }
    return image;
}

// What a person at a terminal sees.
class Terminal {
public:
    Terminal() {
        if (openpty(&mOwn, &mOther, nullptr, nullptr, nullptr) == 0) fcntl(mOwn, F_SETFL, O_NONBLOCK);
    }
    ~Terminal() {
        for (int const file : {mOwn, mOther})
            if (file >= 0) close(file);
    }
    Terminal(Terminal const&) = delete;
    Terminal& operator=(Terminal const&) = delete;

    // -1 where the system has no terminals to give: a container without /dev/pts.
    int GetFile() const { return mOther; }

    std::string const& GetShown() {
        char block[512];
        for (ssize_t got = 0; (got = read(mOwn, block, sizeof(block))) > 0;)
            mShown.append(block, static_cast<std::size_t>(got));
        return mShown;
    }

private:
    int mOwn = -1;
    int mOther = -1;
    std::string mShown;
};

class InterruptionTest : public ToolTest {
protected:
    InterruptionTest() { Save(MakeNoise(2000), "in.mki"); }

    bool WaitFor(std::function<bool()> const& isSo) const {
        for (int i = 0; i < 30000; ++i) {
            if (isSo()) return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return false;
    }

    bool HasTemporary(std::string const& folder = ".") const {
        std::vector<std::string> const names = List(folder);
        return std::any_of(names.begin(), names.end(),
                           [](std::string const& name) { return name[0] == '.'; });
    }
};

TEST_F(InterruptionTest, WhileSavingLeavesWhatWasThere) {
    for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
        if (signal == SIGHUP) WriteFile("out.webp", "what was there before");
        std::vector<std::string> const before = List();
        MokaProcess process(mFolder.string(), {"convert", "in.mki", "out.webp"});
        ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
        process.Signal(signal);
        ProcessResult const result = process.Wait();
        EXPECT_EQ(result.signal, signal) << result.status << result.err;
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(List(), before);
    }
    EXPECT_EQ(ReadFile("out.webp"), "what was there before");
}

TEST_F(InterruptionTest, ASignalThatWasIgnoredStaysIgnored) {
    Save(MakeNoise(1000), "short.mki");
    ProcessOptions options;
    options.ignoredSignal = SIGHUP;
    MokaProcess process(mFolder.string(), {"convert", "short.mki", "out.webp"}, options);
    ASSERT_TRUE(WaitFor([this] { return HasTemporary(); }));
    process.Signal(SIGHUP);
    EXPECT_EQ(process.Wait().status, 0);
    EXPECT_THAT(List(), ElementsAre("in.mki", "out.webp", "short.mki"));
}

class TerminalTest : public InterruptionTest {
protected:
    // Stops the tool for a while when its work has come so far, which makes it take long; its terminal must
    // then show the line, drawn over and over, and be clean at the end.
    void ExpectShows(std::string const& line, std::vector<std::string> const& arguments,
                     std::function<bool()> const& hasComeSoFar) {
        Terminal terminal;
        ProcessOptions options;
        options.terminal = terminal.GetFile();
        if (options.terminal < 0) GTEST_SKIP() << "no terminal can be opened here: is /dev/pts mounted?";
        MokaProcess process(mFolder.string(), arguments, options);
        ASSERT_TRUE(WaitFor(hasComeSoFar));
        process.Signal(SIGSTOP);
        std::this_thread::sleep_for(std::chrono::milliseconds(1200));
        process.Signal(SIGCONT);
        auto const isShown = ::testing::Matches(::testing::ContainsRegex("\r\033\\[K" + line));
        EXPECT_TRUE(WaitFor([&] { return isShown(terminal.GetShown()); })) << terminal.GetShown();
        EXPECT_EQ(process.Wait().status, 0);
        EXPECT_THAT(terminal.GetShown(), EndsWith("\r\033[K"));
        EXPECT_EQ(terminal.GetShown().find('\n'), std::string::npos);
    }
};

TEST_F(TerminalTest, ShowsHowManyOfManyAreDone) {
    for (char const* const name : {"a.png", "b.png", "c.png"}) Save(MakeNoise(100), name);
    std::filesystem::create_directory(mFolder / "out");
    // What takes long comes last.
    ExpectShows("convert  3/4  75%  [0-9]+\\.[0-9] files/s  0:0[01] left",
                {"convert", "a.png", "b.png", "c.png", "in.mki", "--to", "webp", "--out", "out"},
                [this] { return List("out").size() == 4; });
}

class BatchInterruptionTest : public InterruptionTest {
protected:
    BatchInterruptionTest() {
        EmptyFolder();
        // Of different sizes, so that the moments of one file are not those of the next.
        for (int i = 0; i < kFiles; ++i) {
            std::string const name = std::to_string(i);
            Save(MakeNoise(100 + 17 * i), name + ".png");
            Save(MakeNoise(100 + 17 * i), name + "-expected.mki");
            mArguments.push_back(name + ".png");
        }
        mArguments.insert(mArguments.end(), {"--to", "mki", "--out", "out", "-q", "--jobs"});
    }

    void SetUp() override {
#ifdef __SANITIZE_ADDRESS__
        GTEST_SKIP()
            << "a tool that is being interrupted opens no more files; the sanitizer's checks need some";
#endif
    }

    void EmptyFolder() const {
        std::filesystem::remove_all(mFolder / "out");
        std::filesystem::create_directory(mFolder / "out");
    }
    int CountFiles() const { return static_cast<int>(List("out").size()); }

    void ExpectOnlyWholeFiles() const {
        for (std::string const& name : List("out")) {
            if (name[0] == '.') continue; // what a kill leaves
            std::string const expected = name.substr(0, name.find('.')) + "-expected.mki";
            EXPECT_TRUE(ReadFile("out/" + name) == ReadFile(expected)) << name;
        }
    }

    // Unless the signal came after the work. What has just become whole is not counted yet.
    void ExpectTellsHowFar(ProcessResult const& result) const {
        if (result.signal == SIGKILL) return;
        if (result.err.empty()) {
            EXPECT_TRUE(result.signal == 0 || CountFiles() == kFiles);
            return;
        }
        int told = -1;
        EXPECT_THAT(result.err, MatchesRegex("moka: interrupted; [0-9]+ of 8 images are in out\n"));
        std::sscanf(result.err.c_str(), "moka: interrupted; %d", &told);
        EXPECT_GE(told, CountFiles() - 4);
        EXPECT_LE(told, CountFiles());
        EXPECT_NE(result.signal, 0);
    }

    static constexpr int kFiles = 8;
    std::vector<std::string> mArguments{"convert"};
};

// Also when it is killed. Several files at once, and one after the other: then nothing is being saved most of the time.
TEST_F(BatchInterruptionTest, AtAnyMomentLeavesOnlyWholeFiles) {
    int halfway = 0;
    for (int i = 0; i < 32; ++i) {
        std::vector<std::string> arguments = mArguments;
        arguments.push_back(i % 2 == 0 ? "4" : "1");
        MokaProcess process(mFolder.string(), arguments);
        // Every third time in the middle of a save: the end of one is the beginning of the next.
        ASSERT_TRUE(WaitFor([&] {
            int const count = CountFiles();
            return count == kFiles || (count > i / 4 && (i % 3 != 0 || HasTemporary("out")));
        }));
        process.Signal(i % 4 == 0 ? SIGKILL : i % 4 == 3 ? SIGINT : SIGTERM);
        ProcessResult const result = process.Wait();
        ExpectTellsHowFar(result);
        halfway += result.signal != 0 && CountFiles() < kFiles;
        ExpectOnlyWholeFiles();
        EmptyFolder();
    }
    EXPECT_GT(halfway, 0);
}

} // namespace
} // namespace Moka::Testing
