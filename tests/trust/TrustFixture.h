// TrustFixture: scenarios over the tracing renderer, on one thread that stands for both sides. Programs
// are counted with the other objects, so a run that balances leaves nothing alive at all.
#pragma once

#include "tests/support/Queues.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Scenarios.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace Moka::Testing {

// Goes on after a task that threw, as a render thread does. Its own containers, and those of whoever a task calls,
// never lack memory: among them are the books of the tracing renderer.
class SurvivingQueue final : public HandPumpedQueue {
public:
    bool Post(ITask* task) override;
    void WaitForTasks() override { Settle(); }
    void Settle();
};

inline std::string NameOfScenario(::testing::TestParamInfo<Scenario> const& scenario) {
    return scenario.param.name;
}

class TrustFixture : public ::testing::TestWithParam<Scenario> {
protected:
    static constexpr int kMaxSide = 64;

    void SetUp() override;
    void TearDown() override;

    // To its end, or until a call of the library throws for want of memory, and until nothing is posted any more.
    void RunScenario();
    // The same, undisturbed; what it asked of the renderer, without the numbers of the objects.
    std::vector<std::string> TakeFrame();
    // The shader manager forgets what it has.
    static void ForgetShaders();

    SurvivingQueue queue;
    TempFolder const folder;
};

} // namespace Moka::Testing
