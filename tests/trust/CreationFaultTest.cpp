// Every creation of a renderer object fails in turn, once and for good.
#include "tests/support/RendererTrace.h"
#include "tests/trust/Faults.h"
#include "tests/trust/TrustFixture.h"

namespace Moka::Testing {
namespace {

class CreationFaults : public TrustFixture {
protected:
    // Those that FailCreation counts: all but programs.
    int CountCreations() {
        RendererTrace::TakeCalls();
        RunScenario();
        int count = 0;
        for (TracedCall const& call : RendererTrace::GetCalls())
            if (call.operation == "Create" && call.object.rfind("program", 0) != 0) ++count;
        RendererTrace::TakeCalls();
        return count;
    }
};

TEST_P(CreationFaults, LeaveNothingBehindAndTheNextFrameRight) {
    std::vector<std::string> const undisturbed = TakeFrame();
    int const count = CountCreations();
    int const alive = RendererTrace::CountLiveObjects();
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    for (bool const all : {false, true})
        for (int k = 1; k <= count + 1; ++k) {
            SCOPED_TRACE((all ? "all from " : "only ") + std::to_string(k) + " of " + std::to_string(count));
            for (int n = k; n <= (all ? count + 1 : k); ++n) RendererTrace::FailCreation(n);
            RunScenario();
            RendererTrace::StopFailing();
            EXPECT_EQ(RendererTrace::CountLiveObjects(), alive);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
            ASSERT_EQ(TakeFrame(), undisturbed);
        }
    RecordProperty("faults", 2 * (count + 1));
    EXPECT_GT(count, 0);
}

INSTANTIATE_TEST_SUITE_P(Of, CreationFaults, ::testing::ValuesIn(GetScenarios()), NameOfScenario);
INSTANTIATE_TEST_SUITE_P(OfTheLoader, CreationFaults, ::testing::Values(GetLoaderScenario()), NameOfScenario);

} // namespace
} // namespace Moka::Testing
