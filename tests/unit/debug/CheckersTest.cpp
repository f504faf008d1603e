// The three checkers: each call reaches the wrapped object as if made on it, until the last Unref.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/debug/MKBitmapChecker.h"
#include "moka/graphics/debug/MKCanvasChecker.h"
#include "moka/graphics/debug/MKPenCanvasChecker.h"
#include "tests/support/LogCapture.h"
#include "tests/unit/debug/Operations.h"

#include <gmock/gmock.h>

#include <atomic>
#include <chrono>
#include <deque>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

struct ForBitmap {
    using Checker = MKBitmapChecker;
    using Wrapped = BitmapLog;
    using Interface = IMKBitmap;
    static constexpr char const* kKind = "Bitmap";
};
struct ForCanvas {
    using Checker = MKCanvasChecker;
    using Wrapped = PlainCanvasLog;
    using Interface = IMKCanvas;
    static constexpr char const* kKind = "Canvas";
};
struct ForPenCanvas {
    using Checker = MKPenCanvasChecker;
    using Wrapped = PenCanvasLog;
    using Interface = IMKPenCanvas;
    static constexpr char const* kKind = "Canvas";
};

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

template <class Traits>
class Checkers : public testing::Test {
protected:
    std::string const refusal = std::string(Traits::kKind) + " was already released!!";
    LogCapture log;
    typename Traits::Wrapped wrapped;
    typename Traits::Checker checker{&wrapped};
};

using AllKinds = testing::Types<ForBitmap, ForCanvas, ForPenCanvas>;
TYPED_TEST_SUITE(Checkers, AllKinds);

TYPED_TEST(Checkers, ForwardEveryOperationOnceAndUnchanged) {
    for (auto const& call : GetOperations<typename TypeParam::Interface>()) {
        std::string const result = call(this->wrapped);
        CallLog::Lines const lines = this->wrapped.TakeLines();
        ASSERT_EQ(lines.size(), 1u);
        EXPECT_EQ(call(this->checker), result) << lines[0];
        EXPECT_EQ(this->wrapped.TakeLines(), lines);
    }
    EXPECT_THAT(this->log.GetTexts(), IsEmpty());
}

TYPED_TEST(Checkers, RefuseEveryOperationAfterTheLastUnref) {
    this->checker.Unref();
    this->wrapped.TakeLines();
    auto operations = GetOperations<typename TypeParam::Interface>();
    operations.emplace_back([](auto& o) { return o.GetTag(); });
    for (auto const& call : operations) {
        this->log.Clear();
        EXPECT_EQ(GetRefusal([&] { call(this->checker); }), this->refusal);
        EXPECT_EQ(this->log.Count(ANDROID_LOG_ERROR), 1);
    }
    EXPECT_EQ(GetRefusal([&] { this->checker.checkRefCount(); }), this->refusal);
    EXPECT_THAT(this->wrapped.TakeLines(), IsEmpty());
}

TYPED_TEST(Checkers, TheErrorLineNamesTheObjectByAddressAndTag) {
    this->checker.SetTag(std::string(200, 't').c_str());
    this->checker.Unref();
    EXPECT_NE(GetRefusal([&] { this->checker.Ref(); }), "");

    typename TypeParam::Interface* const address = &this->wrapped;
    std::ostringstream text;
    text << "checkRefCount, " << TypeParam::kKind << " address : " << address
         << ", tag : " << std::string(126, 't') << " ref count : 0";
    ASSERT_THAT(this->log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(text.str()));
    EXPECT_EQ(this->log.GetLines()[0].tag, "mok_log");
}

// A lock that is still held lets neither of these return.
TYPED_TEST(Checkers, LeaveTheLockBeforeTheObjectIsReachedAndWhenTheyRefuse) {
    auto& checked = this->checker;
    checked.Ref();
    EXPECT_EQ(checked.Unref(), 32);

    std::string inside;
    this->wrapped.onUnref = [&] { inside = GetRefusal([&] { checked.Ref(); }); };
    EXPECT_EQ(checked.Unref(), 32);
    EXPECT_EQ(inside, this->refusal);
    EXPECT_THAT(this->wrapped.TakeLines(), ElementsAre("Ref", "Unref", "Unref"));

    EXPECT_EQ(GetRefusal([&] { checked.Unref(); }), this->refusal);
    EXPECT_EQ(GetRefusal([&] { checked.Unref(); }), this->refusal);
    EXPECT_THAT(this->wrapped.TakeLines(), IsEmpty());
}

// Two threads meet at the last reference of one checker after the other, where a check and a change in two
// steps would let both pass. On a busy machine they stop waiting for each other, and meet less often.
TYPED_TEST(Checkers, CountExactlyFromSeveralThreads) {
    using Clock = std::chrono::steady_clock;
    constexpr int kCheckers = 5000;
    std::deque<typename TypeParam::Checker> checkers;
    for (int i = 0; i < kCheckers; ++i) checkers.emplace_back(&this->wrapped);

    std::atomic<int> arrived{0};
    Clock::time_point const patience = Clock::now() + std::chrono::milliseconds(300);
    auto const releaseAll = [&] {
        int both = 0;
        for (auto& shared : checkers) {
            ++arrived;
            both += 2;
            while (arrived < both && Clock::now() < patience) std::this_thread::yield();
            GetRefusal([&] { shared.Unref(); });
        }
    };
    std::thread other(releaseAll);
    releaseAll();
    other.join();
    EXPECT_EQ(this->wrapped.TakeLines(), CallLog::Lines(kCheckers, "Unref"));
    EXPECT_EQ(this->log.Count(ANDROID_LOG_ERROR, "ref count : 0"), kCheckers);
}

TEST(CheckerTags, ABitmapCheckerAsksTheBitmapAndCanvasCheckersAnswerThemselves) {
    BitmapLog bitmap;
    MKBitmapChecker bitmapChecker(&bitmap);
    bitmapChecker.SetTag("set");
    EXPECT_STREQ(bitmapChecker.GetTag(), "its own");

    PlainCanvasLog canvas;
    MKCanvasChecker canvasChecker(&canvas);
    PenCanvasLog pen;
    MKPenCanvasChecker penChecker(&pen);
    for (IMKCanvasBase* checker :
         {static_cast<IMKCanvasBase*>(&canvasChecker), static_cast<IMKCanvasBase*>(&penChecker)}) {
        EXPECT_STREQ(checker->GetTag(), "");
        checker->SetTag(std::string(200, 't').c_str());
        EXPECT_EQ(checker->GetTag(), std::string(126, 't'));
    }
}

TEST(CheckerDeathTest, WhatIsPureInACanvasCheckerEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    PlainCanvasLog canvas;
    MKCanvasChecker checker(&canvas);
    PenCanvasLog pen;
    MKPenCanvasChecker penChecker(&pen);
    EXPECT_DEATH(checker.GetMatrix(), "[Pp]ure virtual");
    EXPECT_DEATH(checker.GetBitmap(), "[Pp]ure virtual");
    EXPECT_DEATH(penChecker.GetMatrix(), "[Pp]ure virtual");
}

} // namespace
} // namespace Moka::Testing
