#include "tests/support/RecordingRenderer.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestImages.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <atomic>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

class RecordingRendererTest : public ::testing::Test {
protected:
    RecordingRendererTest() {
        RecordingRenderer::Reset();
        RendererFactory::AttachContext();
    }
    ~RecordingRendererTest() override { RecordingRenderer::Reset(); }

    static ITextureObject* MakeTexture(int width, int height, PixelSource const& source = {}) {
        return RendererFactory::CreateTextureObject(
            TextureDescriptor(width, height, 0, 2, 6, 1, false, nullptr), nullptr, 0, source);
    }
    static ITextureObject* MakeView(ITextureObject const* model) {
        return RendererFactory::CreateTextureObject(TextureDescriptor(model), nullptr, 0, {});
    }
};

TEST_F(RecordingRendererTest, CreationTakesItsBlockOutOfTheLargerImage) {
    TestImage const image = MakeGradient(300, 20);
    ITextureObject* const texture = MakeTexture(7, 5, {image.pixels.data(), 270, 12, 300});
    EXPECT_EQ(RecordingRenderer::GetTexels(texture), image.Crop(270, 12, 7, 5).pixels);
    EXPECT_THAT(RecordingRenderer::TakeCalls(), ElementsAre("texture 1 Create 7 5 pixels 270 12 300"));
    delete texture;
}

TEST_F(RecordingRendererTest, UploadOutsideIsClippedAndTheSourceAdvances) {
    TestImage const image = MakeGradient(8, 8);
    TestImage expected = MakeChecker(10, 10, 1, {1, 2, 3, 4}, {5, 6, 7, 8});
    ITextureObject* const texture = MakeTexture(10, 10);
    // Over each corner, and just outside on two sides; six columns of an image eight wide.
    for (auto const& [left, top] : {std::pair(-3, -2), {6, -2}, {-3, 5}, {6, 5}, {-8, 0}, {0, 10}}) {
        RecordingRenderer::SetTexels(texture, expected.pixels);
        texture->Replace(Rect(left, top, left + 6, top + 8), image.pixels.data(), image.GetStride());
        for (int y = 0; y < 8; ++y) {
            for (int x = 0; x < 6; ++x) {
                bool const inside = left + x >= 0 && left + x < 10 && top + y >= 0 && top + y < 10;
                if (inside) expected.SetColor(left + x, top + y, image.GetColor(x, y));
            }
        }
        EXPECT_EQ(RecordingRenderer::GetTexels(texture), expected.pixels) << left << ", " << top;
    }
    delete texture;
}

TEST_F(RecordingRendererTest, ReadBackOutsideLeavesTheDestinationAlone) {
    TestImage const image = MakeGradient(4, 4);
    ITextureObject* const texture = MakeTexture(4, 4, {image.pixels.data(), 0, 0, 4});
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    TestImage read = MakeChecker(9, 9, 1, {9, 9, 9, 9}, {7, 7, 7, 7});
    TestImage expected = read;
    // The block (-1, 2, 3, 4) of the target lands 2 rows down and 5 pixels in; rows 2, 3 and columns 0, 1
    // exist.
    target->ReadPixels(-1, 2, 3, 4, {read.pixels.data(), 9, 2, 5});
    for (int y = 2; y < 4; ++y) {
        for (int x = 0; x < 2; ++x) expected.SetColor(5 + x + 1, 2 + y - 2, image.GetColor(x, y));
    }
    EXPECT_EQ(read.pixels, expected.pixels);
    target->Release();
    delete texture;
}

TEST_F(RecordingRendererTest, ViewsShareTheImageButNotTheSampling) {
    ITextureObject* const texture = MakeTexture(2, 2);
    ITextureObject* const view = MakeView(texture);
    view->SetParameter(TextureParamWrappingS, TextureWrapMirroredRepeat);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingS), TextureWrapClampToEdge);

    TestImage const image = MakeGradient(2, 2);
    texture->Replace(image.pixels.data(), 0);
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 1);
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 2);
    delete texture;
    EXPECT_EQ(RecordingRenderer::GetTexels(view), image.pixels);
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 1);
    delete view;
    EXPECT_EQ(RendererFactory::GetStatistics().textures, 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, TheTargetKeepsTheImageOfADeletedTextureAndClearsIt) {
    ITextureObject* const texture = MakeTexture(2, 1);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    delete texture;
    target->ClearColor(1.0f, 0.5f, -3.0f, 0.25f);
    EXPECT_THAT(RecordingRenderer::GetTexels(target), ElementsAre(255, 128, 0, 64, 255, 128, 0, 64));
    target->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, CopiesGoThroughTheActiveTargetWithoutAFlip) {
    TestImage const image = MakeGradient(3, 3);
    ITextureObject* const from = MakeTexture(3, 3, {image.pixels.data(), 0, 0, 3});
    ITextureObject* const to = MakeTexture(2, 4);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(to);
    target->Activate();
    from->DrawToCurrent();
    target->Activate();
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "target 1");
    TestImage expected(2, 4);
    for (int y = 0; y < 3; ++y) {
        for (int x = 0; x < 2; ++x) expected.SetColor(x, y, image.GetColor(x, y));
    }
    EXPECT_EQ(RecordingRenderer::GetTexels(to), expected.pixels);

    ITextureObject* const copy = MakeTexture(1, 2);
    copy->CopyFromRenderTarget();
    EXPECT_EQ(RecordingRenderer::GetTexels(copy), image.Crop(0, 0, 1, 2).pixels);
    target->Deactivate(false, false);
    target->Deactivate(false, false);
    EXPECT_EQ(RendererFactory::GetStatistics().frameBufferSwitches, 2u);
    target->Release();
    for (ITextureObject* texture : {from, to, copy}) delete texture;
}

TEST_F(RecordingRendererTest, TargetsOfTheHostShareItsFrameBuffer) {
    IRenderTarget* const small = RendererFactory::CreateRenderTargetFromDefault(2, 1);
    small->ClearColor(1, 0, 0, 1);
    IRenderTarget* const large = RendererFactory::CreateRenderTargetFromCurrent(1, 2);
    EXPECT_THAT(RecordingRenderer::GetTexels(large),
                ElementsAre(255, 0, 0, 255, 255, 0, 0, 255, 0, 0, 0, 0, 0, 0, 0, 0));
    large->ClearColor(0, 1, 0, 1); // its own column only
    Color pixel = {};
    small->ReadPixels(0, 0, 1, 1, {pixel.data(), 1, 0, 0});
    EXPECT_EQ(pixel, (Color{0, 255, 0, 255}));
    small->ReadPixels(1, 0, 1, 1, {pixel.data(), 1, 0, 0});
    EXPECT_EQ(pixel, (Color{255, 0, 0, 255}));

    // While a texture's target is active, that is the current one.
    ITextureObject* const texture = MakeTexture(1, 1);
    IRenderTarget* const offscreen = RendererFactory::CreateOffscreenRenderTarget(texture);
    offscreen->Activate();
    IRenderTarget* const current = RendererFactory::CreateRenderTargetFromCurrent(4, 4);
    current->ClearColor(0, 0, 1, 1);
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), ElementsAre(0, 0, 255, 255));
    TestImage read(4, 4); // more than there is
    current->ReadPixels(0, 0, 4, 4, {read.pixels.data(), 4, 0, 0});
    EXPECT_EQ(read.GetColor(0, 0), (Color{0, 0, 255, 255}));
    EXPECT_EQ(read.GetColor(1, 0), Color{});
    for (IRenderTarget* target : {small, large, offscreen, current}) target->Release();
    EXPECT_EQ(RecordingRenderer::GetActiveTarget(), "none");
    delete texture;
}

TEST_F(RecordingRendererTest, DiscardedColourIsLostAndWorkIsCounted) {
    ITextureObject* const texture = MakeTexture(1, 1);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(1, 1);
    target->ClearColor(0, 0, 0, 0);
    target->ClearDepthStencil(true, 1, true, 0); // without a buffer
    target->AttachDepthStencil(buffer);
    target->ClearDepthStencil(true, 1, true, 0);
    target->DetachDepthStencil();
    buffer->Release();
    target->Activate();
    texture->DrawToCurrent();
    texture->CopyFromRenderTarget();
    target->Deactivate(false, true);
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), ElementsAre(0, 0, 0, 0));
    target->Deactivate(true, true); // of a target that is not active any more
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), ElementsAre(0, 0, 0, 0));
    target->Activate();
    target->Deactivate(true, true);
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), ElementsAre(255, 0, 255, 255));

    RendererStatistics const statistics = RendererFactory::GetStatistics();
    EXPECT_EQ(statistics.clears, 2u);
    EXPECT_EQ(statistics.copies, 2u);
    EXPECT_EQ(statistics.frameBuffers, 1);
    EXPECT_EQ(statistics.renderBuffers, 0);
    EXPECT_TRUE(RendererFactory::IsGPUNameEqualTo(RendererFactory::GetRendererDeviceCaps()->GetRenderer()));
    EXPECT_FALSE(RendererFactory::IsGPUNameEqualTo("recording"));
    EXPECT_FALSE(RendererFactory::IsGPUNameEqualTo(nullptr));
    target->Release();
    delete texture;
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, UseAfterReleaseAndSecondReleaseAreNoticedEachTime) {
    ITextureObject* const texture = MakeTexture(2, 2);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(2, 2);
    delete texture;
    texture->Bind(0);
    texture->Replace(MakeGradient(2, 2).pixels.data(), 0);
    // cppcheck-suppress doubleFree ; what this is about
    delete texture;
    // cppcheck-suppress doubleFree
    delete texture;
    EXPECT_EQ(RendererFactory::CreateOffscreenRenderTarget(texture), nullptr);
    target->Release();
    target->ClearColor(1, 1, 1, 1);
    target->Release();
    EXPECT_THAT(RecordingRenderer::GetTexels(target), ::testing::Each(0));
    buffer->Release();
    buffer->Release();
    EXPECT_EQ(RecordingRenderer::GetBoundTexture(0), "none");
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("texture 1 Bind after its release", "texture 1 Replace after its release",
                            "texture 1 Release after its release", "texture 1 Release after its release",
                            "texture 1 made a target after its release",
                            "target 1 ClearColor after its release", "target 1 Release after its release",
                            "buffer 1 Release after its release"));
}

TEST_F(RecordingRendererTest, ABufferBelongsToATargetOfItsSizeUntilDetached) {
    ITextureObject* const texture = MakeTexture(2, 2);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    IDepthStencilBuffer* const fitting = RendererFactory::CreateDepthStencilBuffer(2, 2);
    IDepthStencilBuffer* const other = RendererFactory::CreateDepthStencilBuffer(2, 3);
    target->AttachDepthStencil(other);
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("buffer 2 attached to target 1 of another size"));
    other->Release();
    target->AttachDepthStencil(fitting);
    EXPECT_EQ(RecordingRenderer::GetAttachedBuffer(target), "buffer 1");
    fitting->Release();
    EXPECT_EQ(RecordingRenderer::GetAttachedBuffer(target), "none");
    EXPECT_EQ(RecordingRenderer::GetViolations().back(), "buffer 1 released while attached to target 1");
    target->Release();
    delete texture;
}

TEST_F(RecordingRendererTest, EveryThreadButTheDeclaredOneIsNoticed) {
    ITextureObject* texture = nullptr;
    std::thread([&] { texture = MakeTexture(1, 1); }).join();
    ASSERT_NE(texture, nullptr);
    texture->Bind(1);
    std::thread([&] {
        RecordingRenderer::DeclareRenderThread();
        texture->Bind(2);
    }).join();
    texture->Bind(3);
    RecordingRenderer::DeclareNoRenderThread();
    delete texture;
    EXPECT_THAT(RecordingRenderer::GetViolations(),
                ElementsAre("renderer CreateTextureObject outside the render thread",
                            "texture 1 Bind outside the render thread",
                            "texture 1 Release outside the render thread"));
}

TEST_F(RecordingRendererTest, PlannedCreationsFailWithOneErrorLineAndNoOthers) {
    LogCapture log;
    RecordingRenderer::FailCreation(2);
    RecordingRenderer::FailCreations(ObjectKind::DepthStencilBuffer);
    ITextureObject* const first = MakeTexture(1, 1);
    EXPECT_EQ(MakeTexture(1, 1), nullptr);
    ITextureObject* const third = MakeTexture(1, 1);
    EXPECT_EQ(RendererFactory::CreateDepthStencilBuffer(1, 1), nullptr);
    EXPECT_EQ(RendererFactory::CreateDepthStencilBuffer(1, 1), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 3);
    RecordingRenderer::StopFailing();
    IDepthStencilBuffer* const buffer = RendererFactory::CreateDepthStencilBuffer(1, 1);
    ASSERT_NE(first, nullptr);
    ASSERT_NE(third, nullptr);
    ASSERT_NE(buffer, nullptr);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 3);
    delete first;
    delete third;
    buffer->Release();
}

TEST_F(RecordingRendererTest, SizesAndParametersAreRefusedLikeADeviceDoes) {
    LogCapture log;
    auto const largest = [] { return RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(); };
    EXPECT_EQ(largest(), 4096);
    RecordingRenderer::SetMaxTextureSize(8);
    EXPECT_EQ(MakeTexture(9, 1), nullptr);
    EXPECT_EQ(MakeTexture(1, 0), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 2);
    ITextureObject* const texture = MakeTexture(8, 8);
    texture->SetParameter(TextureParamWrappingT, 2);
    texture->SetParameter(TextureParamFilteringMin, TextureWrapMirroredRepeat);
    texture->SetParameter(2, 0);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "SetParameter"), 3);
    EXPECT_EQ(RecordingRenderer::GetParameter(texture, TextureParamWrappingT), TextureWrapClampToEdge);
    delete texture;

    RendererFactory::DetachContext();
    EXPECT_TRUE(RendererFactory::AttachContext({6}));
    EXPECT_FALSE(RendererFactory::AttachContext({7}));
    EXPECT_EQ(largest(), 6);
    RecordingRenderer::SetMaxTextureSize(5);
    EXPECT_EQ(largest(), 5);
}

TEST_F(RecordingRendererTest, ObjectsOfAFormerContextAreInertAndNotCountedAgain) {
    ITextureObject* const texture = MakeTexture(1, 1);
    IRenderTarget* const target = RendererFactory::CreateOffscreenRenderTarget(texture);
    RendererFactory::DetachContext();
    RendererFactory::AttachContext();
    EXPECT_EQ(RendererFactory::GetStatistics().textureObjects, 0);
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 2);
    target->ClearColor(1, 1, 1, 1);
    EXPECT_THAT(RecordingRenderer::GetTexels(texture), ElementsAre(0, 0, 0, 0));
    std::thread([&] { delete texture; }).join();
    target->Release();
    EXPECT_EQ(RecordingRenderer::CountLiveObjects(), 0);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

TEST_F(RecordingRendererTest, ManyThreadsMayAskWhileTheRenderThreadWorks) {
    std::atomic<bool> done{false};
    auto const watch = [&] {
        while (!done) {
            EXPECT_LE(RendererFactory::GetStatistics().textures, 1);
            EXPECT_GT(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(), 0);
            RecordingRenderer::GetCalls();
        }
    };
    std::thread watchers[] = {std::thread(watch), std::thread(watch)};
    for (int i = 0; i < 200; ++i) delete MakeTexture(4, 4);
    done = true;
    for (std::thread& watcher : watchers) watcher.join();
    EXPECT_EQ(RecordingRenderer::CountCalls("Release"), 200);
    EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
}

} // namespace
} // namespace Moka::Testing
