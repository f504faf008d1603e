// LogCollector: keeps the library's log off the terminal for its scope and turns its errors into a Failure.
// The GPU's failures are error lines alone; so whoever used it asks here whether there was one. With several
// files in work at once, a line belongs to the file that the thread which logged it was at.
// Thread:  lines from any thread; asked by any.
#pragma once

#include "moka/base/log/LogSink.h"

#include <deque>
#include <mutex>
#include <string>
#include <thread>

namespace Moka::Tool {

class LogCollector {
public:
    // With verbose every line is written to stderr as well, and names files.
    explicit LogCollector(bool verbose);
    ~LogCollector();
    LogCollector(LogCollector const&) = delete;
    LogCollector& operator=(LogCollector const&) = delete;

    // The first error since Clear(), which is the cause where others follow from it; empty without one.
    std::string GetError() const;
    void Clear();

    // The first error that the calling thread logged, of the last few hundred; all of its errors are then
    // forgotten. Allocates nothing.
    std::string TakeOwnError();

    // Throws the first error, if there is one.
    void ThrowError() const;
    // Throws the first error, or fallback when nothing was logged.
    [[noreturn]] void Throw(std::string const& fallback) const;

private:
    struct Error {
        std::string text;
        std::thread::id thread;
    };

    void OnLine(LogLine const& line);

    bool const mVerbose;
    std::mutex mutable mMutex;
    std::string mFirst;
    std::deque<Error> mErrors;
    LogSink mPrevious;
};

} // namespace Moka::Tool
