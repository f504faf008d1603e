// Measures the caller's time to allocate, fill and post one drawing task of about 150 bytes, with TaskQueue
// and PlainQueue alternately.
// Time:     the producers' mean time for each post with TaskQueue.
// Counters: the medians over the bursts, their ratio, and how often each consumer slept for each post (1
// means a wake-up
//           for every task).
#include "bench/task/Burst.h"
#include "bench/task/PlainQueue.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/TaskQueue.h"

#include <benchmark/benchmark.h>

#include <algorithm>

namespace Moka::Bench {
namespace {

class PooledQueue final : public TaskQueue {
public:
    void Post(Receiver* receiver, Rectangle const& rectangle, Matrix const& matrix, Paint const& paint) {
        WorkerTask::PostMember(static_cast<IGLMsgQueue*>(this), receiver, &Receiver::Draw, rectangle, matrix,
                               paint);
    }
    void Run() { TaskQueue::Run({}); }
    void Stop() { RequestStop(); }
};

class FirstQueue {
public:
    void Post(Receiver* receiver, Rectangle const& rectangle, Matrix const& matrix, Paint const& paint) {
        mQueue.Post(receiver, &Receiver::Draw, rectangle, matrix, paint);
    }
    void Run() { mQueue.Run(); }
    void Stop() { mQueue.RequestStop(); }

private:
    PlainQueue mQueue;
};

double Median(std::vector<double>& values) {
    auto const middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

void Compare(benchmark::State& state, std::chrono::nanoseconds work) {
    auto const producers = static_cast<int>(state.range(0));
    Burst<PooledQueue> pooled(producers, work);
    Burst<FirstQueue> plain(producers, work);
    std::vector<double> pooledTimes;
    std::vector<double> plainTimes;
    for (int i = 0; i < 10; ++i) { // warms up the allocators
        pooled.Run();
        plain.Run();
    }
    for (auto _ : state) {
        pooledTimes.push_back(pooled.Run());
        plainTimes.push_back(plain.Run());
        state.SetIterationTime(pooledTimes.back() * 1e-9);
    }
    double const pooledTime = Median(pooledTimes);
    double const plainTime = Median(plainTimes);
    state.counters["median_ns"] = pooledTime;
    state.counters["plain_median_ns"] = plainTime;
    state.counters["times_faster"] = plainTime / pooledTime;
    state.counters["wakeups"] = pooled.StopAndCountSleeps();
    state.counters["plain_wakeups"] = plain.StopAndCountSleeps();
}

void PostToConsumerThatSleeps(benchmark::State& state) { Compare(state, {}); }
// Each task takes longer to run than to post, so the consumer falls behind and does not sleep in a burst.
void PostToConsumerThatWorks(benchmark::State& state) { Compare(state, std::chrono::microseconds(1)); }

void Configure(benchmark::internal::Benchmark* benchmark) {
    benchmark->ArgName("producers")->Arg(1)->Arg(2)->Arg(8)->Iterations(300)->UseManualTime();
}
BENCHMARK(PostToConsumerThatSleeps)->Apply(Configure);
BENCHMARK(PostToConsumerThatWorks)->Apply(Configure);

} // namespace
} // namespace Moka::Bench
