#include "apps/moka/Progress.h"

#include "apps/moka/Failure.h"

#include <cmath>
#include <cstdio>
#include <unistd.h>

namespace Moka::Tool {
namespace {

constexpr auto kQuietTime = std::chrono::seconds(1);
constexpr auto kInterval = std::chrono::milliseconds(200);

std::string DescribeCount(int done, int total, double seconds) {
    char text[120];
    if (done == 0) {
        std::snprintf(text, sizeof(text), "convert  0/%d, %.1f s", total, seconds);
        return text;
    }
    // Estimates the remaining time from the number of files.
    long long const left = std::llround(seconds / done * (total - done));
    std::snprintf(text, sizeof(text), "convert  %d/%d  %d%%  %.1f files/s  %lld:%02lld left", done, total,
                  static_cast<int>(done * 100LL / total), done / seconds, left / 60, left % 60);
    return text;
}

} // namespace

Progress::Progress(Kind kind) : mKind(kind) {
    if (kind == Line && isatty(STDERR_FILENO)) mThread = std::thread([this] { Draw(); });
}

Progress::~Progress() {
    if (mTotalCount == 0) TellStage();
    if (!mThread.joinable()) return;
    {
        std::lock_guard const lock(mMutex);
        mDone = true;
    }
    mChanged.notify_one();
    mThread.join();
}

void Progress::SetStage(char const* stage) {
    TellStage();
    mStage = stage;
    mStageStart = Clock::now();
}

void Progress::Tell(std::string const& what) const {
    if (mKind == Verbose) PrintError(what);
}

void Progress::TellStage() {
    if (mKind != Verbose) return;
    char text[80];
    std::chrono::duration<double> const elapsed = Clock::now() - mStageStart;
    std::snprintf(text, sizeof(text), "%s took %.3f s", mStage.load(), elapsed.count());
    Tell(text);
}

void Progress::EraseLine() {
    if (isatty(STDERR_FILENO)) std::fputs("\r\033[K", stderr);
}

std::string Progress::Describe() const {
    std::chrono::duration<double> const elapsed = Clock::now() - mStart;
    if (mTotalCount > 0) return DescribeCount(mDoneCount, mTotalCount, elapsed.count());
    char text[80];
    std::snprintf(text, sizeof(text), "%s, %.1f s", mStage.load(), elapsed.count());
    return text;
}

void Progress::Draw() {
    std::unique_lock lock(mMutex);
    if (mChanged.wait_for(lock, kQuietTime, [this] { return mDone; })) return;
    do {
        std::fprintf(stderr, "\r\033[K%s", Describe().c_str());
    } while (!mChanged.wait_for(lock, kInterval, [this] { return mDone; }));
    EraseLine();
}

} // namespace Moka::Tool
