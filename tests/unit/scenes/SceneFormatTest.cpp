// What scene files say, what becomes of it, and what a person is told who got one wrong.
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "scenes/SceneRenderer.h"
#include "scenes/SceneText.h"
#include "tests/support/LogCapture.h"
#include "tests/support/PumpedRenderer.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using Scenes::ParseScene;
using Scenes::Scene;
using Scenes::SceneError;
using ::testing::HasSubstr;
using ::testing::StartsWith;

// A scene of 8 x 6 with these operations, in line 4 and after.
std::string WithOperations(std::string const& operations) {
    return "{\n\"size\": [8, 6],\n\"operations\": [\n" + operations + "\n]}\n";
}

std::string FindError(std::string const& text) {
    try {
        ParseScene(text, "bad.json", "/nowhere");
    } catch (SceneError const& error) {
        return error.what();
    }
    return "no error";
}

class SceneFormat : public ::testing::Test {
protected:
    // What a scene of these operations asks of a canvas, as the recorder writes it.
    std::string Record(std::string const& operations, std::string const& paints = {}) {
        Scene const scene = ParseScene(R"({"size": [40, 30], "background": [0, 0, 0.5, 0.25],
            "bitmaps": {"photo": {"picture": "photo", "width": 7, "height": 3},
                        "b1": {"picture": "checker", "width": 12, "height": 10}},
            "paints": {)" + paints + R"(}, "operations": [)" +
                                           operations + "]}",
                                       "test", "");
        auto const recorder = Scenes::SceneRecorder::Start(folder.Path("scene.json"), 40, 30);
        Scenes::QueueStage stage(queue);
        DrawScene(scene, *recorder, stage);
        EXPECT_TRUE(recorder->Close());
        queue.RunAll(); // frees the scene's bitmaps
        return ReadFile(folder.Path("scene.json"));
    }

    PumpedRenderer queue{64};
    TempFolder const folder;
};

TEST_F(SceneFormat, OperationsAreTheCanvassOwn) {
    std::pair<char const*, char const*> const cases[] = {
        {R"({"DrawRect": {"rect": [1, 2, 33.5, 4], "paint": "p1"}})", nullptr},
        {R"({"DrawRoundRect": {"rect": [1, 2, 33, 26], "rx": 3, "ry": 5, "paint": "p1"}})", nullptr},
        {R"({"DrawCircle": {"cx": 5, "cy": 6, "radius": 4, "paint": "p1"}})", nullptr},
        {R"({"DrawLine": {"from": [1, 2], "to": [39, 4], "paint": "p1"}})", nullptr},
        {R"({"DrawSimpleLine": {"from": [1, 2], "to": [39, 4], "paint": "p1"}})", nullptr},
        {R"({"DrawSimpleLines": {"points": [[1, 2], [39, 4], [5, 25], [35, 28]], "paint": "p1"}})", nullptr},
        {R"({"Save": {}})", R"({"Save": {"flag": 0}})"},
        {R"({"Save": {"flag": "SaveClip"}})", R"({"Save": {"flag": 2}})"},
        {R"({"Restore": {"level": 3}})", nullptr},
        {R"({"Clear": {"color": "#00FF00"}})", R"({"Clear": {"color": [0, 1, 0, 1]}})"},
        {R"({"ClearAll": {"color": [0, 0.5, 1, 0.25]}})", nullptr},
        {R"({"SetMatrix": {"matrix": [1, 0.5, 0, 0.25, 2, 0, 7, -8, 1]}})", nullptr},
        {R"({"PreConcat": {"matrix": [1, 0.25, 0, 0, 1, 0, 0, 0, 1]}})", nullptr},
        {R"({"PostConcat": {"matrix": [1, 0, 0, 0.5, 1, 0, 4, 2, 1]}})", nullptr},
        {R"({"PreScale": {"sx": 1.5, "sy": 0.5}})", nullptr},
        {R"({"PostScale": {"sx": 0.75, "sy": 1.25}})", nullptr},
        {R"({"PreTranslate": {"tx": 1, "ty": 2}})", nullptr},
        {R"({"PostTranslate": {"tx": -3, "ty": 4}})", nullptr},
        {R"({"PreRotate": {"degrees": 9}})", nullptr},
        {R"({"PostRotate": {"degrees": -20, "px": 5, "py": 6}})", nullptr},
        {R"({"DrawBitmap": {"x": 1, "y": 2, "bitmap": "b1", "paint": "p1"}})", nullptr},
        {R"({"DrawBitmap": {"dst": [12, 2, 30, 4], "bitmap": "b1", "paint": "p1"}})", nullptr},
        {R"({"DrawBitmap": {"src": [0, 1, 2, 3], "dst": [32, 2, 39, 5], "bitmap": "b1", "paint": "p1"}})",
         nullptr},
        {R"({"DrawBitmaps": {"points": [[1, 7], [30, 21]], "bitmap": "b1", "paint": "p1"}})", nullptr},
        {R"({"DrawBitmaps": {"dsts": [[1, 21, 10, 29]], "bitmap": "b1", "paint": "p1"}})", nullptr},
        {R"({"DrawBitmaps": {"src": [1, 0, 12, 10], "bitmap": "b1",
             "dsts": {"columns": 2, "rows": 2, "from": [1, 14], "step": [9, 4], "size": [20, 9]}}})",
         R"("dsts": [[1, 14, 21, 23], [10, 14, 30, 23], [1, 18, 21, 27], [10, 18, 30, 27]], "bitmap": "b1")"},
    };
    for (auto const& [given, recorded] : cases)
        EXPECT_THAT(Record(given, R"("p1": {})"), HasSubstr(recorded ? recorded : given));
    EXPECT_EQ(LoadImage(folder.Path("scene.bitmaps/b1.mki")), Scenes::MakePicture(1, 12, 10));
    EXPECT_THAT(Record(""), HasSubstr(R"({"ClearAll": {"color": [0, 0, 0.5, 0.25]}})"));
    char const* const ops[] = {"Intersect", "Replace", "Union", "Xor", "Difference", "ReverseDifference"};
    for (int op = IMKCanvasBase::Intersect; op <= IMKCanvasBase::ReverseDifference; ++op) {
        std::string const clip = R"({"SetClipRect": {"x": 2, "y": 3, "width": 20, "height": 9, "op": )";
        EXPECT_THAT(Record(clip + '"' + ops[op] + "\"}}"), HasSubstr(clip + std::to_string(op) + "}}"));
    }
}

TEST_F(SceneFormat, PaintsCarryEveryPropertyAndBuildOnEachOther) {
    std::string const paints = R"(
        "pen": {"color": "#80FF0000", "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
        "dashed": {"base": "pen", "color": [0, 0, 1], "alpha": 0.5, "dashedLinePattern": [4, 2],
                   "lineCapType": "Square"})";
    std::string const text = Record(R"(
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": "pen"}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": "dashed"}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9,
                        "paint": {"base": "dashed", "dashedLinePattern": [1, 2, 3, 4], "style": "FillAndStroke"}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": {"base": "pen", "alpha": 0.25}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9,
                        "paint": {"tintColor": "#8000FF00", "xfermode": "DstOut", "tileMode": ["Mirror", "Repeat"]}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": {"tileMode": "Clamp", "xfermode": 6}}})",
                                    paints);
    EXPECT_THAT(text, HasSubstr(R"(
    "p1": {"color": [1, 0, 0, 0.5019608], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
    "p2": {"color": [0, 0, 1, 0.5], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true, "dashedLinePattern": [4, 2, 4, 2], "lineCapType": "Square"},
    "p3": {"color": [0, 0, 1, 0.5], "style": "FillAndStroke", "lineWidth": 2.5, "antiAliasing": true, "dashedLinePattern": [1, 2, 3, 4], "lineCapType": "Square"},
    "p4": {"color": [1, 0, 0, 0.25], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
    "p5": {"tintColor": [0, 1, 0, 0.5019608], "xfermode": "DstOut", "tileMode": ["Mirror", "Repeat"]},
    "p6": {"xfermode": "DstOver", "tileMode": ["Clamp", "Clamp"]}},)"));
}

TEST_F(SceneFormat, GroupsArePlacedClippedRepeatedAndLeaveNothingBehind) {
    EXPECT_EQ(Record(R"({"Group": {"scale": [2, 3], "clip": [1, 2, 13, 4], "rotate": 15, "translate": [5, 6],
                            "matrix": [1, 0, 0, 0, 1, 0, 2, 1, 1], "operations": [{"PreRotate": {"degrees": 4}}]}})"),
              Record(R"({"Save": {}}, {"PreTranslate": {"tx": 5, "ty": 6}}, {"PreRotate": {"degrees": 15}},
                        {"PreScale": {"sx": 2, "sy": 3}}, {"PreConcat": {"matrix": [1, 0, 0, 0, 1, 0, 2, 1, 1]}},
                        {"SetClipRect": {"x": 1, "y": 2, "width": 13, "height": 4}},
                        {"PreRotate": {"degrees": 4}}, {"Restore": {"level": 0}})"));
    // Each repetition begins where the one before began, one step further.
    std::string const step = R"({"PreTranslate": {"tx": 10, "ty": 0}}, {"PreRotate": {"degrees": 5}},)";
    std::string const once =
        R"({"Save": {}}, {"Save": {}}, {"Clear": {"color": [1, 1, 1]}}, {"Restore": {"level": 1}},)";
    EXPECT_EQ(Record(R"({"Group": {"repeat": {"count": 3, "translate": [10, 0], "rotate": 5},
                            "operations": [{"Save": {}}, {"Clear": {"color": [1, 1, 1]}}]}})"),
              Record(R"({"Save": {}},)" + once + step + once + step + once + R"({"Restore": {"level": 0}})"));
}

struct Mistake {
    std::string text;  // with a bar for each new line
    char const* start; // of the message, behind the file's name
};

void ExpectNamed(std::vector<Mistake> const& mistakes, bool areOperations) {
    LogCapture const log;
    for (auto const& [given, start] : mistakes) {
        std::string text = given;
        std::replace(text.begin(), text.end(), '|', '\n');
        EXPECT_THAT(FindError(areOperations ? WithOperations(text) : text),
                    StartsWith("bad.json:" + std::string(start)))
            << text.substr(0, 200);
    }
}

TEST_F(SceneFormat, AMistakeInTheFileIsNamedWithItsPlace) {
    std::vector<Mistake> const mistakes = {
        {"", "1:1: this is no JSON: syntax error"},
        {R"({|"size": [8, 6],|})", "3:1: this is no JSON: syntax error"},
        {R"({"size": tru|})", "1:13: this is no JSON: syntax error"}, // the line break belongs to its line
        {R"({|"size": [8, 1e999]})", "2:13: this is no JSON: number overflow"},
        {R"({||"size": [8, 1e39]})", "3:13: a number is too large"},
        {std::string(100'000, '['), "1:65: nested more than 64 levels"},
        {R"({"size": [8, 6],|  "size": [8, 6]})", "2:3: \"size\" is given twice"},
        {R"({"size": 8})", "1:10: size must be [width, height], not 8"},
        {R"({"size": [8,|0]})", "2:1: size[1] must be a whole number from 1 to 65535, not 0"},
        {R"({"size": [16384, 16385]})", "1:10: size: more than 1 GiB of pixels"},
        {R"({"size": [8, 6], "operations": [],|"backgroud": 1})",
         "2:14: backgroud is unknown; there are size, about, background, labels, bitmaps, paints, "
         "operations"},
        // A column counts characters, and what is in a text is no structure.
        {"{\"about\": \"\u00e9\\\\\\\"{[,\", \"size\": true}", "1:31: size must be"},
        {R"({"size": [8, 6],|"bitmaps": {|"a": {"picture": "cat", "width": 1, "height": 1}}})",
         "3:18: bitmaps.a.picture must be one of gradient, checker"},
        {R"({"size": [8, 6],|"bitmaps": {"a b": {"picture": "photo",|"width": 1,|"height": 5000}}})",
         "4:11: bitmaps[\"a b\"].height must be a whole number from 1 to 4096"},
        {R"({"size": [8, 6],|"bitmaps": {|"a": {|"file": "cat.png"}}})",
         "4:9: bitmaps.a.file: cannot load the image /nowhere/cat.png"},
        {R"({"size": [8, 6],|"paints": {"a": {"base": "b"}}})",
         "2:26: paints.a.base must be described under"},
    };
    ExpectNamed(mistakes, false);
}

TEST_F(SceneFormat, AMistakeInAnOperationIsNamedWithItsPlace) {
    // So that a file of a few bytes cannot keep anybody busy.
    std::string const thousand = R"({"Group": {"repeat": {"count": 1000}, "operations": [)";
    std::string const million = thousand + thousand;
    EXPECT_EQ(FindError(WithOperations(million + R"({"Save": {}}]}}]}})")), "no error");
    std::vector<Mistake> const mistakes = {
        {million + R"({"Save": {}},|{"Save": {}}]}}]}})",
         "4:1: operations[0]: a scene may have 1000000 operations"},
        {million + thousand + "]}}]}}]}}",
         "4:1: operations[0]: a scene may have"}, // even where there is nothing to repeat
        {R"({"DrawSimpleLines": {"points": {"columns": 2000, "rows": 2000,|"from": [0, 0], "step": [1, 1]}}})",
         "4:32: operations[0].DrawSimpleLines.points: more than 1000000 places"},
        {R"({"DrawCircle": {"cx": 1, "cy": 2}})", "4:16: operations[0].DrawCircle needs \"radius\""},
        {R"({"DrawCircle": {"cx": 1,|"cy": 2, "radius":|"big"}})",
         "6:1: operations[0].DrawCircle.radius must be a number, not \"big\""},
        {R"({"Save": {}},|{"DrawCircle": {"cx": 1, "cy": 2, "radius": 3,|"raduis": 3}})",
         "6:11: operations[1].DrawCircle.raduis is unknown; there are cx, cy, radius, paint"},
        {R"({"Save": {}},||{"DrawCircel": {}})",
         "6:16: operations[1].DrawCircel is no operation; there are Group, DrawBitmap"},
        {R"({"DrawRect": {"rect": [1, 2,|3, null]}})",
         "5:4: operations[0].DrawRect.rect[3] must be a number, not null"},
        {R"({"DrawRect": {"rect": [1, 2, 3, 4],|"paint": {"xfermode": "Multiply"}}})",
         "5:23: operations[0].DrawRect.paint.xfermode must be one of Add, Clear"},
        {R"({"DrawBitmap": {"bitmap": "a", "x": 1, "y": 2}})",
         "4:27: operations[0].DrawBitmap.bitmap must be described under \"bitmaps\""},
        {R"({"DrawSimpleLines": {"points": [[1, 2]]}})",
         "4:32: operations[0].DrawSimpleLines.points must be an even number of points"},
        {R"({"SetClipRect": {"x": 0.5, "y": 1, "width": 2, "height": 3}})",
         "4:23: operations[0].SetClipRect.x must be a whole number, not 0.5"},
        {R"({"Group": {"operations": [|{"Group": {"operations": [|{"Draw": {}}]}}]}})",
         "6:10: operations[0].Group.operations[0].Group.operations[0].Draw is no operation"},
    };
    ExpectNamed(mistakes, true);
}

// The limit is one for all of a scene, whether made by rule or read from a file.
TEST_F(SceneFormat, BitmapsAreCountedBeforeTheirPixelsAreMade) {
    auto const with = [](int count, std::string const& last) {
        std::string text = "{\"size\": [8, 6], \"operations\": [],\n\"bitmaps\": {";
        for (int i = 0; i < count; ++i)
            text += '"' + std::to_string(i) + R"(": {"picture": "disc", "width": 4096, "height": 4096},)";
        return text + "\n\"last\": " + last + "}}";
    };
    char const* const expected =
        "bad.json:3:9: bitmaps.last: all bitmaps of a scene together may have 67108864 pixels";
    EXPECT_THAT(FindError(with(1024, "0")), HasSubstr("may have 1024 bitmaps"));
    EXPECT_EQ(FindError(with(4, R"({"picture": "disc", "width": 1, "height": 1})")), expected);
    ASSERT_TRUE(SaveImage(MakeGradient(2, 2), folder.Path("a.png")));
    EXPECT_EQ(FindError(with(4, "{\"file\": \"" + folder.Path("a.png") + "\"}")), expected);
}

} // namespace
} // namespace Moka::Testing
