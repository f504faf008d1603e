// Measures the loader's queue: requests with an empty decode, compared with a plain thread and queue;
// queueing and cancelling many requests; and the latency of a cancel while a picture is being decoded. Log
// lines, about ten for each request, are formatted and dropped.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/base/log/LogSink.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "tests/support/TestImages.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdlib>
#include <deque>
#include <filesystem>
#include <functional>
#include <future>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <unistd.h>

namespace Moka::Bench {
namespace {

using Clock = std::chrono::steady_clock;

template <class Function>
double Seconds(Function const& function) {
    auto const start = Clock::now();
    function();
    return std::chrono::duration<double>(Clock::now() - start).count();
}

double Quantile(std::vector<double> values, double q) {
    auto const at = static_cast<std::size_t>(q * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(at), values.end());
    return values[at];
}

void StartOnce() {
    static bool const started = [] {
        SetLogSink([](LogLine const&) {});
        return BitmapLoader::startEventLoopBySelf();
    }();
    if (!started) std::abort();
}

// The simplest loader: a deque of jobs with a mutex, and a notification for each job.
class PlainLoader {
public:
    using Callback = std::function<void(int id, String const& path)>;

    explicit PlainLoader(Callback callback) : mCallback(std::move(callback)), mThread([this] { Run(); }) {}
    ~PlainLoader() {
        Push({-1, {}});
        mThread.join();
    }
    void Request(int id, String const& path) { Push({id, path}); }

private:
    struct Job {
        int id;
        String path;
    };
    void Push(Job job) {
        {
            std::lock_guard<std::mutex> const lock(mMutex);
            mJobs.push_back(std::move(job));
        }
        mChanged.notify_one();
    }
    void Run() {
        for (;;) {
            std::unique_lock<std::mutex> lock(mMutex);
            mChanged.wait(lock, [this] { return !mJobs.empty(); });
            Job const job = std::move(mJobs.front());
            mJobs.pop_front();
            lock.unlock();
            if (job.id < 0) return;
            mCallback(job.id, job.path);
        }
    }

    Callback mCallback;
    std::mutex mMutex;
    std::condition_variable mChanged;
    std::deque<Job> mJobs;
    std::thread mThread;
};

// Lets a thread wait until something has been called a number of times.
class Countdown {
public:
    void Reset(int count) { mLeft = count; }
    void Count() {
        if (--mLeft > 0) return;
        std::lock_guard<std::mutex> const lock(mMutex);
        mChanged.notify_one();
    }
    void Wait() {
        std::unique_lock<std::mutex> lock(mMutex);
        mChanged.wait(lock, [this] { return mLeft <= 0; });
    }

private:
    std::atomic<int> mLeft{0};
    std::mutex mMutex;
    std::condition_variable mChanged;
};

// An empty path fails before a file is opened, so the decode costs nearly nothing.
void RequestsThroughAnEmptyDecode(benchmark::State& state) {
    StartOnce();
    constexpr int kRequests = 5000;
    Countdown left;
    BitmapLoader::Callback callback;
    callback.onLoadError = [&](int, String const&) { left.Count(); };
    BitmapLoader loader("bench", &callback);
    PlainLoader plain([&](int, String const&) { left.Count(); });
    String const path;
    std::vector<double> ours;
    std::vector<double> theirs;
    for (auto _ : state) {
        left.Reset(kRequests);
        ours.push_back(Seconds([&] {
            for (int id = 0; id < kRequests; ++id) loader.RequestLoad(id, path, nullptr);
            left.Wait();
        }));
        BitmapLoader::WaitUntilMsgQueueRequired();
        left.Reset(kRequests);
        theirs.push_back(Seconds([&] {
            for (int id = 0; id < kRequests; ++id) plain.Request(id, path);
            left.Wait();
        }));
        state.SetIterationTime(ours.back());
    }
    state.counters["requests_per_s"] = kRequests / Quantile(ours, 0.5);
    state.counters["plain_requests_per_s"] = kRequests / Quantile(theirs, 0.5);
}
BENCHMARK(RequestsThroughAnEmptyDecode)->Iterations(20)->UseManualTime()->Unit(benchmark::kMillisecond);

// Blocks the loader's thread in a callback, so that later requests stay queued.
class HeldLoop {
public:
    HeldLoop() {
        BitmapLoader::Callback callback;
        callback.onLoadError = [this](int, String const&) {
            mEntered.set_value();
            mLeave.get_future().wait();
        };
        mLoader = std::make_unique<BitmapLoader>(nullptr, &callback);
        mLoader->RequestLoad(0, String(), nullptr);
        mEntered.get_future().wait();
    }
    ~HeldLoop() { Release(); }
    HeldLoop(HeldLoop const&) = delete;
    HeldLoop& operator=(HeldLoop const&) = delete;

    void Release() {
        if (!std::exchange(mReleased, true)) mLeave.set_value();
    }

private:
    bool mReleased = false;
    std::promise<void> mEntered;
    std::promise<void> mLeave;
    std::unique_ptr<BitmapLoader> mLoader;
};

// Queues many requests of one or two listeners alternately, then cancels all of the first one.
void QueueAndCancelAll(benchmark::State& state) {
    StartOnce();
    auto const requests = static_cast<int>(state.range(0));
    auto const listeners = static_cast<int>(state.range(1));
    String const path("/a/folder/of/pictures/with a name of usual length.jpg");
    std::vector<double> queueing;
    std::vector<double> cancelling;
    for (auto _ : state) {
        HeldLoop const held;
        BitmapLoader first(nullptr, nullptr);
        BitmapLoader second(nullptr, nullptr);
        queueing.push_back(Seconds([&] {
            for (int id = 0; id < requests; ++id)
                (id % listeners == 0 ? first : second).RequestLoad(id, path, nullptr);
        }));
        cancelling.push_back(Seconds([&] { first.CancelAllLoadRequest(); }));
        state.SetIterationTime(cancelling.back());
    }
    state.counters["queueing_ms"] = Quantile(queueing, 0.5) * 1e3;
    state.counters["queueing_us_each"] = Quantile(queueing, 0.5) * 1e6 / requests;
    state.counters["cancel_all_ms"] = Quantile(cancelling, 0.5) * 1e3;
}
BENCHMARK(QueueAndCancelAll)
    ->ArgNames({"requests", "listeners"})
    ->ArgsProduct({{10000, 100000}, {1, 2}})
    ->Iterations(7)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);

class PictureFile {
public:
    PictureFile() {
        Testing::Picture image = Testing::MakeInkPage(2048, 2048);
        Bitmap bitmap;
        bitmap.Construct(image.pixels.data(), image.width, image.height, image.GetStride(), 1, false, false);
        if (!BitmapFactory::SaveBitmap(&bitmap, &mPath, 100)) std::abort();
    }
    ~PictureFile() { std::filesystem::remove(mPath.ToUtf8()); }
    PictureFile(PictureFile const&) = delete;
    PictureFile& operator=(PictureFile const&) = delete;
    String const& GetPath() const { return mPath; }

private:
    String const mPath{
        (std::filesystem::temp_directory_path() / ("moka_loader_bench_" + std::to_string(getpid()) + ".png"))
            .string()};
};

// Measures how long cancelling a load blocks the caller, while the load is being decoded and others are
// queued.
void CancelWhileDecoding(benchmark::State& state) {
    StartOnce();
    static PictureFile const picture;
    auto const queued = static_cast<int>(state.range(0));
    BitmapLoader others(nullptr, nullptr);
    BitmapLoader loader("bench", nullptr);
    std::vector<double> latencies;
    std::vector<double> decodes;
    for (auto _ : state) {
        HeldLoop held;
        loader.RequestLoad(1, picture.GetPath(), nullptr);
        for (int id = 0; id < queued; ++id) others.RequestLoad(id, String(), nullptr);
        held.Release();
        std::this_thread::sleep_for(std::chrono::milliseconds(5)); // until it decodes
        latencies.push_back(Seconds([&] { loader.CancelLoadRequest(1); }));
        others.CancelAllLoadRequest();
        decodes.push_back(Seconds([] { BitmapLoader::WaitUntilMsgQueueRequired(); }));
        state.SetIterationTime(latencies.back());
    }
    state.counters["median_us"] = Quantile(latencies, 0.5) * 1e6;
    state.counters["p95_us"] = Quantile(latencies, 0.95) * 1e6;
    state.counters["rest_of_decode_ms"] = Quantile(decodes, 0.5) * 1e3;
}
BENCHMARK(CancelWhileDecoding)
    ->ArgName("queued")
    ->Arg(0)
    ->Arg(100000)
    ->Iterations(20)
    ->UseManualTime()
    ->Unit(benchmark::kMicrosecond);

} // namespace
} // namespace Moka::Bench
