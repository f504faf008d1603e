// The three checkers: each call reaches the wrapped object as if made on it, until the last Unref.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/MKBitmap.h"
#include "moka/graphics/debug/MKBitmapChecker.h"
#include "moka/graphics/debug/MKCanvasChecker.h"
#include "moka/graphics/debug/MKPenCanvasChecker.h"
#include "tests/unit/canvas/CanvasFixture.h"
#include "tests/unit/canvas/EveryOperation.h"

#include <atomic>
#include <chrono>
#include <deque>
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
    }

    // Each of the calls throws, says so in one line, and does nothing.
    template <class Checker, class Interface>
    void ExpectRefused(Checker& checker, Interface* wrapped, std::string const& kind,
                       Calls<Interface> const& calls) {
        checker.SetTag(std::string(200, 't').c_str());
        wrapped->Ref(); // which the checker gives back
        checker.Unref();
        queue.RunAll();
        std::ostringstream line;
        line << "checkRefCount, " << kind << " address : " << wrapped << ", tag : " << std::string(126, 't')
             << " ref count : 0";
        std::string const refusal = kind + " was already released!!";
        for (auto const& call : calls) {
            SCOPED_TRACE(&call - calls.data());
            log.Clear();
            EXPECT_EQ(GetRefusal([&] { call(checker); }), refusal);
            EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(line.str()));
        }
        EXPECT_EQ(log.GetLines()[0].tag, "mok_log");
        EXPECT_EQ(GetRefusal([&] { checker.checkRefCount(); }), refusal);
        EXPECT_EQ(queue.GetPendingCount(), 0);
    }

    // Those of every checker, and of both canvas checkers.
    template <class Interface>
    static Calls<Interface> OfEveryKind() {
        return {
            [](auto& o) { o.SetTag("tag"); }, [](auto& o) { o.GetTag(); }, [](auto& o) { o.GetMsgQueue(); },
            [](auto& o) { o.Ref(); },         [](auto& o) { o.Unref(); },
        };
    }
    template <class Interface>
    static Calls<Interface> OfEveryCanvas() {
        Calls<Interface> calls = {
            [](auto& o) { o.Clear(1); },
            [](auto& o) { o.Clear(1, 2, 3, 4); },
            [](auto& o) { o.ClearAll(1); },
            [](auto& o) { o.ClearAll(1, 2, 3, 4); },
            [](auto& o) { o.Save(IMKCanvasBase::SaveClip); },
            [](auto& o) { o.Restore(1); },
            [](auto& o) { o.SetClipRect(1, 2, 3, 4, IMKCanvasBase::Difference); },
            [](auto& o) { o.SetMatrix({}); },
            [](auto& o) { o.PreConcat({}); },
            [](auto& o) { o.PostConcat({}); },
            [](auto& o) { o.PreScale(1, 2); },
            [](auto& o) { o.PostScale(1, 2); },
            [](auto& o) { o.PreRotate(1); },
            [](auto& o) { o.PreRotate(1, 2, 3); },
            [](auto& o) { o.PostRotate(1); },
            [](auto& o) { o.PostRotate(1, 2, 3); },
            [](auto& o) { o.PreTranslate(1, 2); },
            [](auto& o) { o.PostTranslate(1, 2); },
        };
        return Join(OfEveryKind<Interface>(), std::move(calls));
    }
    template <class Interface>
    static Calls<Interface> Join(Calls<Interface> calls, Calls<Interface> const& more) {
        calls.insert(calls.end(), more.begin(), more.end());
        return calls;
    }
};

TEST_F(Checkers, ACanvasDrawsTheSameThroughOne) {
    auto const source = NewBitmap(20, kMaxSide + 10);
    FakeDrawable drawable;
    DrawEverything(*canvas, source.Get(), &drawable);
    std::vector<std::string> const direct = TakePictures();
    canvas = {};
    queue.RunAll();
    Use(target);
    MKCanvasChecker checker(canvas.Get());
    DrawEverything(checker, source.Get(), &drawable);
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
    TransformInEveryWay(*pen);
    Matrix3<float> const transformed = pen->GetMatrix();
    TransformInEveryWay(checker);
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
    queue.RunAll();
    EXPECT_EQ(pixel.pixel, PixelAt(pixels, 6, 3, 4));
    EXPECT_EQ(data.rect, Rect(0, 0, 6, 4));
    EXPECT_EQ(data.destination, read.data());
    checker.GetBitmapData(Rect(0, 0, 6, 5), read.data());
    EXPECT_EQ(read, pixels);
    EXPECT_EQ(BitmapPtr::Adopt(checker.Clone())->GetBitmapRect(), Rect(0, 0, 6, 5));
    EXPECT_EQ(checker.GetBitmapReadable(), bitmap->GetBitmapReadable());
    EXPECT_EQ(checker.GetBitmapWritable(), bitmap->GetBitmapWritable());
    EXPECT_EQ(checker.GetBitmapCanvasAttachable(), bitmap->GetBitmapCanvasAttachable());
    EXPECT_EQ(checker.GetTextureBitmap(), bitmap->GetTextureBitmap());
    checker.SetTag("set");
    bitmap->SetTag("its own");
    EXPECT_STREQ(checker.GetTag(), "its own");

    auto const screen = BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 1, 2, 3, 4, 1, 1));
    MKBitmapChecker onScreen(screen.Get());
    EXPECT_THAT(
        (std::vector<int>{onScreen.GetX(), onScreen.GetY(), onScreen.GetWidth(), onScreen.GetHeight()}),
        ElementsAre(1, 2, 3, 4));
    EXPECT_EQ(onScreen.GetBitmapRect(), Rect(1, 2, 4, 6));
    queue.RunAll();
}

TEST_F(Checkers, RefuseEveryOperationAfterTheLastUnref) {
    MKBitmapChecker bitmap(target.Get());
    ExpectRefused(bitmap, target.Get(), "Bitmap",
                  Join(OfEveryKind<IMKBitmap>(),
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
                       }));
    RectF const r;
    std::vector<PointF> points;
    std::vector<RectF> const rects;
    MKCanvasChecker plain(canvas.Get());
    ExpectRefused(
        plain, canvas.Get(), "Canvas",
        Join(OfEveryCanvas<IMKCanvas>(), {
                                             [](auto& o) { o.Draw(nullptr, nullptr); },
                                             [](auto& o) { o.DrawLine(1, 2, 3, 4, nullptr); },
                                             [](auto& o) { o.DrawLine({}, {}, nullptr); },
                                             [](auto& o) { o.DrawSimpleLine(1, 2, 3, 4, nullptr); },
                                             [](auto& o) { o.DrawSimpleLine({}, {}, nullptr); },
                                             [&](auto& o) { o.DrawSimpleLines(points, nullptr); },
                                             [](auto& o) { o.DrawRect(1, 2, 3, 4, nullptr); },
                                             [&](auto& o) { o.DrawRect(r, nullptr); },
                                             [](auto& o) { o.DrawRoundRect(1, 2, 3, 4, 5, 6, nullptr); },
                                             [&](auto& o) { o.DrawRoundRect(r, 1, 2, nullptr); },
                                             [](auto& o) { o.DrawCircle(1, 2, 3, nullptr); },
                                             [](auto& o) { o.DrawBitmap(nullptr, 1, 2, nullptr); },
                                             [&](auto& o) { o.DrawBitmap(nullptr, r, nullptr); },
                                             [&](auto& o) { o.DrawBitmap(nullptr, r, r, nullptr); },
                                             [&](auto& o) { o.DrawBitmaps(nullptr, points, nullptr); },
                                             [&](auto& o) { o.DrawBitmaps(nullptr, rects, nullptr); },
                                             [&](auto& o) { o.DrawBitmaps(nullptr, r, rects, nullptr); },
                                         }));
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker penChecker(pen.Get());
    ExpectRefused(penChecker, pen.Get(), "Canvas",
                  Join(OfEveryCanvas<IMKPenCanvas>(), {
                                                          [](auto& o) { o.GetBitmap(); },
                                                          [](auto& o) { o.GetModelMatrix(); },
                                                          [](auto& o) { o.GetCanvasMatrix(); },
                                                          [](auto& o) { o.EnableClipRT(1); },
                                                          [](auto& o) { o.DisableClipRT(); },
                                                      }));
}

struct Hooked final : MKBitmap {
    Hooked() : MKBitmap(nullptr, 0, 0, 1, 1) {}
    unsigned int GetPixel(Point const&) override { return 0; }
    void GetPixelAsync(Point const&, void*, PixelCallback) override {}
    void GetBitmapData(Rect const&, void*) override {}
    void GetBitmapDataAsync(Rect const&, void*, void*, DataCallback) override {}
    IMKBitmap* Clone() override { return nullptr; }
    int Unref() override {
        ++unrefs;
        if (onUnref) onUnref();
        return 32;
    }

    std::atomic<int> unrefs{0};
    std::function<void()> onUnref;
};

// A lock that is still held lets neither of these return.
TEST_F(Checkers, LeaveTheLockBeforeTheObjectIsReachedAndWhenTheyRefuse) {
    std::string const refusal = "Bitmap was already released!!";
    Hooked wrapped;
    MKBitmapChecker checker(&wrapped);
    checker.Ref();
    EXPECT_EQ(checker.Unref(), 32);
    std::string inside;
    wrapped.onUnref = [&] { inside = GetRefusal([&] { checker.Ref(); }); };
    EXPECT_EQ(checker.Unref(), 32);
    EXPECT_EQ(inside, refusal);
    for (int i = 0; i < 2; ++i) EXPECT_EQ(GetRefusal([&] { checker.Unref(); }), refusal);
    EXPECT_EQ(wrapped.unrefs, 2);
}

// Two threads meet at the last reference of one checker after the other, where a check and a change in two
// steps would let both pass. On a busy machine they stop waiting for each other, and meet less often.
TEST_F(Checkers, CountExactlyFromSeveralThreads) {
    using Clock = std::chrono::steady_clock;
    constexpr int kCheckers = 5000;
    Hooked wrapped;
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

using CheckerDeathTest = Checkers;

TEST_F(CheckerDeathTest, WhatIsPureInACanvasCheckerEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    MKCanvasChecker checker(canvas.Get());
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker penChecker(pen.Get());
    EXPECT_DEATH(checker.GetMatrix(), "[Pp]ure virtual");
    EXPECT_DEATH(checker.GetBitmap(), "[Pp]ure virtual");
    EXPECT_DEATH(penChecker.GetMatrix(), "[Pp]ure virtual");
}

} // namespace
} // namespace Moka::Testing
