// A process that saves is killed at random moments: what lies under a real name is always a whole picture.
#include "tests/support/TestFiles.h"

#include <atomic>
#include <chrono>
#include <filesystem>
#include <gtest/gtest.h>
#include <random>
#include <signal.h>
#include <string>
#include <sys/mman.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

namespace Moka::Testing {
namespace {

constexpr int kSaves = 1000;
constexpr char const* kExtensions[] = {"png", "jpg", "webp", "mki"};

// Seen by parent and child.
struct Shared {
    std::atomic<int> saves{0};
    std::atomic<bool> failed{false};
};

class CrashTest : public ::testing::Test {
protected:
    void SetUp() override {
        void* const memory =
            mmap(nullptr, sizeof(Shared), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        ASSERT_NE(memory, MAP_FAILED);
        shared = new (memory) Shared;
    }
    void TearDown() override { munmap(shared, sizeof(Shared)); }

    std::string Path(int i) const { return folder.Path(std::string("picture.") + kExtensions[i % 4]); }

    // Saves one picture over the other until it is killed.
    [[noreturn]] void SaveForEver() {
        for (int i = 0;; ++i) {
            if (!SaveImage(images[i / 4 % 2], Path(i), 90)) shared->failed = true;
            ++shared->saves;
        }
    }

    void KillSaver(std::chrono::microseconds after) {
        pid_t const child = fork();
        ASSERT_GE(child, 0); // kill would reach every process
        if (child == 0) SaveForEver();
        std::this_thread::sleep_for(after);
        kill(child, SIGKILL);
        int status = 0;
        waitpid(child, &status, 0);
        ASSERT_TRUE(WIFSIGNALED(status));
    }

    // How many of the names there are.
    int ExpectWholePictures() const {
        int found = 0;
        for (int i = 0; i < 4; ++i) {
            if (!std::filesystem::exists(Path(i))) continue;
            Picture const picture = LoadImage(Path(i));
            EXPECT_TRUE((picture.width == 120 && picture.height == 80) ||
                        (picture.width == 200 && picture.height == 150))
                << Path(i);
            ++found;
        }
        return found;
    }
    // Takes them away; how many there were.
    int RemoveTemporaries() const {
        int count = 0;
        for (std::string const& name : folder.List())
            if (std::filesystem::path(name).extension() == ".tmp")
                count += std::filesystem::remove(folder.Path(name));
        return count;
    }

    TempFolder const folder;
    Picture const images[2] = {MakeGradient(120, 80), MakeChecker(200, 150, 7, {9, 9, 9, 9}, {0, 0, 0, 255})};
    Shared* shared = nullptr;
};

TEST_F(CrashTest, KillingAThousandSavesLeavesOnlyWholePictures) {
    constexpr unsigned kShortest = 4000; // microseconds, about a save or two
    std::mt19937 random(3);
    unsigned longest = kShortest;
    int kills = 0;
    int interrupted = 0; // saves that left their temporary file, so were in the middle
    while (shared->saves < kSaves && !HasFailure()) {
        int const before = shared->saves;
        KillSaver(std::chrono::microseconds(300 + random() % longest));
        ++kills;
        // Where saves are slower than that, one must come to its end now and then.
        longest = shared->saves == before ? 2 * longest : kShortest;
        ExpectWholePictures();
        interrupted += RemoveTemporaries();
    }
    EXPECT_EQ(ExpectWholePictures(), 4);
    EXPECT_FALSE(shared->failed);
    EXPECT_GT(interrupted, 0);
    RecordProperty("saves", shared->saves);
    RecordProperty("kills", kills);
    RecordProperty("interrupted", interrupted);
}

} // namespace
} // namespace Moka::Testing
