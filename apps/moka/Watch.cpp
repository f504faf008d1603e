#include "apps/moka/Watch.h"

#include <chrono>
#include <sys/stat.h>
#include <thread>

namespace Moka::Tool {
namespace {

constexpr auto kInterval = std::chrono::milliseconds(100);

} // namespace

void FileWatch::WaitForChange() {
    for (Stamp previous = mLast;;) {
        std::this_thread::sleep_for(kInterval);
        Stamp const now = Look();
        if (now != Stamp{} && now != mLast && now == previous) {
            mLast = now;
            return;
        }
        previous = now;
    }
}

FileWatch::Stamp FileWatch::Look() const {
    struct stat status = {};
    if (stat(mPath.c_str(), &status) != 0) return {};
    return {status.st_mtim.tv_sec, status.st_mtim.tv_nsec, static_cast<std::uint64_t>(status.st_size),
            static_cast<std::uint64_t>(status.st_ino)};
}

} // namespace Moka::Tool
