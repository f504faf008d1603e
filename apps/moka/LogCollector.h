// LogCollector: collects the library's log for its scope, instead of printing it, and converts errors to
// Failure. GPU errors are only logged, so commands check here whether there was one. If several files are
// converted at once, the thread that logged a line determines its file.
// Thread:  any.
#pragma once

#include "moka/base/log/LogSink.h"

#include <deque>
#include <mutex>
#include <string>
#include <thread>

namespace Moka::Tool {

class LogCollector {
public:
    // If verbose is true, every line is also printed to stderr, and log lines contain the names of files.
    explicit LogCollector(bool verbose);
    ~LogCollector();
    LogCollector(LogCollector const&) = delete;
    LogCollector& operator=(LogCollector const&) = delete;

    // The first error since Clear(), because later ones may be consequences of it; empty if there is none.
    std::string GetError() const;
    void Clear();

    // Returns the first error that the calling thread has logged, among the last few hundred, and removes all
    // of its errors. Allocates nothing.
    std::string TakeOwnError();

    // Throws the first error, if there is one.
    void ThrowError() const;
    // Throws the first error, or fallback if there is none.
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
