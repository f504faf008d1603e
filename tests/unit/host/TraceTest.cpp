// Traces: a file that other programs' parsers read, with everything that happened and nothing twice.
#include "moka/base/Trace.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/RenderThread.h"
#include "tests/support/LogCapture.h"

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

// Of this process, so that tests run side by side.
std::string MakePath(char const* name) {
    auto const* const test = ::testing::UnitTest::GetInstance()->current_test_info();
    return (std::filesystem::temp_directory_path() / (std::string("moka-") + test->name() + name)).string();
}

class Events {
public:
    explicit Events(std::string const& path) {
        std::ifstream file(path);
        for (json const& event : json::parse(file)) {
            if (event.at("ph") == "X") mEvents.push_back(event);
            if (event.at("ph") == "M" && event.at("name") == "thread_name")
                threads.insert(event.at("args").at("name").get<std::string>());
        }
        std::filesystem::remove(path);
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

    // In each thread, those of a category are in the order of their ends, and one that begins within another ends
    // there. Nanoseconds.
    void ExpectOrder() const {
        std::map<std::pair<int, std::string>, long> last;
        std::map<int, std::vector<std::pair<long, long>>> rows;
        for (json const& event : mEvents) {
            int const id = event.at("tid").get<int>();
            long const begin = std::lround(event.at("ts").get<double>() * 1000);
            long const end = begin + std::lround(event.at("dur").get<double>() * 1000);
            long& before = last[{id, event.at("cat").get<std::string>()}];
            EXPECT_GE(begin, 0);
            EXPECT_GE(end, std::max(before, begin)) << event;
            before = end;
            rows[id].emplace_back(begin, -end);
        }
        EXPECT_EQ(rows.size(), threads.size());
        for (auto& [id, row] : rows) {
            std::sort(row.begin(), row.end());
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

using BitmapPtr = RefPtr<IMKBitmap>;

// Uploads 32 x 32, draws, reads back.
void Work(RenderThread& queue, int rectangles) {
    std::vector<std::uint32_t> pixels(32 * 32);
    auto const bitmap =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 32, 32, pixels.data(), false, 1, false));
    auto const canvas = RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, bitmap.Get(), 1));
    for (int i = 0; i < rectangles; ++i) canvas->DrawRect(0, 0, 8, 8, nullptr);
    canvas->ClearAll(0, 0, 0, 1);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), pixels.data());
}

void SaveAndLoad(std::string const& path) {
    Bitmap image;
    image.Construct(new unsigned char[6 * 5 * 4](), 6, 5, 6 * 4, Bitmap::kFormatRgba8888, false, true);
    String const name = String::FromFileName(path);
    EXPECT_TRUE(BitmapFactory::SaveBitmap(&image, &name, 100));
    delete BitmapFactory::CreateBitmapForGraphics(&name);
    std::filesystem::remove(path);
}

TEST(TraceTest, TellsOfEveryThreadTaskFlushTransferAndFileOnce) {
    RenderThreadOptions options;
    options.tracePath = MakePath(".json");
    std::string error;
    RendererStatistics statistics;
    {
        auto const queue = RenderThread::Start(options, &error);
        ASSERT_TRUE(queue) << error;
        EXPECT_TRUE(Trace::IsOn());
        EXPECT_FALSE(Trace::Start(options.tracePath + "2", &error));
        EXPECT_THAT(error, AllOf(HasSubstr(options.tracePath), HasSubstr("stop it first")));
        std::vector<std::thread> threads;
        for (int i = 0; i < 3; ++i) threads.emplace_back([&] { Work(*queue, 3000); });
        for (std::thread& thread : threads) thread.join();
        SaveAndLoad(MakePath(".png"));
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
    EXPECT_FALSE(Trace::IsOn());
    Events const events(options.tracePath);
    events.ExpectOrder();
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
    EXPECT_EQ(events.Sum("renderer", "Flush", "draws"), static_cast<std::int64_t>(statistics.drawRequests));
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
TEST(TraceTest, NothingIsLostWhenTheProcessEndsWithoutStopping) {
    std::string const path = MakePath(".json");
    auto const run = [&path] {
        setenv("MOKA_TRACE", path.c_str(), 1);
        for (int i = 0; i < 2; ++i) {
            auto const queue = RenderThread::Start({}, nullptr);
            Work(*queue, 100);
        }
        std::thread([] {
            for (std::uint64_t i = 0; i < 10000; ++i) TraceScope("test", "step", "number", i);
        }).join();
        std::int64_t const now = Trace::GetTime();
        Trace::Add("test", "last", now, now, nullptr, 0);
        std::exit(0);
    };
    EXPECT_EXIT(run(), ::testing::ExitedWithCode(0), "");
    Events const events(path);
    events.ExpectOrder();
    EXPECT_EQ(events.Sum("test", "step", "number"), 9999 * 10000 / 2);
    EXPECT_EQ(events.Find("test", "last").size(), 1u);
    EXPECT_EQ(events.Sum("task", "DrawRectRT", "count"), 200);
}

TEST(TraceTest, WhenTheDiskFillsTheEventsBeforeCanStillBeRead) {
    std::string const path = MakePath(".json");
    auto const run = [&path] {
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
