// What scene files say, what becomes of it, and what a person is told who got one wrong.
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "scenes/SceneText.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/unit/scenes/ScenePainting.h"

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

using Calls = std::function<void(IMKCanvas&, IMKBitmap* checker, IMKBitmap* photo)>;

// Operations on blue, with the bitmaps "checker" and "photo", draw what the calls draw, and something. The probe
// after both shows what they leave of the canvas's state.
void ExpectDraws(std::string const& operations, Calls const& calls) {
    SCOPED_TRACE(operations);
    std::string const probe = R"({"DrawBitmap": {"bitmap": "checker", "dst": [6, 5, 30, 20]}})";
    std::string const begin =
        R"({"size": [40, 30], "background": [0, 0, 0.5, 0.5],
        "bitmaps": {"checker": {"picture": "checker", "width": 12, "height": 10},
                    "photo": {"picture": "photo", "width": 7, "height": 3}}, "operations": [)";
    auto const paint = [&](std::string const& drawn) {
        Scene const scene = ParseScene(begin + drawn + probe + "]}", "test", "");
        return Paint(scene.width, scene.height,
                     [&](IMKCanvas& canvas, Scenes::SceneStage& stage) { DrawScene(scene, canvas, stage); });
    };
    Picture const expected = Paint(40, 30, [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
        canvas.ClearAll(0, 0, 0.5f, 0.5f);
        auto const make = [&](std::size_t index, int width, int height) {
            return RefPtr<IMKBitmap>::Adopt(stage.MakeBitmap(Scenes::MakePicture(index, width, height)));
        };
        RefPtr<IMKBitmap> const checker = make(1, 12, 10), photo = make(2, 7, 3);
        calls(canvas, checker.Get(), photo.Get());
        canvas.DrawBitmap(checker.Get(), RectF(6, 5, 30, 20), nullptr);
    });
    EXPECT_TRUE(paint(operations + ",") == expected);
    EXPECT_FALSE(paint("") == expected);
}

std::string FindError(std::string const& text) {
    try {
        ParseScene(text, "bad.json", "/nowhere");
    } catch (SceneError const& error) {
        return error.what();
    }
    return "no error";
}

// The canvas's calls that a scene becomes, as the recorder writes them down.
std::string RecordOperations(std::string const& paints, std::string const& operations) {
    Scene const scene =
        ParseScene("{\"size\": [40, 30], \"paints\": {" + paints + "}, \"operations\": [" + operations + "]}",
                   "test", "");
    TempFolder const folder;
    auto const recorder = Scenes::SceneRecorder::Start(folder.Path("scene.json"), 40, 30);
    ReferenceStage stage;
    scene.draw(*recorder, stage);
    EXPECT_TRUE(recorder->Close());
    return ReadFile(folder.Path("scene.json"));
}

TEST(SceneFormat, OperationsAreTheCanvassOwn) {
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
    };
    for (auto const& [given, recorded] : cases)
        EXPECT_THAT(RecordOperations(R"("p1": {})", given), HasSubstr(recorded ? recorded : given));
    char const* const ops[] = {"Intersect", "Replace", "Union", "Xor", "Difference", "ReverseDifference"};
    for (int op = IMKCanvasBase::Intersect; op <= IMKCanvasBase::ReverseDifference; ++op) {
        std::string const clip = R"({"SetClipRect": {"x": 2, "y": 3, "width": 20, "height": 9, "op": )";
        EXPECT_THAT(RecordOperations("", clip + '"' + ops[op] + "\"}}"),
                    HasSubstr(clip + std::to_string(op) + "}}"));
    }
}

TEST(SceneFormat, BitmapsAreDrawnInEveryWay) {
    ExpectDraws(R"(
        {"DrawBitmap": {"bitmap": "photo", "x": 1, "y": 2}},
        {"DrawBitmap": {"bitmap": "photo", "dst": [12, 2, 30, 4]}},
        {"DrawBitmap": {"bitmap": "checker", "src": [0, 1, 2, 3], "dst": [32, 2, 39, 5]}},
        {"DrawBitmaps": {"bitmap": "photo", "points": [[1, 7], [30, 21]]}},
        {"DrawBitmaps": {"bitmap": "photo", "dsts": [[1, 21, 10, 29]]}},
        {"DrawBitmaps": {"bitmap": "checker", "src": [1, 0, 12, 10], "paint": {"alpha": 0.5},
            "dsts": {"columns": 3, "rows": 2, "from": [1, 14], "step": [9, 4], "size": [20, 9]}}})",
                [](auto& c, auto* checker, auto* photo) {
                    c.DrawBitmap(photo, 1, 2, nullptr);
                    c.DrawBitmap(photo, RectF(12, 2, 30, 4), nullptr);
                    c.DrawBitmap(checker, RectF(0, 1, 2, 3), RectF(32, 2, 39, 5), nullptr);
                    std::vector<PointF> points{{1, 7}, {30, 21}};
                    c.DrawBitmaps(photo, points, nullptr);
                    c.DrawBitmaps(photo, {RectF(1, 21, 10, 29)}, nullptr);
                    std::vector<RectF> dsts; // row by row; they show through each other
                    for (float const y : {14.0f, 18.0f})
                        for (float const x : {1.0f, 10.0f, 19.0f}) dsts.emplace_back(x, y, x + 20, y + 9);
                    MKPaint half;
                    half.SetAlpha(0.5f);
                    c.DrawBitmaps(checker, RectF(1, 0, 12, 10), dsts, &half);
                });
}

TEST(SceneFormat, PaintsCarryEveryPropertyAndBuildOnEachOther) {
    std::string const text = RecordOperations(R"(
        "pen": {"color": "#80FF0000", "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
        "dashed": {"base": "pen", "color": [0, 0, 1], "alpha": 0.5, "dashedLinePattern": [4, 2],
                   "lineCapType": "Square"})",
                                              R"(
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": "pen"}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": "dashed"}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9,
                        "paint": {"base": "dashed", "dashedLinePattern": [1, 2, 3, 4], "style": "FillAndStroke"}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": {"base": "pen", "alpha": 0.25}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9,
                        "paint": {"tintColor": "#8000FF00", "xfermode": "DstOut", "tileMode": ["Mirror", "Repeat"]}}},
        {"DrawCircle": {"cx": 1, "cy": 2, "radius": 9, "paint": {"tileMode": "Clamp", "xfermode": 6}}})");
    EXPECT_THAT(text, HasSubstr(R"(
    "p1": {"color": [1, 0, 0, 0.5019608], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
    "p2": {"color": [0, 0, 1, 0.5], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true, "dashedLinePattern": [4, 2, 4, 2], "lineCapType": "Square"},
    "p3": {"color": [0, 0, 1, 0.5], "style": "FillAndStroke", "lineWidth": 2.5, "antiAliasing": true, "dashedLinePattern": [1, 2, 3, 4], "lineCapType": "Square"},
    "p4": {"color": [1, 0, 0, 0.25], "style": "Stroke", "lineWidth": 2.5, "antiAliasing": true},
    "p5": {"tintColor": [0, 1, 0, 0.5019608], "xfermode": "DstOut", "tileMode": ["Mirror", "Repeat"]},
    "p6": {"xfermode": "DstOver", "tileMode": ["Clamp", "Clamp"]}},)"));
    static_assert(MKPaint::DstOver == 6);
}

TEST(SceneFormat, GroupsArePlacedClippedRepeatedAndLeaveNothingBehind) {
    ExpectDraws(
        R"({"Group": {"scale": [2, 3], "clip": [1, 2, 13, 4], "rotate": 15, "translate": [5, 6],
                "matrix": [1, 0, 0, 0, 1, 0, 2, 1, 1],
                "operations": [{"PreScale": {"sx": 4, "sy": 4}}, {"DrawRect": {"rect": [0, 0, 2, 1]}}]}},
            {"Group": {"repeat": {"count": 3, "translate": [10, 0], "rotate": 5},
                "operations": [{"PreScale": {"sx": 2, "sy": 2}}, {"Save": {}}, {"DrawRect": {"rect": [1, 9, 3, 12]}}]}})",
        [](auto& c, auto*...) {
            int level = c.Save(IMKCanvasBase::SaveAll);
            c.PreTranslate(5, 6);
            c.PreRotate(15);
            c.PreScale(2, 3);
            c.PreConcat({1, 0, 0, 0, 1, 0, 2, 1, 1});
            c.SetClipRect(1, 2, 13, 4, IMKCanvasBase::Intersect);
            c.PreScale(4, 4);
            c.DrawRect(0, 0, 2, 1, nullptr);
            c.Restore(level);
            for (int i = 0; i < 3; ++i) {
                level = c.Save(IMKCanvasBase::SaveAll);
                // Each repetition begins where the one before began, one step further.
                for (int step = 0; step < i; ++step) {
                    c.PreTranslate(10, 0);
                    c.PreRotate(5);
                }
                c.PreScale(2, 2);
                c.DrawRect(1, 9, 3, 12, nullptr);
                c.Restore(level);
            }
        });
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
        {"{\"size\": tru\n}", "1:13: this is no JSON: syntax error"}, // the line break belongs to its line
        {"{\n\"size\": [8, 1e999]}", "2:13: this is no JSON: number overflow"},
        {"{\n\n\"size\": [8, 1e39]}", "3:13: a number is too large"},
        {"{\"size\": [8, 6],\n  \"size\": [8, 6]}", "2:3: \"size\" is given twice"},
        {"{\"size\": 8}", "1:10: size must be [width, height], not 8"},
        {"{\"size\": [8,\n0]}", "2:1: size[1] must be a whole number from 1 to 65535, not 0"},
        {"{\"size\": [16384, 16385]}", "1:10: size: more than 1 GiB of pixels"},
        {"{\"size\": [8, 6], \"operations\": [],\n\"backgroud\": 1}",
         "2:14: backgroud is unknown; there are size, about, background, labels, bitmaps, paints, "
         "operations"},
        // A column counts characters, and what is in a text is no structure.
        {"{\"about\": \"\u00e9\\\\\\\"{[,\", \"size\": true}", "1:31: size must be"},
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
        {R"({"Save": {"flag": "SaveSome"}})",
         "4:19: operations[0].Save.flag must be one of SaveAll, SaveMatrix, SaveClip or its number"},
        {"{\"DrawRect\": {\"rect\": [1, 2,\n3, null]}}",
         "5:4: operations[0].DrawRect.rect[3] must be a number, not null"},
        {"{\"DrawRect\": {\"rect\": [1, 2, 3, 4],\n\"paint\": {\"xfermode\": \"Multiply\"}}}",
         "5:23: operations[0].DrawRect.paint.xfermode must be one of Add, Clear"},
        {R"({"DrawBitmap": {"bitmap": "a", "x": 1, "y": 2}})",
         "4:27: operations[0].DrawBitmap.bitmap must be described under \"bitmaps\""},
        {R"({"DrawSimpleLines": {"points": [[1, 2]]}})",
         "4:32: operations[0].DrawSimpleLines.points must be an even number of points"},
        {R"({"SetClipRect": {"x": 0.5, "y": 1, "width": 2, "height": 3}})",
         "4:23: operations[0].SetClipRect.x must be a whole number, not 0.5"},
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
    EXPECT_THAT(FindError(with(1024, "0")), HasSubstr("may have 1024 bitmaps"));
    EXPECT_EQ(FindError(with(4, R"({"picture": "disc", "width": 1, "height": 1})")), expected);
    TempFolder const folder;
    ASSERT_TRUE(SaveImage(MakeGradient(2, 2), folder.Path("a.png")));
    EXPECT_EQ(FindError(with(4, "{\"file\": \"" + folder.Path("a.png") + "\"}")), expected);
}

} // namespace
} // namespace Moka::Testing
