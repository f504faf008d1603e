// Tests the files of a page after saves, autosaves, kills and failures.
#include "apps/notebook/Document.h"
#include "tests/support/TestFiles.h"
#include "tests/unit/notebook/NotebookObjects.h"

#include <atomic>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using ::testing::HasSubstr;

class NotebookStoreTest : public ::testing::Test {
protected:
    NotebookStoreTest() { setenv("XDG_STATE_HOME", mFolder.Path("state").c_str(), 1); }

    // A document as in the window; its messages are appended to mTold.
    std::unique_ptr<Document> Open(std::string const& path) {
        auto document = std::make_unique<Document>(
            Document::Callbacks{[](Splice const&) {}, [] {},
                                [this](std::string const& text, bool) { mTold += text + '\n'; }, [] {}},
            0);
        document->Open(path);
        return document;
    }
    // Copies the current files and opens the copy, as after a kill.
    Objects OpenCopy() {
        std::string const folder = mFolder.Path("copy");
        std::filesystem::remove_all(folder);
        std::filesystem::create_directory(folder);
        std::error_code isMissing;
        for (std::string const& file : {mPath, mJournal}) std::filesystem::copy(file, folder, isMissing);
        return Open(folder + "/p.json")->GetPage().GetObjects();
    }
    static void Autosave(Document& document) {
        while (document.Tick(0) >= 0 || document.IsBusy()) {
        }
        document.Tick(0);
    }

    TempFolder mFolder;
    std::string mTold;
    std::string const mPath = mFolder.Path("p.json");
    std::string const mJournal = mPath + ".journal";
};

TEST_F(NotebookStoreTest, AnAutosaveAppendsTheChangesAndAKillLosesNone) {
    auto const document = Open(mPath);
    Page& page = document->GetPage();
    for (int i = 0; i < 3; ++i) page.Append(MakeDash(1, static_cast<float>(i)));
    page.Undo();
    page.Replace(0, {MakeDash(2, 2), MakeDash(3, 3)});
    Autosave(*document);
    EXPECT_TRUE(AreSame(OpenCopy(), page.GetObjects()));
    std::uintmax_t const size = std::filesystem::file_size(mJournal);
    page.Append(MakeDash(4, 4));
    Autosave(*document);
    EXPECT_LT(std::filesystem::file_size(mJournal) - size, 200u)
        << "the journal grew by more than one stroke";
    EXPECT_TRUE(AreSame(OpenCopy(), page.GetObjects()));
    document->Save(nullptr);
    EXPECT_TRUE(document->Close());
    EXPECT_FALSE(std::filesystem::exists(mJournal));
    EXPECT_TRUE(AreSame(OpenCopy(), page.GetObjects()));
    EXPECT_EQ(mTold, "saved " + mPath + "\n");
}

// The page can be edited further from each of these states.
TEST_F(NotebookStoreTest, AJournalTruncatedAtAnyByteRestoresAnEarlierState) {
    std::vector<Objects> states{{}};
    {
        auto const document = Open(mPath);
        for (int i = 0; i < 4; ++i) {
            document->GetPage().Append(MakeDash(1, static_cast<float>(i)));
            states.push_back(document->GetPage().GetObjects());
        }
        Autosave(*document);
    }
    std::string const whole = ReadFile(mJournal);
    std::size_t last = 0;
    for (std::size_t size = 0; size <= whole.size(); size += 13) {
        WriteFile(mJournal, whole.substr(0, size));
        Objects const objects = OpenCopy();
        std::size_t const count = objects.size();
        ASSERT_TRUE(AreSame(objects, states.at(count))) << size;
        EXPECT_GE(count, last);
        last = count;
    }
    EXPECT_GE(last, 3u);
    WriteFile(mJournal, whole.substr(0, whole.size() - 5));
    auto const document = Open(mPath);
    document->GetPage().Append(MakeDash(9, 9));
    Autosave(*document);
    EXPECT_TRUE(AreSame(OpenCopy(), document->GetPage().GetObjects()));
    EXPECT_EQ(mTold, "");
}

TEST_F(NotebookStoreTest, AJournalLeftByAnInterruptedSaveIsNotAppliedTwice) {
    auto document = Open(mPath);
    document->GetPage().Append(MakeDash(1, 1));
    Autosave(*document);
    std::string const journal = ReadFile(mJournal);
    document->Save(nullptr);
    ASSERT_TRUE(document->Close());
    std::string const page = ReadFile(mPath);
    // A save appends the fingerprint of the new page to the journal, replaces the page, and deletes the journal.
    document->GetPage().Append(MakeDash(2, 2));
    Autosave(*document);
    std::string const second = ReadFile(mJournal);
    std::string const base = second.substr(std::string("continues ").size(), 16);
    WriteFile(mJournal, journal + "saved " + base + "\n");
    EXPECT_EQ(OpenCopy().size(), 1u);
    WriteFile(mJournal, journal);
    WriteFile(mPath, page + "\n");
    mTold.clear();
    document.reset();
    EXPECT_EQ(Open(mPath)->GetPage().GetObjects().size(), 1u);
    EXPECT_THAT(mTold, HasSubstr("kept as " + mJournal + ".kept"));
    EXPECT_EQ(ReadFile(mJournal + ".kept"), journal);
}

TEST_F(NotebookStoreTest, APageThatWasNotReadCompletelyIsSavedOnlyUnderANewName) {
    {
        auto const document = Open(mPath);
        for (int i = 0; i < 3; ++i) document->GetPage().Append(MakeDash(1, static_cast<float>(i)));
        EXPECT_TRUE(document->Close());
    }
    std::string broken = ReadFile(mPath);
    broken.replace(broken.rfind("DrawStroke"), 10, "DrawCircle");
    WriteFile(mPath, broken);
    mTold.clear();
    auto document = Open(mPath);
    EXPECT_THAT(mTold, HasSubstr("save"));
    EXPECT_EQ(document->GetPage().GetObjects().size(), 2u);
    document->GetPage().Append(MakeDash(7, 7));
    EXPECT_FALSE(document->Save(nullptr));
    std::string const elsewhere = mFolder.Path("new.json");
    EXPECT_TRUE(document->Save(&elsewhere));
    EXPECT_TRUE(document->Close());
    EXPECT_EQ(ReadFile(mPath), broken);
    EXPECT_EQ(document->GetPath(), elsewhere);
    EXPECT_FALSE(document->MustRename());
    document.reset();
    EXPECT_EQ(Open(elsewhere)->GetPage().GetObjects().size(), 3u);
    EXPECT_EQ(Document::GetLastPath(), elsewhere);
}

// Hours of drawing and undoing must not fill the disk.
TEST_F(NotebookStoreTest, AJournalIsReplacedBeforeItIsMuchLongerThanThePage) {
    auto const document = Open(mPath);
    document->GetPage().Append(MakeDash(1, 1));
    document->Save(nullptr);
    document->GetPage().Append(MakeDash(2, 2));
    for (int i = 0; i < 7; ++i) { // 1 MB each
        document->GetPage().Append(MakeStroke(InkPoints(40'000, {10'000.25f, 10'000.25f, 10.25f})));
        document->GetPage().Undo();
        Autosave(*document);
    }
    EXPECT_LT(std::filesystem::file_size(mJournal), 3'000'000u);
    EXPECT_TRUE(AreSame(OpenCopy(), document->GetPage().GetObjects()));
}

TEST_F(NotebookStoreTest, APageOpensInASecondWindowOnlyAfterTheFirstHasClosedIt) {
    auto first = Open(mPath);
    first->GetPage().Append(MakeDash(1, 1));
    auto const second = Open(mFolder.Path("other.json"));
    second->GetPage().Append(MakeDash(2, 2));
    EXPECT_FALSE(second->Open(mPath));
    EXPECT_THAT(mTold, HasSubstr("p.json is open in another window"));
    EXPECT_FALSE(second->Save(&mPath));
    EXPECT_EQ(second->GetPath(), mFolder.Path("other.json"));
    EXPECT_TRUE(first->Close());
    first.reset();
    EXPECT_TRUE(second->Open(mPath));
    EXPECT_TRUE(AreSame(second->GetPage().GetObjects(), {MakeDash(1, 1)}));
    EXPECT_EQ(Open(mFolder.Path("other.json"))->GetPage().GetObjects().size(), 1u) << "its own was saved";
}

// A folder with the name of the file makes the write fail for every user, including root.
TEST_F(NotebookStoreTest, AFailedSaveIsReportedAndLosesNothing) {
    auto const document = Open(mPath);
    document->GetPage().Append(MakeDash(1, 1));
    std::filesystem::create_directories(mJournal + "/x");
    Autosave(*document);
    EXPECT_THAT(mTold, HasSubstr("cannot autosave to " + mJournal));
    WriteFile(mFolder.Path("file"), "");
    for (char const* const name : {"none/such/folder.json", "file/in-no-folder.json"}) {
        std::string const to = mFolder.Path(name);
        document->Save(&to);
        EXPECT_FALSE(document->Close());
        EXPECT_THAT(mTold, HasSubstr("cannot save " + to));
    }
    EXPECT_TRUE(document->HasUnsaved());
    EXPECT_EQ(document->GetPath(), mPath);
    std::filesystem::remove_all(mJournal);
    document->GetPage().Append(MakeDash(2, 2));
    Autosave(*document);
    EXPECT_EQ(OpenCopy().size(), 2u) << "the next autosave did not append the changes again";
    std::filesystem::create_directories(mPath + "/x");
    document->Save(nullptr);
    EXPECT_FALSE(document->Close());
}

// Adds strokes without a pause, and stores after each save and autosave how many are on the disk.
[[noreturn]] void WriteUntilKilled(Document& document, std::atomic<int>& kept) {
    for (int count = 1;; ++count) {
        document.GetPage().Append(MakeDash(1, static_cast<float>(count)));
        if (count % 5 != 0) continue;
        if (count % 35 == 0)
            document.Save(nullptr);
        else
            document.Tick(0), document.Tick(0);
        while (document.IsBusy()) usleep(100);
        kept = count;
    }
}

TEST_F(NotebookStoreTest, TwentyKillsAfter100MillisecondsLoseNothingThatWasWritten) {
    void* const shared =
        mmap(nullptr, sizeof(std::atomic<int>), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    auto& kept = *new (shared) std::atomic<int>;
    int most = 0;
    for (int kill = 0; kill < 20; ++kill) {
        for (std::string const& file : {mPath, mJournal}) std::filesystem::remove(file);
        kept = 0;
        pid_t const child = fork();
        if (child == 0) WriteUntilKilled(*Open(mPath), kept);
        usleep(100'000);
        ::kill(child, SIGKILL);
        waitpid(child, nullptr, 0);
        Objects const found = OpenCopy();
        EXPECT_EQ(mTold, "");
        ASSERT_GE(found.size(), static_cast<std::size_t>(kept));
        for (std::size_t i = 0; i < found.size(); ++i)
            ASSERT_TRUE(AreSame({found[i]}, {MakeDash(1, static_cast<float>(i + 1))})) << i;
        most = std::max<int>(most, kept);
    }
    EXPECT_GT(most, 0) << "no child reached its first autosave";
    munmap(shared, sizeof(kept));
}

} // namespace
} // namespace Moka::Testing
