// FlushTrace: traces one flush of the draw list, with the number of draws requested since the last flush and
// the number of runs submitted to the driver.
// Thread: render thread.
#pragma once

#include "moka/base/Trace.h"
#include "moka/renderer/device/Counters.h"

namespace Moka::detail {

class FlushTrace {
public:
    explicit FlushTrace(Counters& counters) : mCounters(counters), mRuns(counters.draws) {
        mScope.Set("draws", counters.drawRequests - counters.flushedRequests);
        counters.flushedRequests.Set(counters.drawRequests);
    }
    ~FlushTrace() { mScope.Set("runs", mCounters.draws - mRuns); }
    FlushTrace(FlushTrace const&) = delete;
    FlushTrace& operator=(FlushTrace const&) = delete;

private:
    TraceScope mScope{"renderer", "Flush"};
    Counters& mCounters;
    std::uint64_t const mRuns;
};

} // namespace Moka::detail
