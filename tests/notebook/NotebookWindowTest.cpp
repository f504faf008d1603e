// Tests that the notebook's window shows the same pixels as `moka draw` of the page's file, after writing, highlighting,
// erasing, undo, dropping an image, scrolling, zooming, saving, closing, opening and a kill.
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
#include <sstream>
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
constexpr int kControl = 64; // SDL's number
constexpr int kShift = 1;
constexpr int kImageSlack = 1; // the window samples a scaled image relative to a tile's corner

// Lines of a file for --replay.
class Script {
public:
    template <class... Words>
    void Add(Words const&... words) {
        mText << mTime;
        ((mText << ' ' << words), ...);
        mText << '\n';
    }
    // Draws with a finger whose pressure increases. The points are in window pixels.
    void Touch(std::vector<PointF> const& points) {
        char const* word = "finger-down";
        float pressure = 0.2f;
        for (PointF const& p : points) {
            Add(word, 7, p.x / kWidth, p.y / kHeight, pressure);
            word = "finger";
            pressure += 0.6f / static_cast<float>(points.size());
            mTime += 4;
        }
        Add("finger-up 7 0 0 0");
    }
    void Drag(PointF from, PointF to) {
        Add("press", from.x, from.y, 1);
        for (int i = 1; i <= 20; ++i) {
            float const t = static_cast<float>(i) / 20;
            mTime += 4;
            Add("move", std::lround(from.x + (to.x - from.x) * t), std::lround(from.y + (to.y - from.y) * t),
                1);
        }
        Add("release", to.x, to.y, 1);
    }
    void Key(int key, int modifiers = 0) { Add("key", key, modifiers); }
    // Presses a key and answers its prompt: replaces the end of the proposed text.
    void Ask(char key, int modifiers, std::size_t count, std::string const& end) {
        Key(key, modifiers);
        for (std::size_t i = 0; i < count; ++i) Key('\b');
        Add("text", end);
        Key('\r');
        Add("idle");
    }
    std::string GetText() const { return mText.str(); }

private:
    int mTime = 0;
    std::ostringstream mText;
};

// Writes seven loops with a finger, from left to right.
void WriteWord(Script& script, float x, float y) {
    for (int letter = 0; letter < 7; ++letter) {
        std::vector<PointF> points;
        for (int i = 0; i <= 16; ++i) {
            float const angle = static_cast<float>(i) * 0.4f;
            points.emplace_back(x + 20 - 20 * std::cos(angle), y - 50 * std::sin(angle));
        }
        script.Touch(points);
        x += 42;
    }
}

class NotebookWindowTest : public ::testing::Test {
protected:
    NotebookWindowTest() {
        setenv("XDG_STATE_HOME", mFolder.Path("state").c_str(), 1);
        setenv("XDG_DATA_HOME", mFolder.Path("data").c_str(), 1);
        EXPECT_TRUE(SaveImage(Scenes::MakePicture(2, 600, 400), mFolder.Path("photo.png")));
    }

    // `before` stands before the program's name in the shell's command.
    std::unique_ptr<MokaProcess> Start(std::string const& arguments, std::string const& before = {}) {
        return std::make_unique<MokaProcess>(mFolder.GetPath().string(),
                                             before + " exec '" MOKA_EXECUTABLE "' --width " +
                                                 std::to_string(kWidth) + " --height " +
                                                 std::to_string(kHeight) + " " + arguments);
    }
    std::unique_ptr<MokaProcess> Replay(Script const& script, std::string const& arguments,
                                        std::string const& before = {}) {
        WriteFile(mFolder.Path("input.txt"), script.GetText());
        return Start("--replay input.txt " + arguments, before);
    }
    // Runs xdotool on the window.
    static void Do(std::string const& what) {
        std::string const command =
            "xdotool search --name moka-notebook windowfocus --sync %1 " + what + " >/dev/null 2>&1";
        EXPECT_EQ(std::system(command.c_str()), 0) << command;
    }
    // Returns the window's pixels when they have not changed for a while.
    Picture Grab() {
        Picture seen;
        EXPECT_TRUE(Soon([&] {
            Picture const next = mWindow.Grab(kWidth, kHeight);
            if (next.width == 0) return false;
            bool const isStill = seen == next && next.GetColor(5, 5) != Color{0, 0, 0, 255};
            seen = next;
            if (!isStill) std::this_thread::sleep_for(std::chrono::milliseconds(400));
            return isStill;
        }));
        return seen;
    }
    static Picture GetPagePart(Picture const& window) { return window.Crop(kEdge, kToolbar, kPage, kView); }
    // Draws the page's file with `moka draw`.
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

TEST_F(NotebookWindowTest, ShowsThePixelsOfItsFileAndOpensItAgain) {
    Script script;
    WriteWord(script, 200, 250);
    script.Key('h');
    script.Drag({190, 250}, {520, 250});
    script.Key('r');
    script.Drag({325, 150}, {325, 320});
    script.Drag({400, 150}, {400, 320}); // undone
    script.Key('z', kControl);
    script.Add("move 600 420 0");
    script.Add("drop photo.png"); // 480 x 320, selected
    script.Add("idle");
    script.Drag({700, 500}, {650, 480});  // moved
    script.Drag({1030, 720}, {790, 560}); // scaled to half
    script.Key('p');
    // A second finger cancels the stroke of the first one, pans and zooms.
    script.Add("finger-down 1 0.4 0.4 0.5");
    script.Add("finger 1 0.5 0.5 0.5");
    script.Add("finger-down 2 0.6 0.6 0.5");
    script.Add("finger 2 0.8 0.9 0.5");
    script.Add("finger-up 1 0 0 0");
    script.Add("finger-up 2 0 0 0");
    script.Add("idle");
    script.Key('0');
    script.Key(1073741898); // Home
    auto process = Replay(script, "page.json");
    Picture const top = Grab();
    Do("key ctrl+s");
    ASSERT_TRUE(Soon([&] { return std::filesystem::exists(mFolder.Path("page.json")); }));
    std::this_thread::sleep_for(std::chrono::seconds(5)); // the message disappears
    Picture const drawn = Draw("page.json");
    ASSERT_EQ(drawn.height, 1600);
    ExpectSame(drawn.Crop(0, 0, kPage, kView), GetPagePart(Grab()), "page", kImageSlack);
    // The stroke and the highlighter, the gap of the eraser, the object restored by undo, and the image at its place.
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

    process = Start(""); // the last page
    ExpectSame(GetPagePart(top), GetPagePart(Grab()), "opened again");
    process->Signal(SIGTERM);
    EXPECT_EQ(process->Wait().status, 0);
}

TEST_F(NotebookWindowTest, AKillLosesNothingThatWasAutosaved) {
    Script script;
    WriteWord(script, 200, 250);
    auto process = Replay(script, "page.json --autosave 0.1");
    Picture const before = Grab();
    process->Signal(SIGKILL);
    EXPECT_EQ(process->Wait().signal, SIGKILL);
    EXPECT_FALSE(std::filesystem::exists(mFolder.Path("page.json")));
    process = Start("page.json");
    ExpectSame(GetPagePart(before), GetPagePart(Grab()), "after a kill");
    Close(*process);
    EXPECT_EQ(mFolder.List(), (std::vector<std::string>{"input.txt", "page.json", "photo.png", "state"}));
}

TEST_F(NotebookWindowTest, ABrokenPageAndAFullDiskAreReportedAndKeepTheirFile) {
    WriteFile(mFolder.Path("page.json"), "{\"size\": [1200, 1600], \"operations\": [");
    auto process = Start("page.json");
    Picture const told = Grab();
    EXPECT_NE(told.GetColor(5, kHeight - 5), told.GetColor(5, kHeight - 200)) << "a message at the bottom";
    Do("key ctrl+s key Escape");
    mWindow.Close();
    ProcessResult result = process->Wait();
    EXPECT_THAT(result.err, HasSubstr("page.json:1:"));
    EXPECT_EQ(ReadFile(mFolder.Path("page.json")), "{\"size\": [1200, 1600], \"operations\": [");

    Script script;
    WriteWord(script, 200, 250);
    process = Replay(script, "full.json", "ulimit -f 6;"); // 3072 bytes
    Picture const written = Grab();
    mWindow.Close();
    EXPECT_TRUE(Soon([&] { return !(mWindow.Grab(kWidth, kHeight) == written); }))
        << "the window must stay open and show a message";
    mWindow.Close();
    result = process->Wait();
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("cannot save"));
    EXPECT_THAT(result.err, HasSubstr("full.json: File too large"));
}

// Uses keys and prompts to export, paste, save under another name and open, also with inputs that fail.
TEST_F(NotebookWindowTest, ExportsPastesAndOpensByKeysAndPrompts) {
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
    ProcessResult const result = Replay(script, "page.json")->Wait();
    EXPECT_EQ(result.status, 0);
    for (char const* const told :
         {"cannot put ", "broken.png on the page", "cannot read the image", "no side above 16383",
          "the page has 66206 rows and an image at most 65535"})
        EXPECT_THAT(result.err, HasSubstr(told));
    EXPECT_EQ(LoadImage(mFolder.Path("view.png")).GetColor(300 + kEdge, 200), (Color{0, 0, 0, 255}));
    ExpectSame(Draw("page.json"), LoadImage(mFolder.Path("whole.png")), "exported");
    EXPECT_THAT(ReadFile(mFolder.Path("page-second.json")), HasSubstr("photo.png"));
    EXPECT_THAT(ReadFile(mFolder.Path("higher.json")), HasSubstr("]}}\n]}\n")) << "saved completely";
}

TEST_F(NotebookWindowTest, TheRenderThreadDoesNotAllocateForInkAfterTheFirstFrames) {
    Script script;
    for (float y = 200; y < 700; y += 100) WriteWord(script, 200, y);
    script.Add("quit");
    ProcessResult const result = Replay(script, "page.json --statistics")->Wait();
    std::size_t const end = result.out.find(" in the last");
    ASSERT_NE(end, std::string::npos);
    EXPECT_LT(std::stoi(result.out.substr(result.out.rfind(' ', end - 1))), 100)
        << "more allocations than the growth of some vectors";
}

TEST_F(NotebookWindowTest, ReportsStartFailuresWithARemedy) {
    struct {
        char const* arguments;
        char const* environment;
        char const* message;
        int status;
    } const cases[] = {{"", "DISPLAY=:none", "is DISPLAY set?", 1},
                       {"", "__EGL_VENDOR_LIBRARY_DIRS=/nonexistent", "RenderThread: ", 1},
                       {"--replay none.txt", "", "cannot read none.txt", 1},
                       {"--autosave x", "", "--help", 2}};
    for (auto const& c : cases) {
        ProcessResult const result = Start(c.arguments, c.environment)->Wait();
        EXPECT_EQ(result.status, c.status) << c.message;
        EXPECT_THAT(result.err, HasSubstr(c.message));
    }
}

} // namespace
} // namespace Moka::Testing
