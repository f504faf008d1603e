// Memory runs out at every place where it can, once and for good, in every scenario.
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"
#include "tests/trust/Faults.h"
#include "tests/trust/TrustFixture.h"

namespace Moka::Testing {
namespace {

class FaultSweep : public TrustFixture {
protected:
    // Runs the scenario with the k-th failing, or all from the k-th on, for each k that there is and one more.
    template <class Run, class Check>
    void Sweep(int count, Run const& run, Check const& check) {
        std::vector<std::string> const undisturbed = TakeFrame();
        for (bool const all : {false, true})
            for (int k = 1; k <= count + 1 && !HasFatalFailure(); ++k) {
                SCOPED_TRACE((all ? "all from " : "only ") + std::to_string(k) + " of " +
                             std::to_string(count));
                run(k, all);
                check(k <= count);
                ASSERT_EQ(TakeFrame(), undisturbed);
            }
        RecordProperty("faults", 2 * (count + 1));
        EXPECT_GT(count, 0);
    }
    template <class Check>
    void SweepAllocations(Faults::Kind kind, Check const& check) {
        auto const run = [&](int k, bool all) {
            Faults::Arm(kind, k, all);
            RunScenario();
            return Faults::Disarm();
        };
        RunScenario();
        Sweep(run(0, false), run, check);
    }
};

class AllocationFaults : public FaultSweep {};

TEST_P(AllocationFaults, AnObjectThatCannotBeMadeLeavesNothingBehind) {
    int const alive = RendererTrace::CountLiveObjects();
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    SweepAllocations(Faults::Kind::Objects, [&](bool) {
        EXPECT_EQ(RendererTrace::CountLiveObjects(), alive);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
        // A class that memory ran out for has no shader from then on, by design: its drawables draw nothing
        // until the process ends. For the sweep it ends here, where no shader is in use.
        ForgetShaders();
    });
}

// The copies of what the caller gave, and the loader's books: a call that lacks memory for them did not happen, or
// throws.
TEST_P(AllocationFaults, ACallWithoutMemoryForItsCopiesLeavesNothingBehind) {
    int const alive = RendererTrace::CountLiveObjects();
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    SweepAllocations(Faults::Kind::Throwing, [&](bool) {
        EXPECT_EQ(RendererTrace::CountLiveObjects(), alive);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
    });
}

// Of renderer objects: all but programs, which FailCreation does not count.
TEST_P(AllocationFaults, AnObjectThatTheRendererRefusesLeavesNothingBehindAndTheNextFrameRight) {
    RendererTrace::TakeCalls();
    RunScenario();
    int count = 0;
    for (TracedCall const& call : RendererTrace::GetCalls())
        if (call.operation == "Create" && call.object.rfind("program", 0) != 0) ++count;
    int const alive = RendererTrace::CountLiveObjects();
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    Sweep(
        count,
        [&](int k, bool all) {
            for (int n = k; n <= (all ? count + 1 : k); ++n) RendererTrace::FailCreation(n);
            RunScenario();
            RendererTrace::StopFailing();
        },
        [&](bool) {
            EXPECT_EQ(RendererTrace::CountLiveObjects(), alive);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
        });
}

class RequestFaults : public FaultSweep {};

// A request that cannot be made is one that the queue refused: what it would have acted on, given back or
// deleted may stay for good. So what stays is only looked at where every request was made; RefusingQueueTest shows
// that nothing else stays.
TEST_P(RequestFaults, ARequestThatCannotBeMadeIsARefusedOne) {
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    SweepAllocations(Faults::Kind::Tasks, [&](bool failed) {
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
        int const live = RendererTrace::CountLiveObjects();
        auto const objects = Faults::CountLive(Faults::Kind::Objects);
        // A drawable that was never deleted keeps its shader in use, with all that was set in it.
        ForgetShaders();
        if (failed) return;
        RunScenario();
        EXPECT_EQ(RendererTrace::CountLiveObjects(), live);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
    });
}

// Callers rely on this leak, which no other test shows.
TEST(FileWithoutAQueue, LosesItsDecodedPixels) {
    LogCapture const log;
    MKBitmapFactory_UseNativeDecoder();
    TempFolder const folder;
    String const path(folder.Path("a.mki"));
    ASSERT_TRUE(SaveImage(MakeGradient(1, 1), folder.Path("a.mki")));
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, &path, 1), nullptr);
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects + 1);
}

// The containers of a canvas: what they have no memory for did not happen, and nobody sees an exception.
TEST(ThrowingAllocationFaults, ALevelOrAClipThatDoesNotFitIsDropped) {
    RendererTrace::Reset();
    ASSERT_TRUE(RendererFactory::AttachContext());
    HandPumpedQueue queue;
    {
        auto const target =
            RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(&queue, 8, 8, nullptr, false, 0, false));
        auto const canvas =
            RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&queue, target.Get(), 0));
        canvas->PreScale(2, 2);
        Faults::Arm(Faults::Kind::Throwing, 1, true);
        int const level = canvas->Save(IMKCanvas::SaveAll);
        canvas->SetClipRect(0, 0, 1, 1, IMKCanvas::Intersect);
        int const refused = Faults::Disarm();
        EXPECT_EQ(refused, 2);
        EXPECT_EQ(level, 0);
        canvas->PreScale(3, 3);
        Matrix3<float> const scaled = canvas->GetMatrix();
        canvas->Restore(level);
        EXPECT_TRUE(canvas->GetMatrix() == scaled);
        canvas->Clear(1, 1, 1, 1);
        EXPECT_FALSE(RendererTrace::GetClears().back().state.scissorOn);
    }
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    RendererFactory::DetachContext();
}

INSTANTIATE_TEST_SUITE_P(Of, AllocationFaults, ::testing::ValuesIn(GetScenarios()), NameOfScenario);
INSTANTIATE_TEST_SUITE_P(OfTheLoader, AllocationFaults, ::testing::Values(GetLoaderScenario()),
                         NameOfScenario);
INSTANTIATE_TEST_SUITE_P(Of, RequestFaults, ::testing::ValuesIn(GetScenarios()), NameOfScenario);

} // namespace
} // namespace Moka::Testing
