// Traces: a file that other programs' parsers read, with everything that happened and nothing twice. Traced is the library
// over the device without a driver, as an application's own tests can use it.
#include "moka/base/Trace.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/RenderThread.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <gmock/gmock.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <cmath>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <thread>
#include <vector>

#include <sys/resource.h>

namespace Moka::Testing {
namespace {

using nlohmann::json;
using testing::AllOf;
using testing::Contains;
using testing::HasSubstr;

class Events {
public:
    explicit Events(std::string const& path) {
        std::ifstream file(path);
        for (json const& event : json::parse(file)) {
            if (event.at("ph") == "X") mEvents.push_back(event);
            if (event.at("ph") == "M" && event.at("name") == "thread_name")
                threads.insert(event.at("args").at("name").get<std::string>());
        }
    }

    std::vector<json> Find(char const* category, char const* name) const {
        std::vector<json> found;
        for (json const& event : mEvents) {
            if (event.at("cat") == category && event.at("name") == name) found.push_back(event);
        }
        return found;
    }
    std::int64_t Sum(char const* category, char const* name, char const* argument) const {
        std::int64_t sum = 0;
        for (json const& event : Find(category, name)) {
            sum += event.at("args").at(argument).get<std::int64_t>();
        }
        return sum;
    }

    // In each thread, an event that begins within another ends there.
    void ExpectNested() const {
        // Nanoseconds, the end negative: of two that begin together the longer one is first.
        std::map<int, std::multiset<std::pair<long, long>>> rows;
        for (json const& event : mEvents) {
            long const begin = std::lround(event.at("ts").get<double>() * 1000);
            long const end = begin + std::lround(event.at("dur").get<double>() * 1000);
            EXPECT_TRUE(0 <= begin && begin <= end) << event;
            rows[event.at("tid").get<int>()].emplace(begin, -end);
        }
        EXPECT_EQ(rows.size(), threads.size());
        for (auto const& [id, row] : rows) {
            std::vector<long> ends;
            for (auto const& [begin, end] : row) {
                while (!ends.empty() && ends.back() <= begin) ends.pop_back();
                EXPECT_TRUE(ends.empty() || -end <= ends.back()) << begin << " ns in thread " << id;
                ends.push_back(-end);
            }
        }
    }

    std::multiset<std::string> threads;

private:
    std::vector<json> mEvents;
};

struct Sleeper {
    void Sleep(int milliseconds) {
        Trace::NameTask("Sleep");
        if (milliseconds > 0) std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
    }
};

// Uploads 32 x 32, draws, reads back.
void Work(RenderThread& queue, int rectangles) {
    Picture pixels(32, 32);
    auto const bitmap = NewBitmap(queue, 32, 32, pixels.pixels.data());
    auto const canvas = NewCanvas(queue, bitmap);
    for (int i = 0; i < rectangles; ++i) canvas->DrawRect(0, 0, 8, 8, nullptr);
    canvas->ClearAll(0, 0, 0, 1);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), pixels.pixels.data());
    EXPECT_EQ(pixels.GetColor(31, 31), (Color{0, 0, 0, 255}));
}

class TraceTest : public testing::Test {
protected:
    TempFolder const folder;
    std::string const path = folder.Path("trace.json");
};

TEST_F(TraceTest, TellsOfEveryThreadTaskFlushTransferAndFileOnce) {
    RenderThreadOptions options;
    options.tracePath = path;
    options.limits.maxTextureSize = 32;
    std::string error;
    RendererStatistics statistics;
    {
        auto const queue = RenderThread::Start(options, &error);
        ASSERT_TRUE(queue) << error;
        EXPECT_EQ(queue->GetContextInfo().path, "no driver");
        EXPECT_EQ(queue->GetContextInfo().maxTextureSize, 32);
        EXPECT_TRUE(Trace::IsOn());
        EXPECT_FALSE(Trace::Start(path + "2", &error));
        EXPECT_THAT(error, AllOf(HasSubstr(path), HasSubstr("stop it first")));
        std::vector<std::thread> threads;
        for (int i = 0; i < 3; ++i) threads.emplace_back([&] { Work(*queue, 3000); });
        for (std::thread& thread : threads) thread.join();
        ASSERT_TRUE(SaveImage(Picture(6, 5), folder.Path("image.png")));
        LoadImage(folder.Path("image.png"));
        // In one go, and one of them slow.
        Sleeper sleeper;
        queue->Call([&] {
            for (int const milliseconds : {0, 0, 0, 0, 0, 2, 0, 0, 0, 0, 0, 0}) {
                WorkerTask::PostMember(queue.get(), &sleeper, &Sleeper::Sleep, milliseconds);
            }
        });
        queue->WaitForTasks();
        statistics = RendererFactory::GetStatistics();
    }
    EXPECT_EQ(statistics.drawRequests, 9000u);
    EXPECT_GE(statistics.draws, 3u);
    EXPECT_EQ(statistics.textures + statistics.renderTargets + statistics.graphicsObjects, 0);
    EXPECT_EQ(statistics.errors, 0u);
    EXPECT_FALSE(Trace::IsOn());
    Events const events(path);
    events.ExpectNested();
    EXPECT_THAT(events.threads, Contains("moka-render"));
    EXPECT_EQ(events.threads.size(), 5u); // three, this one, and the render thread
    EXPECT_EQ(events.Sum("task", "DrawRectRT", "count"), 9000);
    EXPECT_EQ(events.Sum("task", "ClearAllRT", "count"), 3);
    EXPECT_EQ(events.Sum("task", "CallTask", "count"), 1);
    EXPECT_EQ(events.Sum("task", "Sleep", "count"), 12);
    for (json const& event : events.Find("task", "Sleep")) {
        bool const isSlow = event.at("dur").get<double>() >= 2000;
        EXPECT_TRUE(!isSlow || event.at("args").at("count") <= 8) << event;
    }
    EXPECT_EQ(events.Sum("renderer", "Flush", "draws"), 9000);
    EXPECT_EQ(events.Sum("renderer", "Flush", "runs"), static_cast<std::int64_t>(statistics.draws));
    EXPECT_EQ(events.Sum("renderer", "Upload", "bytes"), 3 * 32 * 32 * 4);
    EXPECT_EQ(events.Sum("renderer", "ReadPixels", "bytes"), 3 * 32 * 32 * 4);
    EXPECT_GE(events.Find("wait", "WaitForTasks").size(), 3u);
    for (char const* const what : {"save", "load"}) {
        std::vector<json> const files = events.Find("image", what);
        ASSERT_EQ(files.size(), 1u);
        EXPECT_EQ(files[0].at("args"), json::parse(R"({"format": "png", "width": 6, "height": 5})"));
    }
}

// One after the other; each into its own file.
TEST_F(TraceTest, NothingIsLostWhenTheProcessEndsWithoutStopping) {
    auto const run = [this] {
        setenv("MOKA_TRACE", path.c_str(), 1);
        for (int i = 0; i < 2; ++i) Work(*RenderThread::Start({}, nullptr), 100);
        std::thread([] {
            for (std::uint64_t i = 0; i < 10000; ++i) TraceScope("test", "step", "number", i);
        }).join();
        std::int64_t const now = Trace::GetTime();
        Trace::Add("test", "last", now, now, nullptr, 0);
        std::exit(0);
    };
    EXPECT_EXIT(run(), ::testing::ExitedWithCode(0), "");
    Events const events(path);
    events.ExpectNested();
    EXPECT_EQ(events.Sum("test", "step", "number"), 9999 * 10000 / 2);
    EXPECT_EQ(events.Find("test", "last").size(), 1u);
    EXPECT_EQ(events.Sum("task", "DrawRectRT", "count"), 200);
}

TEST_F(TraceTest, WhenTheDiskFillsTheEventsBeforeCanStillBeRead) {
    auto const run = [this] {
        std::signal(SIGXFSZ, SIG_IGN);
        LogCapture const log;
        std::string error;
        if (!Trace::Start(path, &error)) std::exit(2);
        rlimit const limit{700'000, 700'000};
        setrlimit(RLIMIT_FSIZE, &limit);
        for (int i = 0; i < 20000; ++i) TraceScope("test", "step");
        bool const isOff = !Trace::IsOn();
        bool const isTold = log.Count(ANDROID_LOG_WARN, "the trace ends here") == 1;
        std::exit(isOff && isTold && !Trace::Stop(&error) && error.find(path) != std::string::npos ? 0 : 3);
    };
    EXPECT_EXIT(run(), ::testing::ExitedWithCode(0), "");
    auto const size = std::filesystem::file_size(path);
    EXPECT_GT(size, 699'800u); // all but less than an event
    EXPECT_LE(size, 700'000u);
    EXPECT_GT(Events(path).Find("test", "step").size(), 1000u);
}

} // namespace
} // namespace Moka::Testing
