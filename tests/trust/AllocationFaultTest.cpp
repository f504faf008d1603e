// Memory runs out at every place where it can, once and for good, in every scenario.
#include "moka/base/String.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "tests/support/Allocation.h"
#include "tests/support/LogCapture.h"
#include "tests/support/PumpedRenderer.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Scenarios.h"

#include <algorithm>
#include <cctype>
#include <exception>
#include <gtest/gtest.h>
#include <new>
#include <sstream>
#include <typeinfo>

namespace Moka::Testing {
namespace {

// "target 17" is another one in each run.
std::string WithoutNumbers(std::string const& call) {
    std::istringstream words(call);
    std::string word, text;
    for (bool isObject = false; words >> word;
         isObject = std::isalpha(static_cast<unsigned char>(word[0])) != 0)
        if (!isObject || !std::isdigit(static_cast<unsigned char>(word[0]))) text += word + ' ';
    return text;
}

template <class... Shaders>
void Forget() {
    (ShaderManager::GetInstance()->RemoveShader(ShaderManager::Key(typeid(Shaders).name())), ...);
}

// Goes on after a task that threw, as a render thread does. Its own containers, and those of whoever a task calls,
// never lack memory: among them are the books of the tracing renderer.
class SurvivingQueue final : public PumpedRenderer {
public:
    SurvivingQueue() : PumpedRenderer(kMaxTexture) {}
    bool Post(ITask* task) override {
        Faults::Pause const pause;
        return HandPumpedQueue::Post(task);
    }
    void WaitForTasks() override { Settle(); }
    void Settle() {
        Faults::Pause const pause;
        for (;;) {
            try {
                RunAll();
                return;
            } catch (std::exception const&) {
            }
        }
    }
};

std::string NameOfScenario(::testing::TestParamInfo<Scenario> const& scenario) {
    std::string name = scenario.param.name;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

// Scenarios over the tracing renderer, on one thread that stands for both sides. Programs are counted with the other
// objects, so a run that balances leaves nothing alive at all.
class FaultSweep : public ::testing::TestWithParam<Scenario> {
protected:
    void SetUp() override {
        Faults::AcceptLeaks();
        SetLogSink([](LogLine const&) {}); // error lines are expected
        MKBitmapFactory_UseNativeDecoder();
        ASSERT_TRUE(SaveImage(MakeAlphaPattern(20, 90), folder.Path("picture.png")));
        RunScenario(); // whatever is made once and kept is made now
    }
    void TearDown() override {
        for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
        ForgetShaders(); // those that a leaked drawable holds die with the renderer's next reset
        for (std::string const& name : folder.List())
            EXPECT_EQ(name.find(".tmp"), std::string::npos) << "a save left its temporary file " << name;
        SetLogSink({});
    }

    // The shader manager forgets what it has.
    static void ForgetShaders() {
        Forget<MKRectShader, MKLineShader, MKCircleShader, MKRoundRectShader, MKRoundRectRoundShader,
               MKBitmapShader, MKBitmapShaderColorClamp, MKBitmapAdvancedBlendingShader,
               MKBlenderBitmapsShader, MKGaussianBlurShader, MKNonPremultipliedColorShader,
               MKTextMaskBitmapShader, MKStrokeShader>();
    }
    // To its end, or until a call of the library throws for want of memory, and until nothing is posted any more.
    void RunScenario() {
        try {
            GetParam().run({queue, [this] { queue.Settle(); }, folder.GetPath().string()});
        } catch (std::bad_alloc const&) {
        }
        queue.Settle();
    }
    // The same, undisturbed; what it asked of the renderer, without the numbers of the objects.
    std::vector<std::string> TakeFrame() {
        RendererTrace::TakeCalls();
        RunScenario();
        std::vector<std::string> frame = RendererTrace::TakeCalls();
        for (std::string& call : frame) call = WithoutNumbers(call);
        // Of two threads' calls no order is certain.
        if (GetParam().name == "LoadAndSaveInBackground") std::sort(frame.begin(), frame.end());
        return frame;
    }

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
        mFaults += 2 * (count + 1);
        RecordProperty("faults", mFaults);
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

    SurvivingQueue queue;
    TempFolder const folder;

private:
    int mFaults = 0;
};

class AllocationFaults : public FaultSweep {};

// Objects; and the copies of what the caller gave, and the loader's books: a call that lacks memory for them did not
// happen, or throws.
TEST_P(AllocationFaults, ACallWithoutMemoryLeavesNothingBehind) {
    int const alive = RendererTrace::CountLiveObjects();
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    auto const tasks = Faults::CountLive(Faults::Kind::Tasks);
    for (Faults::Kind const kind : {Faults::Kind::Objects, Faults::Kind::Throwing})
        SweepAllocations(kind, [&](bool) {
            EXPECT_EQ(RendererTrace::CountLiveObjects(), alive);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects);
            EXPECT_EQ(Faults::CountLive(Faults::Kind::Tasks), tasks);
            // A class that memory ran out for has no shader from then on: its drawables draw nothing
            // until the process ends. For the sweep it ends here, where no shader is in use.
            ForgetShaders();
        });
}

// Of renderer objects: all but programs, which FailCreation does not count.
TEST_P(AllocationFaults, AnObjectThatTheRendererRefusesLeavesNothingBehindAndTheNextFrameRight) {
    RendererTrace::TakeCalls();
    RunScenario();
    int count = 0;
    for (std::string const& call : RendererTrace::TakeCalls())
        if (call.find(" Create") != std::string::npos && call.rfind("program", 0) != 0) ++count;
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
    Faults::AcceptLeaks();
    MKBitmapFactory_UseNativeDecoder();
    TempFolder const folder;
    String const path(folder.Path("a.mki"));
    ASSERT_TRUE(SaveImage(MakeGradient(1, 1), folder.Path("a.mki")));
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, &path, 1), nullptr);
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects + 1);
}

// Few enough requests for each to fail in turn, and each kind of drawing, clip and bitmap.
std::vector<Scenario> FindSwept() {
    return FindScenarios({"CreateAndRead", "CloneAndShare", "LendToForeignCode", "LoadAndSave", "rect-styles",
                          "round-rect-radii", "circle-styles", "line-caps", "simple-lines", "bitmap-whole",
                          "bitmap-batch", "bitmap-tall", "clip-clear", "clip-primitives", "save-restore",
                          "screen", "cross-fade", "gaussian-blur", "non-premultiplied"});
}

INSTANTIATE_TEST_SUITE_P(Of, AllocationFaults, ::testing::ValuesIn(FindSwept()), NameOfScenario);
INSTANTIATE_TEST_SUITE_P(
    OfManyRequests, AllocationFaults,
    ::testing::ValuesIn(FindScenarios({"strokes", "text-mask", "LoadAndSaveInBackground"})), NameOfScenario);
INSTANTIATE_TEST_SUITE_P(Of, RequestFaults, ::testing::ValuesIn(FindSwept()), NameOfScenario);

} // namespace
} // namespace Moka::Testing
