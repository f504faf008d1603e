// The three checkers: each call reaches the wrapped object as if made on it, until the last Unref.
#include "fuzz/CanvasCalls.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/debug/MKBitmapChecker.h"
#include "moka/graphics/debug/MKCanvasChecker.h"
#include "moka/graphics/debug/MKPenCanvasChecker.h"
#include "tests/support/reference/ReferenceBitmap.h"
#include "tests/unit/canvas/CanvasFixture.h"

#include <atomic>
#include <chrono>
#include <random>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::ThrowsMessage;

template <class Interface>
using Calls = std::vector<std::function<void(Interface&)>>;

class Checkers : public CanvasFixture {
protected:
    void SetUp() override {
        CanvasFixture::SetUp();
        Use(NewBitmap(60, kMaxSide + 10));
    }

    // Makes the calls at random, the same ones each time, and again and again from the same matrix and clip.
    template <class Interface>
    void CallAtRandom(Interface& object, Calls<Interface> const& calls) {
        std::mt19937 random;
        std::vector<std::uint8_t> bytes(20'000);
        for (std::uint8_t& byte : bytes) byte = static_cast<std::uint8_t>(random());
        input = Fuzz::FuzzInput(bytes.data(), bytes.size());
        while (!input.IsEmpty()) {
            int const level = object.Save(IMKCanvasBase::SaveAll);
            for (int i = 0; i < 20; ++i)
                calls[static_cast<std::size_t>(input.Below(static_cast<int>(calls.size())))](object);
            object.Restore(level);
        }
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
            EXPECT_THAT([&] { call(checker); },
                        ThrowsMessage<std::logic_error>(kind + " was already released!!"));
            EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(line.str()));
        }
        EXPECT_EQ(log.GetLines()[0].tag, "mok_log");
        EXPECT_EQ(queue.GetPendingCount(), 0);
    }

    // What every canvas can do.
    template <class Interface>
    Calls<Interface> OfEveryCanvas() {
        Calls<Interface> calls;
        for (Fuzz::Step const step : Fuzz::kSteps) calls.push_back([=](Interface& o) { step(o, input); });
        return calls;
    }
    Calls<IMKCanvas> OfACanvas() {
        Calls<IMKCanvas> calls = OfEveryCanvas<IMKCanvas>();
        BitmapPtr const source = NewBitmap(20, kMaxSide + 10);
        for (Fuzz::Shape const shape : Fuzz::kShapes)
            calls.push_back([=](IMKCanvas& o) {
                Fuzz::ReadPaint(input, paint);
                shape(o, input, source.Get(), &paint);
            });
        auto const f = [this] { return input.Float(); };
        calls.insert(calls.end(),
                     {
                         [=](auto& o) { o.Draw(&drawable, &paint); },
                         [=](auto& o) { o.DrawLine(f(), f(), f(), f(), nullptr); },
                         [=](auto& o) { o.DrawSimpleLine(f(), f(), f(), f(), nullptr); },
                         [=](auto& o) { o.DrawRect(f(), f(), f(), f(), nullptr); },
                         [=](auto& o) { o.DrawRoundRect(f(), f(), f(), f(), f(), f(), nullptr); },
                     });
        return calls;
    }

    // What every bitmap can do, and its answers.
    static Calls<IMKBitmap> OfABitmap(std::vector<std::string>& answers) {
        auto const tell = [&](auto const& answer) { answers.push_back(::testing::PrintToString(answer)); };
        auto const read = std::make_shared<Pixels>(6 * 5 * 4);
        auto const seen = std::make_shared<Seen>();
        return {
            [=](auto& o) { tell(o.GetPixel(Point(1, 2))); },
            [=](auto& o) { o.GetPixelAsync(Point(3, 4), seen.get(), Seen::OnPixel); },
            [=](auto& o) { o.GetBitmapDataAsync(Rect(0, 0, 6, 4), read->data(), seen.get(), Seen::OnData); },
            [=](auto& o) {
                o.GetBitmapData(Rect(0, 0, 6, 5), read->data());
                tell(std::make_tuple(*read, seen->pixel, seen->rect));
            },
            [=](auto& o) { tell(o.GetX()); },
            [=](auto& o) { tell(o.GetY()); },
            [=](auto& o) { tell(o.GetWidth()); },
            [=](auto& o) { tell(o.GetHeight()); },
            [=](auto& o) { tell(o.GetBitmapRect()); },
            [=](auto& o) { tell(BitmapPtr::Adopt(o.Clone())->GetBitmapRect()); },
            [=](auto& o) { tell(o.GetBitmapReadable()); },
            [=](auto& o) { tell(o.GetBitmapWritable()); },
            [=](auto& o) { tell(o.GetBitmapCanvasAttachable()); },
            [=](auto& o) { tell(o.GetTextureBitmap()); },
        };
    }

    FakeDrawable drawable;
    Fuzz::FuzzInput input{nullptr, 0};
};

TEST_F(Checkers, ACanvasDrawsTheSameThroughOne) {
    CallAtRandom(*canvas, OfACanvas());
    std::vector<std::string> const direct = TakePictures();
    EXPECT_GT(direct.size(), 500u);
    int const draws = drawable.draws;
    canvas = {};
    queue.RunAll();
    Use(target);
    paint = MKPaint();
    MKCanvasChecker checker(canvas.Get());
    EXPECT_STREQ(checker.GetTag(), "") << "its own";
    checker.SetTag("set");
    EXPECT_STREQ(checker.GetTag(), "set");
    EXPECT_STREQ(canvas->GetTag(), "set");
    CallAtRandom<IMKCanvas>(checker, OfACanvas());
    EXPECT_EQ(TakePictures(), direct);
    EXPECT_EQ(drawable.draws, 2 * draws);
    EXPECT_EQ(checker.Ref(), 2);
    EXPECT_EQ(checker.Unref(), 1);
    EXPECT_EQ(checker.GetMsgQueue(), &queue);
}

TEST_F(Checkers, APenCanvasAnswersTheSameThroughOne) {
    auto const direct = NewPenCanvas(target);
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker checker(pen.Get());
    Calls<IMKPenCanvas> const calls = OfEveryCanvas<IMKPenCanvas>();
    CallAtRandom(*direct, calls);
    std::vector<std::string> const pictures = TakePictures();
    CallAtRandom<IMKPenCanvas>(checker, calls);
    EXPECT_EQ(TakePictures(), pictures);
    pen->PreTranslate(1, 2);
    EXPECT_EQ(checker.GetModelMatrix(), pen->GetMatrix());
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
    auto const screen = BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 1, 2, 3, 4, 1, 1));
    for (BitmapPtr const& bitmap : {NewBitmap(6, 5, pixels.data()), screen}) {
        std::vector<std::string> direct, through;
        MKBitmapChecker checker(bitmap.Get());
        for (auto const& ask : OfABitmap(direct)) ask(*bitmap);
        for (auto const& ask : OfABitmap(through)) ask(checker);
        EXPECT_EQ(through, direct);
    }
    queue.RunAll();
}

TEST_F(Checkers, RefuseEveryOperationAfterTheLastUnref) {
    MKBitmapChecker bitmap(target.Get());
    std::vector<std::string> none;
    ExpectRefused<MKBitmapChecker, IMKBitmap>(bitmap, target.Get(), "Bitmap", OfABitmap(none));
    MKCanvasChecker plain(canvas.Get());
    ExpectRefused(plain, canvas.Get(), "Canvas", OfACanvas());
    auto const pen = NewPenCanvas(target);
    MKPenCanvasChecker penChecker(pen.Get());
    Calls<IMKPenCanvas> calls = OfEveryCanvas<IMKPenCanvas>();
    calls.insert(calls.end(), {[](auto& o) { o.GetBitmap(); }, [](auto& o) { o.GetModelMatrix(); },
                               [](auto& o) { o.GetCanvasMatrix(); }, [](auto& o) { o.EnableClipRT(1); },
                               [](auto& o) { o.DisableClipRT(); }});
    ExpectRefused(penChecker, pen.Get(), "Canvas", calls);
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
            try {
                shared.Unref();
            } catch (std::logic_error const&) {
            }
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
