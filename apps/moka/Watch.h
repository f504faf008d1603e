// FileWatch: tells when a file has changed, by looking at its date, size and identity several times a second, which
// works on every file system and with editors that replace a file instead of writing it.
#pragma once

#include <cstdint>
#include <string>
#include <tuple>

namespace Moka::Tool {

class FileWatch {
public:
    explicit FileWatch(std::string path) : mPath(std::move(path)), mLast(Look()) {}

    // Returns when the file is another than at the last call, and has stayed so for a moment, so that nobody reads
    // what is half written. While the file is missing it waits on.
    void WaitForChange();

private:
    using Stamp = std::tuple<std::int64_t, std::int64_t, std::uint64_t, std::uint64_t>; // all 0: no file

    Stamp Look() const;

    std::string mPath;
    Stamp mLast;
};

} // namespace Moka::Tool
