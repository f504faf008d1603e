// Every file operation of loading and saving fails in turn: the disk is full, broken or forbidden.
#include "tests/trust/FileFaults.h"

#include "moka/base/log/AndroidLog.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <cerrno>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using Mode = FileFaults::Mode;
constexpr Mode kFailing[] = {Mode::Fail, Mode::FailAll};
constexpr int kErrors[] = {ENOSPC, EACCES, EIO};

class FileFault : public ::testing::TestWithParam<char const*> {
protected:
    bool Save(Picture const& image) const { return SaveImage(image, mPath, 90); }
    Picture Load() const { return LoadImage(mPath); }
    std::string ReadFile() const { return Testing::ReadFile(mPath); }
    // The picture, and no temporary file beside it.
    bool IsAlone() const { return mFolder.List().size() == 1; }
    template <class Action>
    static int Disturb(Mode mode, int k, int error, Action const& action) {
        FileFaults::Arm(mode, k, error);
        action();
        return FileFaults::Disarm();
    }

    // Large enough for several blocks of any codec.
    Picture const mOld = MakeChecker(90, 70, 5, {255, 0, 0, 255}, {0, 0, 255, 255});
    Picture const mNew = MakeGradient(300, 200);
    LogCapture mLog;

private:
    TempFolder const mFolder;
    std::string const mPath = mFolder.Path(std::string("picture.") + GetParam());
};

TEST_P(FileFault, ASaveShowsTheOldFileOrTheWholeNewOne) {
    ASSERT_TRUE(Save(mNew));
    std::string const newBytes = ReadFile();
    ASSERT_TRUE(Save(mOld));
    std::string const oldBytes = ReadFile();
    int const count = Disturb(Mode::Fail, 0, 0, [&] { ASSERT_TRUE(Save(mNew)); });
    ASSERT_GE(count, 5); // made, written, flushed, closed, renamed
    // The file is on the disk before it takes the name, and the folder after.
    EXPECT_THAT(FileFaults::GetCalls(), ::testing::EndsWith(" fsync close rename open fsync close "));
    int failures = 0;
    for (Mode const mode : kFailing)
        for (int const error : kErrors)
            for (int k = 1; k <= count; ++k) {
                SCOPED_TRACE(std::to_string(k) + " of " + std::to_string(count) + " error " +
                             std::to_string(error));
                ASSERT_TRUE(Save(mOld));
                mLog.Clear();
                bool isSaved = false;
                Disturb(mode, k, error, [&] { isSaved = Save(mNew); });
                EXPECT_EQ(ReadFile() == newBytes, isSaved);
                EXPECT_EQ(ReadFile() == oldBytes, !isSaved);
                EXPECT_EQ(mLog.Count(ANDROID_LOG_ERROR), isSaved ? 0 : 1);
                EXPECT_TRUE(IsAlone());
                if (!isSaved) ++failures;
            }
    RecordProperty("faults", failures);
    EXPECT_GE(failures, 5 * 6);
}

TEST_P(FileFault, ALoadGivesTheWholePictureOrNothing) {
    ASSERT_TRUE(Save(mNew));
    Picture const pixels = Load();
    ASSERT_FALSE(pixels.pixels.empty());
    int const count = Disturb(Mode::Fail, 0, 0, [&] { Load(); });
    int failures = 0;
    for (Mode const mode : {Mode::Fail, Mode::FailAll, Mode::Truncate})
        for (int k = 1; k <= count; ++k) {
            SCOPED_TRACE(std::to_string(k) + " of " + std::to_string(count));
            mLog.Clear();
            Picture loaded;
            Disturb(mode, k, EIO, [&] { loaded = Load(); });
            EXPECT_TRUE(loaded.pixels.empty() || loaded == pixels);
            EXPECT_EQ(mLog.Count(ANDROID_LOG_ERROR), loaded.pixels.empty() ? 1 : 0);
            if (loaded.pixels.empty()) ++failures;
        }
    RecordProperty("faults", failures);
    EXPECT_GE(failures, 4);
    EXPECT_EQ(Load(), pixels);
}

TEST_P(FileFault, ShortAndInterruptedReadsAndWritesChangeNothing) {
    ASSERT_TRUE(Save(mNew));
    std::string const bytes = ReadFile();
    Picture const pixels = Load();
    ASSERT_TRUE(Save(mOld));
    bool isSaved = false;
    Disturb(Mode::Short, 0, 0, [&] { isSaved = Save(mNew); });
    EXPECT_TRUE(isSaved);
    EXPECT_EQ(ReadFile(), bytes);
    Picture loaded;
    Disturb(Mode::Short, 0, 0, [&] { loaded = Load(); });
    EXPECT_EQ(loaded, pixels);
}

INSTANTIATE_TEST_SUITE_P(Of, FileFault, ::testing::Values("png", "jpg", "webp", "mki"),
                         [](auto const& format) { return std::string(format.param); });

} // namespace
} // namespace Moka::Testing
