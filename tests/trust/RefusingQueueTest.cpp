// A queue that refuses at random. The book must balance: every task is run or refused and destroyed once, and
// what is left alive is exactly what the refused tasks were to give back.
#include "tests/trust/LeakLedger.h"

#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"
#include "tests/trust/Faults.h"
#include "tests/trust/MixedWork.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

constexpr std::int64_t kPosts = 1000000;
constexpr std::int64_t kPostsBetweenSettlements = 50000;

class RefusingQueueTest : public ::testing::TestWithParam<int> {
protected:
    void SetUp() override {
        RendererTrace::Reset();
        RendererTrace::KeepRecords(false);
        RendererTrace::SetMaxTextureSize(MixedWork::kSide);
        ASSERT_TRUE(RendererFactory::AttachContext());
        RendererTrace::DeclareNoRenderThread();
        queue.SetAroundRun([] { RendererTrace::DeclareRenderThread(); },
                           [] { RendererTrace::DeclareNoRenderThread(); });
    }
    void TearDown() override {
        RendererTrace::DeclareRenderThread();
        RendererFactory::DetachContext();
    }

    // Runs what was accepted, then does for each refused task what it would have given back.
    void SettleTheBook() {
        queue.RunAll();
        queue.SetReliable(true);
        RendererTrace::DeclareRenderThread();
        queue.GetLedger().Settle();
        RendererTrace::DeclareNoRenderThread();
        queue.RunAll();
        queue.SetReliable(false);
    }

    UnreliableQueue queue{7u, GetParam()};
    LogCapture log;
};

TEST_P(RefusingQueueTest, TheBookBalancesOverAMillionPosts) {
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    MixedWork work(queue, 11, nullptr);
    std::int64_t leaked = 0;
    while (queue.CountOffered() < kPosts && !HasFailure()) {
        std::int64_t const end = queue.CountOffered() + kPostsBetweenSettlements;
        while (queue.CountOffered() < end) {
            work.Step();
            if (queue.CountOffered() % 3 == 0) queue.RunAll();
            log.Clear();
        }
        work.DropAll();
        queue.RunAll();
        leaked += queue.GetLedger().CountEntries();
        EXPECT_GT(RendererTrace::CountLiveObjects(), 0); // before it is settled
        SettleTheBook();
        EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
        EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
    }
    EXPECT_EQ(queue.CountOffered(), std::int64_t{queue.GetPostedCount()} + queue.GetRefusedCount());
    EXPECT_EQ(queue.GetPostedCount(), queue.GetRunCount());
    EXPECT_EQ(queue.GetNullCount(), 0);
    EXPECT_THAT(queue.GetUnknown(), ::testing::IsEmpty());
    EXPECT_EQ(Faults::CountWrongFrees(), 0);
    EXPECT_EQ(leaked, queue.GetRefusedCount());
    EXPECT_GE(queue.GetLedger().GetKinds().size(), 30u); // the work is mixed
    std::vector<std::string> const violations = RendererTrace::GetViolations();
    EXPECT_TRUE(violations.empty()) << violations.size() << ", " << violations.front();
    RecordProperty("refused", queue.GetRefusedCount());
}

INSTANTIATE_TEST_SUITE_P(PerCent, RefusingQueueTest, ::testing::Values(1, 10, 50));

} // namespace
} // namespace Moka::Testing
