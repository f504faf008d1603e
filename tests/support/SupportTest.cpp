// The trace and the comparison of images that other tests believe in.
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IShaderProgram.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/RendererTrace.h"

#include <gmock/gmock.h>

#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;

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

TEST(ImageCompareTest, ReportsHowManyHowFarAndWhereButWhatMayDiffer) {
    Picture const image = MakeGradient(10, 10);
    Picture changed = image;
    changed.At(3, 4)[3] = 155;
    changed.At(9, 9)[0] = 12;
    ImageDifference const difference = CompareImages(changed, image);
    EXPECT_EQ(difference.differingPixels, 2);
    EXPECT_EQ(difference.largest, 100);
    EXPECT_EQ(difference.firstY, 4);
    EXPECT_EQ(CompareImages(image, MakeGradient(10, 9)).differingPixels, 100);
    Slack slack(10, 10);
    slack.Set(3, 4, 99);
    slack.Set(9, 9, 3);
    EXPECT_EQ(CompareImages(changed, image, &slack).differingPixels, 1);
}

} // namespace
} // namespace Moka::Testing
