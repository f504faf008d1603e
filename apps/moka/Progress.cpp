#include "apps/moka/Progress.h"

#include <cstdio>
#include <unistd.h>

namespace Moka::Tool {
namespace {

constexpr auto kQuietTime = std::chrono::seconds(1);
constexpr auto kInterval = std::chrono::milliseconds(200);

} // namespace

Progress::Progress(bool enabled) {
    if (enabled && isatty(STDERR_FILENO)) mThread = std::thread([this] { Draw(); });
}

Progress::~Progress() {
    if (!mThread.joinable()) return;
    {
        std::lock_guard const lock(mMutex);
        mDone = true;
    }
    mChanged.notify_one();
    mThread.join();
}

void Progress::EraseLine() {
    if (isatty(STDERR_FILENO)) std::fputs("\r\033[K", stderr);
}

void Progress::Draw() {
    std::unique_lock lock(mMutex);
    if (mChanged.wait_for(lock, kQuietTime, [this] { return mDone; })) return;
    do {
        std::chrono::duration<double> const elapsed = std::chrono::steady_clock::now() - mStart;
        std::fprintf(stderr, "\r\033[K%s, %.1f s", mStage.load(), elapsed.count());
    } while (!mChanged.wait_for(lock, kInterval, [this] { return mDone; }));
    EraseLine();
}

} // namespace Moka::Tool
