// The notebook as a person uses it: what the window shows is what its page's file draws, after writing,
// highlighting, erasing, undoing, dropping an image, scrolling, zooming, saving, closing, opening and a kill.
#include "moka/base/Point.h"
#include "tests/app/MokaProcess.h"
#include "tests/examples/ExampleWindow.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/TestFiles.h"

#include <chrono>
#include <cmath>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <regex>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::HasSubstr;

constexpr int kWidth = 1248; // 24 pixels on each side of the page
constexpr int kHeight = 800;
constexpr int kToolbar = 52;
constexpr int kEdge = 24;
constexpr int kPage = 1200;
constexpr int kView = kHeight - kToolbar;
constexpr int kWheelStep = 80;
constexpr int kControl = 64; // as SDL numbers them
constexpr int kShift = 1;
constexpr int kImageSlack = 1; // a scaled image is sampled from a tile's corner or from the page's

// For some seconds: the sanitizers and a busy machine take their time.
template <class Condition>
bool Soon(Condition const& holds) {
    for (int i = 0; i < 800; ++i) {
        if (holds()) return true;
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    return false;
}

// Lines of a file for --replay.
class Script {
public:
    void Add(std::string const& event) { mText += std::to_string(mTime) + ' ' + event + '\n'; }
    // A finger that presses harder and harder; points are the window's pixels.
    void Touch(std::vector<PointF> const& points) {
        std::size_t i = 0;
        for (PointF const& p : points) {
            std::string const word = i == 0 ? "finger-down" : "finger";
            Add(word + " 7 " + std::to_string(p.x / kWidth) + ' ' + std::to_string(p.y / kHeight) + ' ' +
                std::to_string(0.2f + 0.6f * static_cast<float>(i++) / static_cast<float>(points.size())));
            mTime += 4;
        }
        Add("finger-up 7 0 0 0");
    }
    void Drag(PointF from, PointF to) {
        auto const at = [](PointF p) {
            return std::to_string(static_cast<int>(p.x)) + ' ' + std::to_string(static_cast<int>(p.y));
        };
        Add("press " + at(from) + " 1");
        for (int i = 1; i <= 20; ++i) {
            float const t = static_cast<float>(i) / 20;
            mTime += 4;
            Add("move " + at({from.x + (to.x - from.x) * t, from.y + (to.y - from.y) * t}) + " 1");
        }
        Add("release " + at(to) + " 1");
    }
    void Key(char key, int modifiers = 0) {
        Add("key " + std::to_string(static_cast<int>(key)) + ' ' + std::to_string(modifiers));
    }
    // Answers the prompt of a key with the end of what it proposes replaced.
    void Ask(char key, int modifiers, std::size_t count, std::string const& end) {
        Key(key, modifiers);
        for (std::size_t i = 0; i < count; ++i) Key('\b');
        if (!end.empty()) Add("text " + end);
        Key('\r');
        Add("idle");
    }
    std::string const& GetText() const { return mText; }

private:
    int mTime = 0;
    std::string mText;
};

// "moka" in one line each letter, as a finger would.
void WriteWord(Script& script, float x, float y) {
    auto const arc = [&](float cx, float from, float to, float rx, float ry) {
        std::vector<PointF> points;
        for (int i = 0; i <= 16; ++i) {
            float const a = from + (to - from) * static_cast<float>(i) / 16;
            points.emplace_back(x + cx + rx * std::cos(a), y - ry * std::sin(a));
        }
        return points;
    };
    constexpr float kPi = 3.14159265f;
    for (float const cx : {20.0f, 60.0f}) script.Touch(arc(cx, kPi, 0, 20, 50)); // m
    script.Touch(arc(125, 0, 2 * kPi, 28, 26));                                  // o
    script.Touch({{x + 175, y - 70}, {x + 176, y - 20}, {x + 175, y + 25}});     // k
    script.Touch({{x + 215, y - 30}, {x + 178, y - 4}, {x + 218, y + 26}});
    script.Touch(arc(262, 0, 2 * kPi, 28, 26)); // a
    script.Touch({{x + 292, y - 28}, {x + 291, y}, {x + 300, y + 28}});
}

class NotebookWindowTest : public ::testing::Test {
protected:
    NotebookWindowTest() {
        setenv("XDG_STATE_HOME", mFolder.Path("state").c_str(), 1);
        setenv("XDG_DATA_HOME", mFolder.Path("data").c_str(), 1);
        EXPECT_TRUE(SaveImage(Scenes::MakePicture(2, 600, 400), mFolder.Path("photo.png")));
    }

    std::unique_ptr<MokaProcess> Start(std::vector<std::string> arguments, ProcessOptions options = {}) {
        arguments.insert(arguments.end(),
                         {"--width", std::to_string(kWidth), "--height", std::to_string(kHeight)});
        return std::make_unique<MokaProcess>(mFolder.GetPath().string(), std::move(arguments),
                                             std::move(options));
    }
    std::string WriteScript(Script const& script) {
        WriteFile(mFolder.Path("input.txt"), script.GetText());
        return "input.txt";
    }
    // The tool of the X server, aimed at the window.
    static void Do(std::string const& what) {
        std::string const command =
            "xdotool search --name moka-notebook windowfocus --sync %1 " + what + " >/dev/null 2>&1";
        EXPECT_EQ(std::system(command.c_str()), 0) << command;
    }
    // The window when it has shown the same for a while.
    Picture Grab() {
        Picture seen;
        EXPECT_TRUE(Soon([&] {
            if (!mWindow.Find(kWidth, kHeight)) return false;
            Picture const next = mWindow.Grab(kWidth, kHeight);
            bool const isStill = seen == next && next.GetColor(5, 5) != Color{0, 0, 0, 255};
            seen = next;
            if (!isStill) std::this_thread::sleep_for(std::chrono::milliseconds(400));
            return isStill;
        }));
        return seen;
    }
    static Picture GetPagePart(Picture const& window, int rows = kView) {
        return window.Crop(kEdge, kToolbar, kPage, rows);
    }
    // What the tool draws from the page's file.
    Picture Draw(std::string const& page) {
        std::string const out = mFolder.Path("drawn.png");
        std::string const command = std::string(MOKA_TOOL) + " draw " + mFolder.Path(page) + " -o " + out;
        EXPECT_EQ(std::system((command + " > /dev/null").c_str()), 0) << command;
        return LoadImage(out);
    }
    static void ExpectSame(Picture const& expected, Picture const& actual, char const* what, int slack = 0) {
        ImageDifference const difference = CompareImages(expected, actual);
        EXPECT_LE(difference.largest, slack) << what << difference << KeepDifference(expected, actual, what);
    }
    void Close(MokaProcess& process) {
        mWindow.Close();
        ProcessResult const result = process.Wait();
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.err, "");
    }

    TempFolder mFolder;
    ExampleWindow mWindow;
};

TEST_F(NotebookWindowTest, ShowsWhatItsFileDrawsAndOpensItAgain) {
    Script script;
    WriteWord(script, 200, 250);
    script.Key('h');
    script.Drag({190, 250}, {520, 250});
    script.Key('r');
    script.Drag({325, 150}, {325, 320});
    script.Drag({400, 150}, {400, 320}); // is taken back
    script.Key('z', kControl);
    script.Add("move 600 420 0");
    script.Add("drop photo.png"); // 480 x 320, selected
    script.Add("idle");
    script.Drag({700, 500}, {650, 480});  // moved
    script.Drag({1030, 720}, {790, 560}); // scaled to half
    script.Key('p');
    // A second finger takes back what the first one began, pans and zooms.
    script.Add("finger-down 1 0.4 0.4 0.5");
    script.Add("finger 1 0.5 0.5 0.5");
    script.Add("finger-down 2 0.6 0.6 0.5");
    script.Add("finger 2 0.8 0.9 0.5");
    script.Add("finger-up 1 0 0 0");
    script.Add("finger-up 2 0 0 0");
    script.Add("idle");
    script.Key('0');
    script.Add("key 1073741898 0"); // Home
    auto process = Start({"page.json", "--replay", WriteScript(script)});
    Soon([&] { return std::filesystem::exists(mFolder.Path("page.json.journal")) || !mWindow.Find(1, 1); });
    Picture const top = Grab();
    Do("key ctrl+s");
    ASSERT_TRUE(Soon([&] { return std::filesystem::exists(mFolder.Path("page.json")); }));
    std::this_thread::sleep_for(std::chrono::seconds(5)); // the message goes
    Picture const drawn = Draw("page.json");
    ASSERT_EQ(drawn.height, 1600);
    ExpectSame(drawn.Crop(0, 0, kPage, kView), GetPagePart(Grab()), "page", kImageSlack);
    // The stroke and the highlighter, the gap of the eraser, what undo brought back, and the image in its place.
    EXPECT_NE(drawn.GetColor(240 - kEdge, 250 - kToolbar), (Color{255, 255, 255, 255}));
    EXPECT_EQ(drawn.GetColor(325 - kEdge, 250 - kToolbar), (Color{255, 255, 255, 255}));
    EXPECT_NE(drawn.GetColor(400 - kEdge, 250 - kToolbar), (Color{255, 255, 255, 255}));
    for (int const side : {1, 239})
        EXPECT_NE(drawn.GetColor(526 + side, 348 + 80), (Color{255, 255, 255, 255}));
    for (int const side : {-1, 241})
        EXPECT_EQ(drawn.GetColor(526 + side, 348 + 80), (Color{255, 255, 255, 255}));

    Do("mousemove --window %1 600 400 click 5 click 5 click 5");
    Picture const scrolled = Grab();
    ExpectSame(drawn.Crop(0, 3 * kWheelStep, kPage, kView), GetPagePart(scrolled), "scrolled", kImageSlack);
    Do("key ctrl+plus key plus key plus");
    EXPECT_FALSE(GetPagePart(Grab()) == GetPagePart(scrolled)) << "zoomed in";
    Do("key 0 key Home");
    ExpectSame(GetPagePart(top), GetPagePart(Grab()), "zoomed back");
    Close(*process);

    process = Start({}); // the last page
    ExpectSame(GetPagePart(top), GetPagePart(Grab()), "opened again");
    process->Signal(SIGTERM);
    EXPECT_EQ(process->Wait().status, 0);
}

TEST_F(NotebookWindowTest, AKillLosesNothingThatWasAutosaved) {
    Script script;
    WriteWord(script, 200, 250);
    auto process = Start({"page.json", "--autosave", "0.1", "--replay", WriteScript(script)});
    Picture const before = Grab();
    process->Signal(SIGKILL);
    EXPECT_EQ(process->Wait().signal, SIGKILL);
    EXPECT_FALSE(std::filesystem::exists(mFolder.Path("page.json")));
    process = Start({"page.json"});
    ExpectSame(GetPagePart(before), GetPagePart(Grab()), "after a kill");
    Close(*process);
    EXPECT_EQ(mFolder.List(), (std::vector<std::string>{"input.txt", "page.json", "photo.png", "state"}));
}

TEST_F(NotebookWindowTest, ABrokenPageAndAFullDiskAreToldAndKeepTheirFile) {
    WriteFile(mFolder.Path("page.json"), "{\"size\": [1200, 1600], \"operations\": [");
    auto process = Start({"page.json"});
    Picture const told = Grab();
    EXPECT_NE(told.GetColor(5, kHeight - 5), told.GetColor(5, kHeight - 200)) << "a message at the bottom";
    Do("key ctrl+s key Escape");
    mWindow.Close();
    ProcessResult result = process->Wait();
    EXPECT_THAT(result.err, HasSubstr("page.json:1:"));
    EXPECT_EQ(ReadFile(mFolder.Path("page.json")), "{\"size\": [1200, 1600], \"operations\": [");

    Script script;
    WriteWord(script, 200, 250);
    ProcessOptions full;
    full.fileSizeLimit = 3000;
    process = Start({"full.json", "--replay", WriteScript(script)}, full);
    Picture const written = Grab();
    mWindow.Close();
    EXPECT_TRUE(Soon([&] { return !(mWindow.Grab(kWidth, kHeight) == written); }))
        << "it stays open and says so";
    mWindow.Close();
    result = process->Wait();
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("cannot save"));
    EXPECT_THAT(result.err, HasSubstr("full.json: File too large"));
}

// By its keys and prompts: what it exports, pastes, saves elsewhere and opens, and what it says of what cannot be.
TEST_F(NotebookWindowTest, ExportsPastesAndOpensWhatItIsTold) {
    std::string const dot = "{\"DrawStroke\":{\"paint\":{\"color\":\"#FF000000\"},\"points\":[[300,";
    auto const write = [&](char const* page, int row, char const* more) {
        WriteFile(mFolder.Path(page),
                  "{\"size\": [1200, 1600], \"background\": \"#FFFFFF\", \"operations\": [" + dot +
                      std::to_string(row) + ",9]]}}" + more + "]}");
    };
    write("page.json", 200, "");
    write("high.json", 16'500, ",{\"DrawBitmap\":{\"bitmap\":\"broken.png\",\"dst\":[0,0,90,90]}}");
    write("higher.json", 65'800, "");
    WriteFile(mFolder.Path("broken.png"), "no picture");
    mWindow.SetClipboard(mFolder.Path("photo.png"));
    Script script;
    script.Ask('e', kControl, 8, "view.png");
    script.Ask('e', kControl | kShift, 8, "whole.png");
    script.Key('v', kControl);
    script.Add("drop broken.png");
    script.Ask('s', kControl | kShift, 8, "second.json");
    script.Ask('o', kControl, 0, "high.json");
    script.Ask('e', kControl | kShift, 8, "high.webp");
    script.Ask('o', kControl, 0, "higher.json");
    script.Ask('e', kControl | kShift, 10, "higher.png");
    script.Drag({400, 400}, {500, 400});
    script.Key('s', kControl);
    script.Add("quit"); // while it saves
    ProcessResult const result = Start({"page.json", "--replay", WriteScript(script)})->Wait();
    EXPECT_EQ(result.status, 0);
    for (char const* const told :
         {"cannot put ", "broken.png on the page", "cannot read the image", "no side above 16383",
          "the page has 66206 rows and an image at most 65535"})
        EXPECT_THAT(result.err, HasSubstr(told));
    EXPECT_EQ(LoadImage(mFolder.Path("view.png")).GetColor(300 + kEdge, 200), (Color{0, 0, 0, 255}));
    ExpectSame(Draw("page.json"), LoadImage(mFolder.Path("whole.png")), "exported");
    EXPECT_THAT(ReadFile(mFolder.Path("page-second.json")), HasSubstr("photo.png"));
    EXPECT_THAT(ReadFile(mFolder.Path("higher.json")), HasSubstr("]}}\n]}\n")) << "saved whole";
}

TEST_F(NotebookWindowTest, TheRenderThreadAllocatesNothingForInkOnceItIsWarm) {
    Script script;
    for (float y = 200; y < 700; y += 100) WriteWord(script, 200, y);
    script.Add("quit");
    ProcessResult const result =
        Start({"page.json", "--statistics", "--replay", WriteScript(script)})->Wait();
    std::smatch count;
    ASSERT_TRUE(std::regex_search(result.out, count, std::regex("(\\d+) in the last")));
    EXPECT_LT(std::stoi(count[1]), 100) << "20 strokes made more than some vectors grow";
}

TEST_F(NotebookWindowTest, SaysWhatToDoWithoutAWindow) {
    struct Case {
        std::vector<std::string> arguments;
        std::string environment;
        char const* message;
        int status;
    };
    for (Case const& c : {Case{{}, "DISPLAY=:none", "is DISPLAY set?", 1},
                          Case{{}, "__EGL_VENDOR_LIBRARY_DIRS=/nonexistent", "RenderThread: ", 1},
                          Case{{"--replay", "none.txt"}, "A=b", "cannot read none.txt", 1},
                          Case{{"--autosave", "x"}, "A=b", "--help", 2}}) {
        ProcessOptions options;
        options.environment = {c.environment};
        ProcessResult const result = Start(c.arguments, options)->Wait();
        EXPECT_EQ(result.status, c.status) << c.message;
        EXPECT_THAT(result.err, HasSubstr(c.message));
    }
}

} // namespace
} // namespace Moka::Testing
