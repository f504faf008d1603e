// What a recording says and what it leaves out, and what happens when it cannot be written.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/support/reference/ReferenceCanvas.h"
#include "tests/support/reference/ReferenceStage.h"

#include <cmath>
#include <cstring>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <limits>

namespace Moka::Testing {
namespace {

using Scenes::Scene;
using Scenes::SceneRecorder;
using ::testing::HasSubstr;

class Scribble final : public IMKCustomDrawable, public RefCount {
public:
    void DrawRT(Matrix4<float> const&, MKPaint const&) override {}
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }
};

class SceneRecorderTest : public ::testing::Test {
protected:
    // What draw puts onto a recorder, as text.
    template <class Draw>
    std::string Record(Draw const& draw) {
        auto const recorder = SceneRecorder::Start(path, 40, 30);
        draw(*recorder);
        EXPECT_TRUE(recorder->Close());
        return ReadFile(path);
    }

    // What drawing the recording, which has no bitmaps, puts onto another one.
    std::string RecordAgain() {
        Scene const scene = Scenes::LoadScene(path);
        return Record([&](IMKCanvas& canvas) {
            ReferenceStage stage;
            scene.draw(canvas, stage);
        });
    }

    LogCapture log;
    TempFolder const folder;
    std::string const path = folder.Path("a \"scene\".json");
};

// Whatever the bits, and in paints as in shapes: a second recording of the first is the same text.
TEST_F(SceneRecorderTest, EveryNumberIsReadAsTheSameOne) {
    std::uint32_t bits = 1;
    auto const next = [&] {
        for (;;) {
            bits = bits * 1664525u + 1013904223u;
            float number = 0;
            std::memcpy(&number, &bits, sizeof(number));
            if (std::isfinite(number)) return number;
        }
    };
    std::string const first = Record([&](IMKCanvas& canvas) {
        for (int i = 0; i < 300; ++i) {
            MKPaint paint;
            paint.SetColor(next(), next(), next(), next());
            paint.SetTintColor(next(), next(), next(), -0.0f);
            paint.SetLineWidth(next());
            paint.SetDashedLinePattern(Vector4<float>(next(), next(), next(), next()));
            paint.SetXFermode(static_cast<MKPaint::XFermode>(i - 1));
            paint.SetStyle(static_cast<MKPaint::Style>(i % 5));
            paint.SetTileMode(MKPaint::Mirror, static_cast<MKPaint::TileMode>(i % 6));
            paint.SetLineCapType(static_cast<MKPaint::LineCapType>(i % 4));
            paint.SetAntiAliasing(i % 2 == 0);
            canvas.DrawRect(RectF(next(), next(), next(), next()), &paint);
            canvas.PostTranslate(next(), -0.0f);
            canvas.SetMatrix(
                Matrix3f(next(), next(), next(), next(), next(), next(), next(), next(), next()));
            canvas.SetClipRect(i, -i, 1 << i % 31, 3, static_cast<IMKCanvasBase::ClipOp>(i % 9));
        }
    });
    EXPECT_EQ(RecordAgain(), first);
}

TEST_F(SceneRecorderTest, WhatNoSceneCanSayIsNamedAndTheRestIsThere) {
    auto const scribble = RefPtr<Scribble>::Adopt(new Scribble);
    std::string const text = Record([&](SceneRecorder& canvas) {
        canvas.Draw(scribble.Get(), nullptr);
        canvas.Draw(nullptr, nullptr);
        canvas.DrawCircle(std::nanf(""), 2, 3, nullptr);
        MKPaint endless;
        endless.SetLineWidth(std::numeric_limits<float>::infinity());
        canvas.DrawRect(1, 2, 3, 4, &endless);
        canvas.DrawBitmap(nullptr, 1, 2, nullptr);
        canvas.DrawSimpleLines({{1, 2}, {3, 4}, {5, 6}}, nullptr);
        canvas.LeaveOut("a \"map\"\n by foreign GL");
        EXPECT_EQ(canvas.Save(IMKCanvasBase::SaveAll), 0);
        EXPECT_EQ(canvas.Save(IMKCanvasBase::SaveClip), 1);
        canvas.PreTranslate(7, 8);
        canvas.Restore(0);
        EXPECT_EQ(canvas.GetMatrix()[6], 0);
    });
    EXPECT_THAT(text, HasSubstr("Left out: 4;"));
    EXPECT_THAT(text, HasSubstr(R"({"LeftOut": {"what": "a custom drawable of the caller's own"}})"));
    EXPECT_THAT(text, HasSubstr(R"({"LeftOut": {"what": "DrawCircle with a number that is not finite"}})"));
    EXPECT_THAT(text, HasSubstr(R"({"LeftOut": {"what": "DrawRect with a number that is not finite"}})"));
    EXPECT_THAT(text, HasSubstr(R"({"points": [[1, 2], [3, 4]]})"));
    EXPECT_EQ(RecordAgain().find("nan"), std::string::npos);
}

TEST_F(SceneRecorderTest, WhatCannotBeWrittenIsOneLineAndTheDrawingGoesOn) {
    for (std::string const& unwritable : {folder.Path("no/folder.json"), std::string("/dev/full")}) {
        log.Clear();
        auto const bitmap = RefPtr<ReferenceBitmap>::Adopt(new ReferenceBitmap(Picture(40, 30)));
        auto const canvas = RefPtr<ReferenceCanvas>::Adopt(new ReferenceCanvas(*bitmap, {}));
        auto const recorder = SceneRecorder::Start(unwritable, *canvas);
        recorder->DrawRect(0, 0, 40, 30, nullptr);
        recorder->DrawRect(0, 0, 40, 30, nullptr);
        std::string error;
        EXPECT_FALSE(recorder->Close(&error));
        EXPECT_THAT(error, HasSubstr("cannot record the scene " + unwritable + ": "));
        EXPECT_FALSE(recorder->Close());
        EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR).size(), 1u) << unwritable;
        EXPECT_EQ(bitmap->image.GetColor(20, 15), (Color{255, 255, 255, 255}));
    }
}

// As many as a file may have; what comes after is named, and what was before can be read.
TEST_F(SceneRecorderTest, MoreThanASceneMayHaveEndsTheRecordingWithOneLine) {
    auto const recorder = SceneRecorder::Start(path, 40, 30);
    recorder->DrawRect(1, 2, 30, 20, nullptr);
    std::vector<PointF> const points(1'000'000, PointF(0, 0));
    for (int i = 0; i < 2; ++i) recorder->DrawSimpleLines(points, nullptr);
    EXPECT_FALSE(recorder->Close());
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR).size(), 1u);
    EXPECT_THAT(ReadFile(path), HasSubstr("all that follows: a scene has no room for more operations"));
    EXPECT_THAT(ReadFile(path), HasSubstr(R"({"rect": [1, 2, 30, 20]})"));
    EXPECT_EQ(Scenes::LoadScene(path).width, 40);
}

} // namespace
} // namespace Moka::Testing
