// Parts of programs that no run shows: the comparison of the demonstration, which of several errors is told, and the line
// of progress on a terminal.
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "apps/samples/Compare.h"
#include "moka/base/log/AndroidLog.h"
#include "tests/app/ToolTest.h"

#include <pty.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using SamplesTest = ToolTest;

TEST_F(SamplesTest, ComparesEveryPixel) {
    Picture image = MakeGradient(30, 20);
    Save(image, "a.png");
    Save(image, "same.mki");
    image.SetColor(0, 0, {9, 9, 9, 255});
    image.SetColor(28, 19, {9, 9, 9, 255});
    Save(image, "b.png");
    Save(MakeGradient(20, 30), "turned.png");
    EXPECT_EQ(Samples::Compare(Path("a.png"), Path("same.mki")).differing, 0);
    EXPECT_EQ(Samples::Compare(Path("a.png"), Path("b.png")).differing, 2);
    EXPECT_FALSE(Samples::Compare(Path("a.png"), Path("turned.png")).isSameSize);
    EXPECT_FALSE(Samples::Compare(Path("a.png"), Path("none.png")).isRead);
}

TEST_F(SamplesTest, OfTwoErrorsTheFirstIsTheCause) {
    Tool::LogCollector const log(false);
    for (char const* const text : {"the cause", "a consequence"})
        __android_log_print(ANDROID_LOG_ERROR, "test", "%s", text);
    EXPECT_EQ(log.GetError(), "the cause");
}

TEST_F(SamplesTest, ATerminalShowsHowManyFilesAreDoneAndIsCleanAtTheEnd) {
    int own = -1;
    int other = -1;
    if (openpty(&own, &other, nullptr, nullptr, nullptr) != 0) GTEST_SKIP() << "is /dev/pts mounted?";
    int const stderrOfTest = dup(STDERR_FILENO);
    dup2(other, STDERR_FILENO);
    {
        Tool::Progress progress(Tool::Progress::Line);
        progress.SetCount(9, 10);
        std::this_thread::sleep_for(
            std::chrono::milliseconds(1100)); // work of less than a second shows nothing
    }
    dup2(stderrOfTest, STDERR_FILENO);
    // A terminal delivers its output in several reads; they end once its other side is closed.
    for (int const file : {other, stderrOfTest}) close(file);
    std::string text;
    char shown[512];
    for (ssize_t bytes = 0; (bytes = read(own, shown, sizeof(shown))) > 0;)
        text.append(shown, static_cast<std::size_t>(bytes));
    close(own);
    EXPECT_THAT(text,
                ::testing::MatchesRegex("(\r.\\[Kconvert  9/10  90%  [0-9.]+ files/s  0:00 left)+\r.\\[K"));
}

} // namespace
} // namespace Moka::Testing
