// LogCapture: collects the log lines of its scope instead of having them written to stderr.
// Owner:   the test; the sink that was installed before comes back with the end of the scope.
// Thread:  lines from any thread; asked by any.
#pragma once

#include "moka/base/log/LogSink.h"
#include "tests/support/Awaited.h"

#include <string>
#include <vector>

namespace Moka::Testing {

class LogCapture {
public:
    LogCapture();
    ~LogCapture();
    LogCapture(LogCapture const&) = delete;
    LogCapture& operator=(LogCapture const&) = delete;

    std::vector<LogLine> GetLines() const { return mLines.Get(); }
    // The texts of one priority, or of all; for comparing with what is expected.
    std::vector<std::string> GetTexts(int priority = kAll) const;

    // The lines of a priority whose text contains part.
    int Count(int priority, std::string const& part = {}) const;
    // Whether a line has exactly this text.
    bool Has(std::string const& text) const;
    // The first line with exactly this text, for its tag, format and priority; priority 0 when there is none.
    LogLine Find(std::string const& text) const;

    // Until the lines so far fulfil the condition, which is asked under the lock and must not log.
    template <class Condition>
    void Await(Condition const& condition) const {
        mLines.Await(condition);
    }
    // Until so many lines contain part.
    void AwaitLines(std::string const& part, int count = 1) const;

    void Clear() { mLines.Set({}); }

private:
    static constexpr int kAll = -1;

    Awaited<std::vector<LogLine>> mLines;
    LogSink mPrevious;
};

} // namespace Moka::Testing
