// What scene files say, what becomes of it, and what a person is told who got one wrong.
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneText.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/unit/scenes/CanvasLog.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using Scenes::ParseScene;
using Scenes::Scene;
using Scenes::SceneError;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::StartsWith;

// A scene of 8 x 6 with these operations, in line 4 and after.
std::string WithOperations(std::string const& operations) {
    return "{\n\"size\": [8, 6],\n\"operations\": [\n" + operations + "\n]}\n";
}

std::vector<std::string> Play(std::string const& text) {
    RefPtr<CanvasLog> const canvas = PlayScene(ParseScene(text, "test", ""));
    std::vector<std::string> const& lines = canvas->GetLines();
    EXPECT_THAT(lines.front(), StartsWith("ClearAll"));
    return {lines.begin() + 1, lines.end()};
}

std::string FindError(std::string const& text) {
    try {
        ParseScene(text, "bad.json", "/nowhere");
    } catch (SceneError const& error) {
        return error.what();
    }
    return "no error";
}

TEST(SceneFormat, OperationsKeepTheirNamesArgumentsAndOrder) {
    EXPECT_THAT(
        Play(WithOperations(R"(
            {"DrawRect": {"rect": [1, 2, 3.5, 4]}},
            {"DrawRoundRect": {"rect": [1, 2, 3, 4], "rx": 0.5, "ry": 2}},
            {"DrawCircle": {"cx": 1, "cy": 2, "radius": 3}},
            {"DrawLine": {"from": [1, 2], "to": [3, 4]}},
            {"DrawSimpleLine": {"from": [1, 2], "to": [3, 4]}},
            {"DrawSimpleLines": {"points": [[1, 2], [3, 4], [5, 6], [7, 8]]}},
            {"Clear": {"color": "#00FF00"}},
            {"ClearAll": {"color": [0, 0.5, 1, 0.25]}},
            {"SetClipRect": {"x": -1, "y": 2, "width": 3, "height": 4, "op": "Difference"}},
            {"SetMatrix": {"matrix": [1, 2, 3, 4, 5, 6, 7, 8, 9]}},
            {"PostConcat": {"matrix": [1, 0, 0, 0, 1, 0, 0, 0, 1]}},
            {"PreTranslate": {"tx": 1, "ty": 2}}, {"PostTranslate": {"tx": 1, "ty": 2}},
            {"PreScale": {"sx": 1, "sy": 2}}, {"PostScale": {"sx": 1, "sy": 2}},
            {"PreRotate": {"degrees": 9}}, {"PostRotate": {"degrees": 9, "px": 1, "py": 2}})")),
        ElementsAre("DrawRect [1 2 3.5 4] color(1 1 1 1)", "DrawRoundRect [1 2 3 4] 0.5 2 color(1 1 1 1)",
                    "DrawCircle 1 2 3 color(1 1 1 1)", "DrawLine (1 2) (3 4) color(1 1 1 1)",
                    "DrawSimpleLine (1 2) (3 4) color(1 1 1 1)",
                    "DrawSimpleLines 4: (1 2) (7 8) color(1 1 1 1)", "Clear 0 1 0 1", "ClearAll 0 0.5 1 0.25",
                    "SetClipRect -1 2 3 4 4", "SetMatrix {1 2 3 4 5 6 7 8 9}",
                    "PostConcat {1 0 0 0 1 0 0 0 1}", "PreTranslate 1 2", "PostTranslate 1 2", "PreScale 1 2",
                    "PostScale 1 2", "PreRotate 9", "PostRotate 9 1 2"));
}

TEST(SceneFormat, BitmapsAreDrawnInTheFormThatTheFieldsSay) {
    std::string const text = R"({"size": [8, 6],
        "bitmaps": {"a": {"picture": "checker", "width": 5, "height": 4},
                    "b": {"picture": "photo", "width": 7, "height": 3}},
        "operations": [
            {"DrawBitmap": {"bitmap": "b", "x": 1, "y": 2}},
            {"DrawBitmap": {"bitmap": "a", "dst": [1, 2, 3, 4]}},
            {"DrawBitmap": {"bitmap": "a", "src": [0, 1, 2, 3], "dst": [1, 2, 3, 4]}},
            {"DrawBitmaps": {"bitmap": "a", "points": [[1, 2], [3, 4]]}},
            {"DrawBitmaps": {"bitmap": "a", "dsts": [[1, 2, 3, 4]]}},
            {"DrawBitmaps": {"bitmap": "b", "src": [0, 1, 2, 3],
                "dsts": {"columns": 3, "rows": 2, "from": [10, 20], "step": [5, 7], "size": [4, 6]}}}]})";
    EXPECT_THAT(Play(text),
                ElementsAre("DrawBitmap 7x3 1 2 color(1 1 1 1)", "DrawBitmap 5x4 [1 2 3 4] color(1 1 1 1)",
                            "DrawBitmap 5x4 [0 1 2 3] [1 2 3 4] color(1 1 1 1)",
                            "DrawBitmaps 5x4 2: (1 2) (3 4) color(1 1 1 1)",
                            "DrawBitmaps 5x4 1: [1 2 3 4] [1 2 3 4] color(1 1 1 1)",
                            "DrawBitmaps 7x3 [0 1 2 3] 6: [10 20 14 26] [20 27 24 33] color(1 1 1 1)"));
}

TEST(SceneFormat, PaintsCarryEveryPropertyAndBuildOnEachOther) {
    std::string const text = R"({"size": [8, 6],
        "paints": {
            "pen": {"color": "#80FF0000", "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
            "dashed": {"base": "pen", "color": [0, 0, 1], "alpha": 0.5, "dashedLinePattern": [4, 2],
                       "lineCapType": "Square"}},
        "operations": [
            {"DrawCircle": {"cx": 1, "cy": 2, "radius": 3, "paint": "dashed"}},
            {"DrawCircle": {"cx": 1, "cy": 2, "radius": 3, "paint": {"tintColor": "#0000FF",
                "xfermode": "Lighten", "dashedLinePattern": [1, 2, 3, 4], "lineCapType": 7,
                "tileMode": ["Mirror", "Repeat"]}}},
            {"DrawCircle": {"cx": 1, "cy": 2, "radius": 3, "paint": {"base": "pen", "xfermode": 25,
                "style": "FillAndStroke", "tileMode": "Clamp"}}}]})";
    EXPECT_THAT(
        Play(text),
        ElementsAre("DrawCircle 1 2 3 color(0 0 1 0.5) style2 width2.5 soft dashes(4 2 4 2) cap2",
                    "DrawCircle 1 2 3 color(1 1 1 1) tint(0 0 1 1) mode17 dashes(1 2 3 4) cap7 tile2,3",
                    "DrawCircle 1 2 3 color(1 0 0 0.501961) mode25 style1 width2.5 soft tile1,1"));
}

TEST(SceneFormat, NamesStandForTheLibrarysNumbers) {
    std::pair<char const*, int> const modes[] = {{"DstOut", MKPaint::DstOut},
                                                 {"SrcKeepDstAlpha", MKPaint::SrcKeepDstAlpha},
                                                 {"BlendingOff", MKPaint::BlendingOff}};
    for (auto const& [name, number] : modes) {
        std::string const rect = R"({"DrawRect": {"rect": [1, 2, 3, 4], "paint": {"xfermode": ")";
        EXPECT_THAT(Play(WithOperations(rect + name + "\"}}}")),
                    ElementsAre(HasSubstr(" mode" + std::to_string(number))));
    }
}

TEST(SceneFormat, GroupsArePlacedClippedRepeatedAndLeaveNothingBehind) {
    EXPECT_THAT(
        Play(WithOperations(R"(
                    {"Group": {"scale": [2, 3], "clip": [1, 2, 3, 4], "rotate": 45, "translate": [5, 6],
                        "matrix": [1, 0, 0, 0, 1, 0, 7, 8, 1],
                        "operations": [{"PreScale": {"sx": 4, "sy": 4}}]}},
                    {"Group": {"repeat": {"count": 3, "translate": [10, 0], "rotate": 5},
                        "operations": [{"PreScale": {"sx": 2, "sy": 2}}, {"Save": {}}]}})")),
        ElementsAre("Save 0", "PreTranslate 5 6", "PreRotate 45", "PreScale 2 3",
                    "PreConcat {1 0 0 0 1 0 7 8 1}", "SetClipRect 1 2 3 4 0", "PreScale 4 4", "Restore 0",
                    // Each repetition begins where the one before began, one step further.
                    "Save 0", "Save 0", "PreScale 2 2", "Save 0", "Restore 1", "PreTranslate 10 0",
                    "PreRotate 5", "Save 0", "PreScale 2 2", "Save 0", "Restore 1", "PreTranslate 10 0",
                    "PreRotate 5", "Save 0", "PreScale 2 2", "Save 0", "Restore 1", "Restore 0"));
}

TEST(SceneFormat, SizeAndBackgroundAreTheScenes) {
    Scene const scene = ParseScene(
        R"({"about": "A & B.", "size": [65535, 1], "background": [0.5, 0.25, 0, 0.5], "operations": []})",
        "x", "");
    EXPECT_EQ(scene.about, "A & B.");
    EXPECT_EQ(scene.width, 65535);
    EXPECT_EQ(scene.height, 1);
    EXPECT_EQ(scene.background.x, 0.5f);
    EXPECT_EQ(scene.background.w, 0.5f);
}

struct Mistake {
    std::string text;
    char const* start; // of the message, behind the file's name
};

void ExpectNamed(std::vector<Mistake> const& mistakes) {
    LogCapture const log;
    for (Mistake const& mistake : mistakes)
        EXPECT_THAT(FindError(mistake.text), StartsWith(std::string("bad.json:") + mistake.start))
            << mistake.text;
}

TEST(SceneFormat, AMistakeInTheFileIsNamedWithItsPlace) {
    ExpectNamed({
        {"", "1:1: this is no JSON: syntax error"},
        {"{\n\"size\": [8, 6],\n}", "3:1: this is no JSON: syntax error"},
        {"{\"a\n\": 1}", "1:4: this is no JSON: syntax error"},
        {"{\"size\": [8, 6], \"about\": \"\xFF\"}", "1:28: this is no JSON: syntax error"},
        {"{\n\"size\": [8, 1e999]}", "2:13: this is no JSON: number overflow"},
        {"{\n\n\"size\": [8, 1e39]}", "3:13: a number is too large"},
        {"{\"size\": [8, 6],\n  \"size\": [8, 6]}", "2:3: \"size\" is given twice"},
        {"{\n}", "1:1: the scene needs \"size\""},
        {"{\"size\": 8}", "1:10: size must be [width, height], not 8"},
        {"{\"size\": [8,\n0]}", "2:1: size[1] must be a whole number from 1 to 65535, not 0"},
        {"{\"size\": [65536, 1]}", "1:11: size[0] must be a whole number from 1 to 65535, not 65536"},
        {"{\"size\": [16384, 16385]}", "1:10: size: more than 1 GiB of pixels"},
        {"{\"size\": [8, 6], \"operations\": {}}", "1:32: operations must be a list of operations"},
        {"{\"size\": [8, 6], \"operations\": [],\n\"backgroud\": 1}",
         "2:14: backgroud is unknown; there are size, about, background, bitmaps, paints, operations"},
        // A column counts characters, and what is in a text is no structure.
        {"{\"about\": \"\u00e9\\\\\\\"{[,\", \"size\": true}", "1:31: size must be"},
        {"{\"size\": [8, 6],\n\"background\": \"#12345\"}", "2:15: background must be \"#RRGGBB\""},
        {"{\"size\": [8, 6],\n\"bitmaps\": {\n\"a\": {\"picture\": \"cat\", \"width\": 1, \"height\": 1}}}",
         "3:18: bitmaps.a.picture must be one of gradient, checker"},
        {"{\"size\": [8, 6],\n\"bitmaps\": {\"a b\": {\"picture\": \"photo\",\n\"width\": 1,\n\"height\": "
         "5000}}}",
         "4:11: bitmaps[\"a b\"].height must be a whole number from 1 to 4096"},
        {"{\"size\": [8, 6],\n\"bitmaps\": {\n\"a\": {\n\"file\": \"cat.png\"}}}",
         "4:9: bitmaps.a.file: cannot load the image /nowhere/cat.png"},
        {"{\"size\": [8, 6],\n\"paints\": {\"a\": {\"base\": \"b\"}}}",
         "2:26: paints.a.base must be described under"},
    });
}

TEST(SceneFormat, AMistakeInAnOperationIsNamedWithItsPlace) {
    std::vector<Mistake> mistakes = {
        {R"({"DrawCircle": {"cx": 1, "cy": 2}})", "4:16: operations[0].DrawCircle needs \"radius\""},
        {"{\"DrawCircle\": {\"cx\": 1,\n\"cy\": 2, \"radius\":\n\"big\"}}",
         "6:1: operations[0].DrawCircle.radius must be a number, not \"big\""},
        {"{\"Save\": {}},\n{\"DrawCircle\": {\"cx\": 1, \"cy\": 2, \"radius\": 3,\n\"raduis\": 3}}",
         "6:11: operations[1].DrawCircle.raduis is unknown; there are cx, cy, radius, paint"},
        {"{\"Save\": {}},\n\n{\"DrawCircel\": {}}",
         "6:16: operations[1].DrawCircel is no operation; there are Group, DrawBitmap"},
        {R"({"Save": {}, "Restore": {}})", "4:1: operations[0] must be an object with one name"},
        {R"({"Save": 3})", "4:10: operations[0].Save must be an object"},
        {R"({"Save": {"flag": "SaveSome"}})",
         "4:19: operations[0].Save.flag must be one of SaveAll, SaveMatrix, SaveClip or its number"},
        {R"({"DrawRect": {"rect": [1, 2, 3]}})",
         "4:23: operations[0].DrawRect.rect must be [left, top, right, bottom], not a list of 3"},
        {"{\"DrawRect\": {\"rect\": [1, 2,\n3, null]}}",
         "5:4: operations[0].DrawRect.rect[3] must be a number, not null"},
        {"{\"DrawRect\": {\"rect\": [1, 2, 3, 4],\n\"paint\": \"ink\"}}",
         "5:10: operations[0].DrawRect.paint must be described under \"paints\""},
        {"{\"DrawRect\": {\"rect\": [1, 2, 3, 4],\n\"paint\": {\"xfermode\": \"Multiply\"}}}",
         "5:23: operations[0].DrawRect.paint.xfermode must be one of Add, Clear"},
        {"{\"DrawRect\": {\"rect\": [1, 2, 3, 4],\n\"paint\": {\"antiAliasing\": 1}}}",
         "5:27: operations[0].DrawRect.paint.antiAliasing must be true or false, not 1"},
        {R"({"DrawBitmap": {"bitmap": "a", "x": 1, "y": 2}})",
         "4:27: operations[0].DrawBitmap.bitmap must be described under \"bitmaps\""},
        {R"({"DrawSimpleLines": {"points": [[1, 2]]}})",
         "4:32: operations[0].DrawSimpleLines.points must be an even number of points"},
        {R"({"SetClipRect": {"x": 0.5, "y": 1, "width": 2, "height": 3}})",
         "4:23: operations[0].SetClipRect.x must be a whole number, not 0.5"},
        {R"({"SetMatrix": {"matrix": [1, 0, 0, 1, 0, 0]}})",
         "4:26: operations[0].SetMatrix.matrix must be nine numbers, column by column"},
        {R"({"Group": {"clip": [0, 0, 1.5, 1], "operations": []}})",
         "4:27: operations[0].Group.clip[2] must be a whole number"},
        {R"({"Group": {"repeat": {"count": 0}, "operations": []}})",
         "4:32: operations[0].Group.repeat.count must be a whole number from 1 to 100000, not 0"},
        {"{\"Group\": {\"operations\": [\n{\"Group\": {\"operations\": [\n{\"Draw\": {}}]}}]}}",
         "6:10: operations[0].Group.operations[0].Group.operations[0].Draw is no operation"},
    };
    for (Mistake& mistake : mistakes) mistake.text = WithOperations(mistake.text);
    ExpectNamed(mistakes);
}

// So that a file of a few bytes cannot keep anybody busy.
TEST(SceneFormat, RepetitionsNestingAndBatchesHaveLimits) {
    std::string const thousand = "{\"Group\": {\"repeat\": {\"count\": 1000}, \"operations\": [";
    std::string const end = "]}}";
    EXPECT_EQ(FindError(WithOperations(thousand + thousand + "{\"Save\": {}}" + end + end)), "no error");
    EXPECT_THAT(
        FindError(WithOperations(thousand + thousand + "{\"Save\": {}},\n{\"Save\": {}}" + end + end)),
        StartsWith("bad.json:4:1: operations[0]: a scene may have 1000000 operations"));
    // Even where there is nothing to repeat.
    EXPECT_THAT(FindError(WithOperations(thousand + thousand + thousand + end + end + end)),
                HasSubstr("1000000 operations"));
    EXPECT_THAT(
        FindError(WithOperations("{\"DrawSimpleLines\": {\"points\": {\"columns\": 2000, \"rows\": 2000,"
                                 "\n\"from\": [0, 0], \"step\": [1, 1]}}}")),
        HasSubstr("more than 1000000 places"));
    std::string const deep = std::string(100'000, '[') + std::string(100'000, ']');
    EXPECT_THAT(FindError(deep), HasSubstr("nested more than 64 levels"));
}

// The limit is one for all of a scene, whether made by rule or read from a file.
TEST(SceneFormat, BitmapsAreCountedBeforeTheirPixelsAreMade) {
    auto const with = [](int count, std::string const& last) {
        std::string text = "{\"size\": [8, 6], \"operations\": [],\n\"bitmaps\": {";
        for (int i = 0; i < count; ++i)
            text += '"' + std::to_string(i) + R"(": {"picture": "disc", "width": 4096, "height": 4096},)";
        return text + "\n\"last\": " + last + "}}";
    };
    char const* const expected =
        "bad.json:3:9: bitmaps.last: all bitmaps of a scene together may have 67108864 pixels";
    EXPECT_THAT(FindError(with(64, "0")), HasSubstr("may have 64 bitmaps"));
    EXPECT_EQ(FindError(with(4, R"({"picture": "disc", "width": 1, "height": 1})")), expected);
    TempFolder const folder;
    ASSERT_TRUE(SaveImage(MakeGradient(2, 2), folder.Path("a.png")));
    EXPECT_EQ(FindError(with(4, "{\"file\": \"" + folder.Path("a.png") + "\"}")), expected);
}

TEST(SceneFormat, ABitmapThatCannotBeMadeDrawsNothing) {
    Scene const scene = ParseScene(R"({"size": [8, 6],
        "bitmaps": {"a": {"picture": "photo", "width": 5, "height": 4}},
        "operations": [{"DrawBitmap": {"bitmap": "a", "x": 1, "y": 2}}]})",
                                   "test", "");
    EmptyStage stage;
    RefPtr<CanvasLog> const canvas = RefPtr<CanvasLog>::Adopt(new CanvasLog);
    EXPECT_THROW(DrawScene(scene, *canvas, stage), SceneError);
    EXPECT_THAT(canvas->GetLines(), ElementsAre(StartsWith("ClearAll")));
}

} // namespace
} // namespace Moka::Testing
