#include "tests/app/ToolTest.h"

#include <algorithm>
#include <csignal>
#include <random>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::MatchesRegex;

class InterruptionTest : public ToolTest {
protected:
    // Of random colours, which give an encoder work.
    void SaveNoise(int side, std::string const& name) const {
        Picture image(side, side);
        std::minstd_rand random;
        for (unsigned char& byte : image.pixels) byte = static_cast<unsigned char>(random() >> 8);
        for (std::size_t i = 3; i < image.pixels.size(); i += 4) image.pixels[i] = 255;
        Save(image, name);
    }
    bool HasTemporary(std::string const& folder) const {
        std::vector<std::string> const names = List(folder);
        return !names.empty() && names[0][0] == '.';
    }
    int CountFiles() const { return static_cast<int>(List("out").size()); }
};

TEST_F(InterruptionTest, ASignalThatWasIgnoredStaysIgnored) {
    SaveNoise(1000, "short.mki");
    MokaProcess process = Start("convert short.mki out.webp", "trap '' HUP;");
    ASSERT_TRUE(Soon([this] { return HasTemporary("."); }));
    process.Signal(SIGHUP);
    EXPECT_EQ(process.Wait().status, 0);
    EXPECT_THAT(List(), ElementsAre("out.webp", "short.mki"));
}

// Also when it is killed. Several files at once, and one after the other: then nothing is being saved most of the time.
TEST_F(InterruptionTest, AtAnyMomentLeavesOnlyWholeFiles) {
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "a tool that is being interrupted opens no more files; the sanitizer's checks need some";
#endif
    constexpr int kFiles = 8;
    // Of different sizes, so that the moments of one file are not those of the next.
    for (int i = 0; i < kFiles; ++i) {
        std::string const name = std::to_string(i);
        SaveNoise(100 + 17 * i, name + ".png");
        SaveNoise(100 + 17 * i, name + "-expected.mki");
    }
    int halfway = 0;
    for (int i = 0; i < 32; ++i) {
        std::filesystem::remove_all(mFolder / "out");
        std::filesystem::create_directory(mFolder / "out");
        std::string const jobs = i % 2 == 0 ? "4" : "1";
        MokaProcess process = Start("convert *.png --to mki --out out -q --jobs " + jobs);
        // Every third time in the middle of a save: the end of one is the beginning of the next.
        ASSERT_TRUE(Soon([&] {
            int const count = CountFiles();
            return count == kFiles || (count > i / 4 && (i % 3 != 0 || HasTemporary("out")));
        }));
        constexpr int kSignals[] = {SIGKILL, SIGTERM, SIGHUP, SIGINT};
        int const signal = kSignals[i % 4];
        process.Signal(signal);
        ProcessResult const result = process.Wait();
        int const count = CountFiles();
        halfway += result.signal != 0 && count < kFiles;
        for (std::string const& name : List("out")) {
            if (signal == SIGKILL && name[0] == '.') continue;
            EXPECT_TRUE(ReadFile("out/" + name) == ReadFile(name.substr(0, name.find('.')) + "-expected.mki"))
                << name;
        }
        // It tells how far it came, unless the signal came after the work. What has just become whole is not
        // counted yet.
        if (signal == SIGKILL) continue;
        EXPECT_TRUE(result.signal == signal || (result.signal == 0 && count == kFiles));
        EXPECT_TRUE(!result.err.empty() || count == kFiles);
        if (result.err.empty()) continue;
        EXPECT_THAT(result.err, MatchesRegex("moka: interrupted; [0-9]+ of 8 images are in out\n"));
        int const told = std::atoi(result.err.c_str() + result.err.find(';') + 1);
        EXPECT_TRUE(told <= count && told >= count - 4) << told << " of " << count;
    }
    EXPECT_GT(halfway, 0);
}

} // namespace
} // namespace Moka::Testing
