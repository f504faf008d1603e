#include "apps/notebook/Frames.h"

#include "apps/notebook/AllocationCount.h"
#include "moka/graphics/task/WorkerTask.h"

#include <algorithm>
#include <cstdio>

namespace Moka::Notebook {
namespace {

constexpr double kMillisecond = 1e6;

double ToMilliseconds(std::int64_t nanoseconds) { return static_cast<double>(nanoseconds) / kMillisecond; }

void PrintTimes(char const* what, std::vector<double> times) {
    if (times.empty()) return;
    std::sort(times.begin(), times.end());
    std::printf("%s: %zu, median %.1f ms, p99 %.1f ms, worst %.1f ms\n", what, times.size(),
                times[times.size() / 2], times[times.size() * 99 / 100], times.back());
}

} // namespace

Frames::Frames(RenderThread& queue, bool isCounting, std::function<void()> notify)
    : mQueue(queue), mNotify(std::move(notify)) {
    if (isCounting) mShown.reserve(kMaxFrames);
}

void Frames::Mark(std::uint32_t age) {
    if (mInput == 0) mInput = Trace::GetTime() - std::int64_t{age} * 1'000'000;
}

void Frames::End() {
    mIsInFlight = true;
    if (!WorkerTask::PostMember(&mQueue, this, &Frames::Finish, mBegin, mInput)) mIsInFlight = false;
    mInput = 0;
}

// The render thread runs this when the previous swap has returned.
void Frames::Finish(std::int64_t begin, std::int64_t input) {
    std::int64_t const now = Trace::GetTime();
    Trace::NameTask("frame shown");
    if (input != 0) Trace::Add("notebook", "input to swap", input, now, nullptr, 0);
    if (mShown.size() < mShown.capacity()) mShown.push_back({begin, input, now, CountAllocations()});
    mLast = ToMilliseconds(now - begin);
    mIsInFlight = false;
    mNotify();
}

void Frames::Print() const {
    if (mShown.empty()) return;
    std::printf("start of the window to first frame: %.0f ms\n", ToMilliseconds(mShown[0].end - mStart));
    std::vector<double> frames;
    std::vector<double> inputs;
    for (Shown const& shown : mShown) {
        frames.push_back(ToMilliseconds(shown.end - shown.begin));
        if (shown.input != 0) inputs.push_back(ToMilliseconds(shown.end - shown.input));
    }
    PrintTimes("frames, from their beginning to the swap's end", std::move(frames));
    PrintTimes("input, from the event to the swap's end", std::move(inputs));
    std::size_t const warm = mShown.size() / 2;
    std::printf("allocations on the render thread: %llu in all, %llu in the last %zu frames\n",
                static_cast<unsigned long long>(mShown.back().allocations),
                static_cast<unsigned long long>(mShown.back().allocations - mShown[warm].allocations),
                mShown.size() - 1 - warm);
}

} // namespace Moka::Notebook
