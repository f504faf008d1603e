// The three checkers: each call reaches the wrapped object as if made on it, until the last Unref.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/debug/MKBitmapChecker.h"
#include "moka/graphics/debug/MKCanvasChecker.h"
#include "moka/graphics/debug/MKPenCanvasChecker.h"
#include "tests/support/reference/ReferenceBitmap.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <atomic>
#include <chrono>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;

template <class Interface>
using Calls = std::vector<std::function<void(Interface&)>>;

// What the exception says; empty without one.
template <class Call>
std::string GetRefusal(Call call) {
    try {
        call();
    } catch (std::logic_error const& error) {
        return error.what();
    }
    return {};
}

class Checkers : public CanvasFixture {
protected:
    void SetUp() override {
        CanvasFixture::SetUp();
        Use(NewBitmap(60, kMaxSide + 10));
        source = NewBitmap(20, kMaxSide + 10);
    }
    void TearDown() override {
        source = {};
        CanvasFixture::TearDown();
    }

    template <class Interface>
    static void DoAll(Interface& object, Calls<Interface> const& calls) {
        for (auto const& call : calls) call(object);
    }

    // Each of the calls throws, says so in one line, and does nothing.
    template <class Checker, class Interface>
    void ExpectRefused(Checker& checker, Interface* wrapped, std::string const& kind,
                       Calls<Interface> calls) {
        calls.insert(calls.end(), {[](auto& o) { o.SetTag("tag"); }, [](auto& o) { o.GetTag(); },
                                   [](auto& o) { o.GetMsgQueue(); }, [](auto& o) { o.Ref(); },
                                   [](auto& o) { o.Unref(); }});
        checker.SetTag(std::string(200, 't').c_str());
        wrapped->Ref(); // which the checker gives back
        checker.Unref();
        queue.RunAll();
        std::ostringstream line;
        line << "checkRefCount, " << kind << " address : " << wrapped << ", tag : " << std::string(126, 't')
             << " ref count : 0";
        for (auto const& call : calls) {
            SCOPED_TRACE(&call - calls.data());
            log.Clear();
            EXPECT_EQ(GetRefusal([&] { call(checker); }), kind + " was already released!!");
            EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(line.str()));
        }
        EXPECT_EQ(log.GetLines()[0].tag, "mok_log");
        EXPECT_EQ(queue.GetPendingCount(), 0);
    }

    // What every canvas can do, once each, and last what undoes it.
    template <class Interface>
    static Calls<Interface> OfEveryCanvas(Calls<Interface> const& more) {
        static Matrix3<float> const skewed(1, 0.2f, 0, 0.3f, 1, 0, 5, 6, 1);
        Calls<Interface> calls = {
            [](auto& o) { o.Clear(static_cast<int>(0x80FF0040u)); },
            [](auto& o) { o.Clear(0.4f, 0.3f, 0.2f, 0.1f); },
            [](auto& o) { o.ClearAll(static_cast<int>(0x40FF0080u)); },
            [](auto& o) { o.ClearAll(0.1f, 0.2f, 0.3f, 0.4f); },
            [](auto& o) { o.Save(IMKCanvasBase::SaveAll); },
            [](auto& o) { o.SetMatrix(skewed); },
            [](auto& o) { o.PreConcat(skewed); },
            [](auto& o) { o.PostConcat(skewed); },
            [](auto& o) { o.PreScale(2, 3); },
            [](auto& o) { o.PostScale(0.05f, 0.02f); },
            [](auto& o) { o.PreRotate(10); },
            [](auto& o) { o.PreRotate(20, 1, 2); },
            [](auto& o) { o.PostRotate(30); },
            [](auto& o) { o.PostRotate(40, 3, 4); },
            [](auto& o) { o.PreTranslate(7, 8); },
            [](auto& o) { o.PostTranslate(9, 10); },
            [](auto& o) { o.SetClipRect(-90, -90, 200, 200, IMKCanvasBase::Union); },
        };
        calls.insert(calls.end(), more.begin(), more.end());
        calls.push_back([](auto& o) { o.Restore(0); });
        return calls;
    }
    Calls<IMKCanvas> OfACanvas() {
        return OfEveryCanvas<IMKCanvas>({
            [this](auto& o) { o.Draw(&drawable, &paint); },
            [this](auto& o) { o.DrawLine(1, 2, 30, 40, &paint); },
            [this](auto& o) { o.DrawLine(points[0], points[1], nullptr); },
            [this](auto& o) { o.DrawSimpleLine(1, 2, 30, 40, &paint); },
            [this](auto& o) { o.DrawSimpleLine(points[0], points[1], &paint); },
            [this](auto& o) { o.DrawSimpleLines(points, &paint); },
            [this](auto& o) { o.DrawRect(1, 2, 30, 40, &paint); },
            [this](auto& o) { o.DrawRect(rects[0], &paint); },
            [this](auto& o) { o.DrawRoundRect(1, 2, 30, 40, 3, 5, &paint); },
            [this](auto& o) { o.DrawRoundRect(rects[1], 1, 2, &paint); },
            [this](auto& o) { o.DrawCircle(20, 25, 9, &paint); },
            [this](auto& o) { o.DrawBitmap(source.Get(), 3, 4, &paint); },
            [this](auto& o) { o.DrawBitmap(source.Get(), rects[0], &paint); },
            [this](auto& o) { o.DrawBitmap(source.Get(), rects[0], rects[1], &paint); },
            [this](auto& o) { o.DrawBitmaps(source.Get(), points, &paint); },
            [this](auto& o) { o.DrawBitmaps(source.Get(), rects, &paint); },
            [this](auto& o) { o.DrawBitmaps(source.Get(), rects[0], rects, &paint); },
        });
    }

    BitmapPtr source;
    FakeDrawable drawable;
    std::vector<PointF> points{{1, 2}, {20, 30}};
    std::vector<RectF> const rects{{1, 2, 3, 4}, {5, 6, 9, 10}};
};

TEST_F(Checkers, ACanvasDrawsTheSameThroughOne) {
    DoAll(*canvas, OfACanvas());
    canvas->DrawRect(rects[0], nullptr); // what was restored
    std::vector<std::string> const direct = TakePictures();
    EXPECT_GT(direct.size(), 20u);
    canvas = {};
    queue.RunAll();
    Use(target);
    MKCanvasChecker checker(canvas.Get());
    DoAll<IMKCanvas>(checker, OfACanvas());
    canvas->DrawRect(rects[0], nullptr);
    EXPECT_EQ(TakePictures(), direct);
    EXPECT_EQ(drawable.draws, 4);
    EXPECT_EQ(checker.Ref(), 2);
    EXPECT_EQ(checker.Unref(), 1);
    EXPECT_EQ(checker.GetMsgQueue(), &queue);
    EXPECT_STREQ(checker.GetTag(), "") << "its own";
    checker.SetTag("set");
    EXPECT_STREQ(checker.GetTag(), "set");
    EXPECT_STREQ(canvas->GetTag(), "set");
}

TEST_F(Checkers, APenCanvasAnswersTheSameThroughOne) {
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker checker(pen.Get());
    Calls<IMKPenCanvas> transforms = OfEveryCanvas<IMKPenCanvas>({});
    transforms.pop_back();
    DoAll(*pen, transforms);
    Matrix3<float> const transformed = pen->GetMatrix();
    DoAll<IMKPenCanvas>(checker, transforms);
    EXPECT_EQ(pen->GetMatrix(), transformed);
    EXPECT_EQ(checker.GetModelMatrix(), transformed);
    EXPECT_EQ(checker.GetCanvasMatrix(), pen->GetCanvasMatrix());
    EXPECT_EQ(checker.GetBitmap(), target.Get());
    queue.RunAll();
    OnRenderThread const here;
    RendererTrace::TakeCalls();
    checker.EnableClipRT(0);
    EXPECT_EQ(RendererTrace::TakeCalls().back(), "renderer Commit");
    checker.DisableClipRT();
    EXPECT_EQ(RendererTrace::TakeCalls().back(), "renderer InvalidateState");
}

TEST_F(Checkers, ABitmapAnswersTheSameThroughOne) {
    Pixels const pixels = UniquePixels(6, 5);
    auto const bitmap = NewBitmap(6, 5, pixels.data());
    MKBitmapChecker checker(bitmap.Get());
    Pixels read(pixels.size());
    Seen pixel;
    Seen data;
    EXPECT_EQ(checker.GetPixel(Point(1, 2)), PixelAt(pixels, 6, 1, 2));
    checker.GetPixelAsync(Point(3, 4), &pixel, Seen::OnPixel);
    checker.GetBitmapDataAsync(Rect(0, 0, 6, 4), read.data(), &data, Seen::OnData);
    checker.GetBitmapData(Rect(0, 0, 6, 5), read.data());
    EXPECT_EQ(pixel.pixel, PixelAt(pixels, 6, 3, 4));
    EXPECT_EQ(data.rect, Rect(0, 0, 6, 4));
    EXPECT_EQ(read, pixels);
    EXPECT_EQ(BitmapPtr::Adopt(checker.Clone())->GetBitmapRect(), Rect(0, 0, 6, 5));
    EXPECT_EQ(checker.GetBitmapReadable(), bitmap->GetBitmapReadable());
    EXPECT_EQ(checker.GetBitmapWritable(), bitmap->GetBitmapWritable());
    EXPECT_EQ(checker.GetBitmapCanvasAttachable(), bitmap->GetBitmapCanvasAttachable());
    EXPECT_EQ(checker.GetTextureBitmap(), bitmap->GetTextureBitmap());
    auto const screen = BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 1, 2, 3, 4, 1, 1));
    MKBitmapChecker onScreen(screen.Get());
    EXPECT_THAT(
        (std::vector<int>{onScreen.GetX(), onScreen.GetY(), onScreen.GetWidth(), onScreen.GetHeight()}),
        ElementsAre(1, 2, 3, 4));
    queue.RunAll();
}

TEST_F(Checkers, RefuseEveryOperationAfterTheLastUnref) {
    MKBitmapChecker bitmap(target.Get());
    ExpectRefused<MKBitmapChecker, IMKBitmap>(
        bitmap, target.Get(), "Bitmap",
        {
            [](auto& o) { o.GetPixel({}); },
            [](auto& o) { o.GetPixelAsync({}, nullptr, nullptr); },
            [](auto& o) { o.GetBitmapData({}, nullptr); },
            [](auto& o) { o.GetBitmapDataAsync({}, nullptr, nullptr, nullptr); },
            [](auto& o) { o.GetX(); },
            [](auto& o) { o.GetY(); },
            [](auto& o) { o.GetWidth(); },
            [](auto& o) { o.GetHeight(); },
            [](auto& o) { o.GetBitmapRect(); },
            [](auto& o) { o.Clone(); },
            [](auto& o) { o.GetBitmapReadable(); },
            [](auto& o) { o.GetBitmapWritable(); },
            [](auto& o) { o.GetBitmapCanvasAttachable(); },
            [](auto& o) { o.GetTextureBitmap(); },
        });
    MKCanvasChecker plain(canvas.Get());
    ExpectRefused(plain, canvas.Get(), "Canvas", OfACanvas());
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker penChecker(pen.Get());
    ExpectRefused(penChecker, pen.Get(), "Canvas",
                  OfEveryCanvas<IMKPenCanvas>({
                      [](auto& o) { o.GetBitmap(); },
                      [](auto& o) { o.GetModelMatrix(); },
                      [](auto& o) { o.GetCanvasMatrix(); },
                      [](auto& o) { o.EnableClipRT(1); },
                      [](auto& o) { o.DisableClipRT(); },
                  }));
}

struct CountedBitmap final : ReferenceBitmap {
    using ReferenceBitmap::ReferenceBitmap;
    int Unref() override { return ++unrefs; }

    std::atomic<int> unrefs{0};
};

// Two threads meet at the last reference of one checker after the other, where a check and a change in two
// steps would let both pass. On a busy machine they stop waiting for each other, and meet less often.
TEST_F(Checkers, CountExactlyFromSeveralThreads) {
    using Clock = std::chrono::steady_clock;
    constexpr int kCheckers = 5000;
    CountedBitmap wrapped(Picture(1, 1));
    std::deque<MKBitmapChecker> checkers;
    for (int i = 0; i < kCheckers; ++i) checkers.emplace_back(&wrapped);

    std::atomic<int> arrived{0};
    Clock::time_point const patience = Clock::now() + std::chrono::milliseconds(1000);
    auto const releaseAll = [&] {
        int both = 0;
        for (MKBitmapChecker& shared : checkers) {
            ++arrived;
            both += 2;
            while (arrived < both && Clock::now() < patience) {
            }
            GetRefusal([&] { shared.Unref(); });
        }
    };
    std::thread other(releaseAll);
    releaseAll();
    other.join();
    EXPECT_EQ(wrapped.unrefs, kCheckers);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "ref count : 0"), kCheckers);
}

TEST_F(Checkers, WhatIsPureInACanvasCheckerEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    MKCanvasChecker checker(canvas.Get());
    EXPECT_DEATH(checker.GetMatrix(), "[Pp]ure virtual");
}

} // namespace
} // namespace Moka::Testing
