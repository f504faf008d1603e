// The queues and the comparison of images that other tests believe in.
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/Queues.h"
#include "tests/support/RendererTrace.h"

#include <gmock/gmock.h>

#include <new>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;

// Says when it runs, posting another one, and when it is freed.
class NotingTask final : public ITask {
public:
    NotingTask(std::vector<std::string>& notes, HandPumpedQueue* queue) : mNotes(notes), mQueue(queue) {}
    ~NotingTask() override { mNotes.emplace_back("freed"); }
    void run() override {
        mNotes.emplace_back("run");
        if (!mQueue) throw std::runtime_error("task");
        mQueue->Post(new (std::nothrow) NotingTask(mNotes, nullptr));
        mQueue->WaitForTasks(); // a deadlock elsewhere
    }

private:
    std::vector<std::string>& mNotes;
    HandPumpedQueue* mQueue;
};

TEST(HandPumpedQueueTest, RunsInPostingOrderAndFreesEachOnceAlsoWhatThrowsOrNeverRuns) {
    std::vector<std::string> notes;
    {
        HandPumpedQueue queue;
        queue.SetAroundRun([&] { notes.emplace_back("begin"); }, [&] { notes.emplace_back("end"); });
        queue.Post(new (std::nothrow) NotingTask(notes, &queue));
        EXPECT_TRUE(queue.RunOne());
        EXPECT_THROW(queue.WaitForTasks(), std::runtime_error);
        EXPECT_THAT(notes, ElementsAre("begin", "run", "freed", "end", "begin", "run", "freed", "end"));
        EXPECT_EQ(queue.GetWaitCount(), 1);
        EXPECT_FALSE(queue.RunOne());
        queue.Post(new (std::nothrow) NotingTask(notes, nullptr));
    }
    EXPECT_EQ(notes.size(), 9u);
    NotingTask refused(notes, nullptr);
    EXPECT_FALSE(RefusingQueue().Post(&refused));
}

// Were the trace silent, no test over it would be the wiser.
TEST(RendererTraceTest, MisuseIsNoticed) {
    RendererTrace::Reset();
    RendererFactory::AttachContext();
    ITextureObject* const texture = RendererFactory::CreateTextureObject(
        TextureDescriptor(2, 2, 0, 2, 6, 1, false, nullptr), nullptr, 0, {});
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
    target->AttachDepthStencil(buffer);
    buffer->Release();
    target->ClearDepthStencil(true, 1, true, 0);
    IShaderProgram* const program = RendererFactory::CreateShaderProgram("", "uniform bool uOn;", "Sample");
    IParameterBinding* const parameter = program->GetParameter("uOn");
    program->Release();
    bool const on = true;
    parameter->Set(&on);
    delete parameter;
    RendererTrace::DeclareNoRenderThread();
    RendererFactory::Commit();
    std::thread([&] { delete texture; }).join();
    target->Release();
    RendererFactory::DetachContext();
    RendererFactory::Flush();
    EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
    EXPECT_THAT(RendererTrace::GetViolations(), ElementsAre("buffer 1 released while attached to target 1",
                                                            "program 1 SetParameter after its release",
                                                            "renderer Commit outside the render thread",
                                                            "texture 1 Release outside the render thread",
                                                            "target 1 Release outside the render thread",
                                                            "renderer Flush without a context"));
    RendererTrace::Reset();
}

TEST(ImageCompareTest, ReportsHowManyHowFarAndWhere) {
    Picture const image = MakeGradient(10, 10);
    Picture changed = image;
    changed.At(3, 4)[3] = 155;
    changed.At(9, 9)[0] = 12;
    ImageDifference const difference = CompareImages(changed, image);
    EXPECT_EQ(difference.differingPixels, 2);
    EXPECT_EQ(difference.largest, 100);
    EXPECT_DOUBLE_EQ(difference.mean, 103.0 / 400);
    EXPECT_EQ(difference.firstX, 3);
    EXPECT_EQ(difference.firstY, 4);
    EXPECT_EQ(CompareImages(image, image).differingPixels, 0);
    EXPECT_EQ(CompareImages(image, MakeGradient(10, 9)).differingPixels, 100);
    Slack slack(10, 10);
    slack.Set(3, 4, 99);
    slack.Set(9, 9, 300); // anything
    EXPECT_EQ(CompareImages(changed, image, &slack).differingPixels, 1);
    slack.Set(3, 4, 100);
    EXPECT_EQ(CompareImages(changed, image, &slack).differingPixels, 0);
    EXPECT_EQ(slack.CountOver(100), 1);
}

} // namespace
} // namespace Moka::Testing
