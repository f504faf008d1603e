// FileWatch: waits for changes of a file, by checking its date, size and inode several times a second. This
// works on every file system, and with editors that replace the file.
#pragma once

#include <cstdint>
#include <string>
#include <tuple>

namespace Moka::Tool {

class FileWatch {
public:
    explicit FileWatch(std::string path) : mPath(std::move(path)), mLast(Look()) {}

    // Returns when the file has changed since the last call, and has not changed again for a moment, so that
    // it is not read while it is being written. If the file is missing, it keeps waiting.
    void WaitForChange();

private:
    using Stamp = std::tuple<std::int64_t, std::int64_t, std::uint64_t, std::uint64_t>; // all 0: no file

    Stamp Look() const;

    std::string mPath;
    Stamp mLast;
};

} // namespace Moka::Tool
