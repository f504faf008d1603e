#include "tests/app/ToolTest.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <functional>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
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

class InterruptionTest : public ToolTest {
protected:
    static bool WaitFor(std::function<bool()> const& isSo) {
        for (int i = 0; i < 30000; ++i) {
            if (isSo()) return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return false;
    }
    bool HasTemporary(std::string const& folder) const {
        std::vector<std::string> const names = List(folder);
        return std::any_of(names.begin(), names.end(),
                           [](std::string const& name) { return name[0] == '.'; });
    }
    void EmptyFolder() const {
        std::filesystem::remove_all(mFolder / "out");
        std::filesystem::create_directory(mFolder / "out");
    }
    int CountFiles() const { return static_cast<int>(List("out").size()); }

    void ExpectOnlyWholeFiles(bool isKilled) const {
        for (std::string const& name : List("out")) {
            if (isKilled && name[0] == '.') continue;
            std::string const expected = name.substr(0, name.find('.')) + "-expected.mki";
            EXPECT_TRUE(ReadFile("out/" + name) == ReadFile(expected)) << name;
        }
    }

    // Unless the signal came after the work. What has just become whole is not counted yet.
    void ExpectTellsHowFar(ProcessResult const& result, int signal) const {
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
        EXPECT_EQ(result.signal, signal);
    }

    static constexpr int kFiles = 8;
};

TEST_F(InterruptionTest, ASignalThatWasIgnoredStaysIgnored) {
    Save(MakeNoise(1000), "short.mki");
    ProcessOptions options;
    options.ignoredSignal = SIGHUP;
    MokaProcess process(mFolder.string(), Arguments("convert short.mki out.webp"), options);
    ASSERT_TRUE(WaitFor([this] { return HasTemporary("."); }));
    process.Signal(SIGHUP);
    EXPECT_EQ(process.Wait().status, 0);
    EXPECT_THAT(List(), ElementsAre("out.webp", "short.mki"));
}

// Also when it is killed. Several files at once, and one after the other: then nothing is being saved most of the time.
TEST_F(InterruptionTest, AtAnyMomentLeavesOnlyWholeFiles) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "a tool that is being interrupted opens no more files; the sanitizer's checks need some";
#endif
    EmptyFolder();
    std::string inputs;
    // Of different sizes, so that the moments of one file are not those of the next.
    for (int i = 0; i < kFiles; ++i) {
        std::string const name = std::to_string(i);
        Save(MakeNoise(100 + 17 * i), name + ".png");
        Save(MakeNoise(100 + 17 * i), name + "-expected.mki");
        inputs += name + ".png ";
    }
    int halfway = 0;
    for (int i = 0; i < 32; ++i) {
        MokaProcess process(
            mFolder.string(),
            Arguments("convert " + inputs + "--to mki --out out -q --jobs " + (i % 2 == 0 ? "4" : "1")));
        // Every third time in the middle of a save: the end of one is the beginning of the next.
        ASSERT_TRUE(WaitFor([&] {
            int const count = CountFiles();
            return count == kFiles || (count > i / 4 && (i % 3 != 0 || HasTemporary("out")));
        }));
        constexpr int kSignals[] = {SIGKILL, SIGTERM, SIGHUP, SIGINT};
        int const signal = kSignals[i % 4];
        process.Signal(signal);
        ProcessResult const result = process.Wait();
        ExpectTellsHowFar(result, signal);
        halfway += result.signal != 0 && CountFiles() < kFiles;
        ExpectOnlyWholeFiles(signal == SIGKILL);
        EmptyFolder();
    }
    EXPECT_GT(halfway, 0);
}

} // namespace
} // namespace Moka::Testing
