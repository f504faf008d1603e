#include "moka/host/RenderThread.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/support/LogCapture.h"
#include "tests/support/NothingLeft.h"

#include <GLES3/gl3.h>
#include <gmock/gmock.h>

#include "moka/base/RefPtr.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/host/EglError.h"
#include "moka/host/EglPlatform.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/ImageCompare.h"
#include <array>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using namespace ::testing;

using Pixel = std::array<unsigned char, 4>;

// Ended with its renderer empty and without complaints from the driver.
struct Finish {
    void operator()(RenderThread* thread) const {
        std::unique_ptr<RenderThread> const owned(thread);
        thread->Call([] { RendererFactory::Flush(); });
        ExpectNothingLeft(RendererFactory::GetStatistics()); // of a stopped one's as well
    }
};
using ThreadPtr = std::unique_ptr<RenderThread, Finish>;

ThreadPtr MustStart(RenderThreadOptions const& options = {{}, true, 1, 1}) {
    std::string error;
    ThreadPtr thread(RenderThread::Start(options, &error).release());
    EXPECT_TRUE(thread) << error;
    return thread;
}

class RenderThreadTest : public ::testing::Test {
protected:
    void TearDown() override { EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), IsEmpty()); }

    LogCapture log;
};

constexpr Pixel kOrange = {255, 102, 0, 255};

TEST_F(RenderThreadTest, StartsStopsAndStartsAgain) {
    for (int round = 0; round < 3; ++round) {
        ThreadPtr const thread = MustStart();
        ASSERT_TRUE(thread);
        RenderContextInfo const& info = thread->GetContextInfo();
        EXPECT_THAT(info.path, StartsWith("EGL "));
        EXPECT_THAT(info.version, StartsWith("OpenGL ES 3"));
        EXPECT_THAT(info.renderer, Not(IsEmpty()));
        EXPECT_THAT(info.vendor, Not(IsEmpty()));
        EXPECT_THAT(info.eglVersion, StartsWith("1."));
        EXPECT_GE(info.maxTextureSize, 2048);
        RecordProperty("path", info.path);
        RecordProperty("renderer", info.renderer);

        EXPECT_FALSE(thread->Call([] { throw std::runtime_error("spilled ink"); }));
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "spilled ink"), 1);
        log.Clear();
        EXPECT_TRUE(thread->Call([&] {
            std::thread::id const outer = std::this_thread::get_id();
            EXPECT_TRUE(thread->Call([&] { EXPECT_EQ(std::this_thread::get_id(), outer); }));
        }));
        thread->Stop();
        thread->Stop();
        EXPECT_FALSE(thread->Call([] {}));
        thread->WaitForTasks();
    }
}

TEST_F(RenderThreadTest, TurnsAwayASecondOneAndTheFirstGoesOnWithItsDefaultFrameBuffer) {
    ThreadPtr first = MustStart({{}, true, 64, 1});
    ASSERT_TRUE(first);
    std::string error;
    for (int attempt = 0; attempt < 2; ++attempt) {
        EXPECT_EQ(RenderThread::Start({}, &error), nullptr);
        EXPECT_THAT(error, HasSubstr("stop it first"));
    }
    EXPECT_EQ(RenderThread::Start({{}, false, 0, 16}, &error), nullptr);
    EXPECT_THAT(error, HasSubstr("0 x 16"));

    EXPECT_THAT(first->GetContextInfo().path, HasSubstr("pbuffer 64 x 1"));
    std::array<Pixel, 64> row{};
    GLint stencilBits = 0;
    first->Call([&] {
        glGetIntegerv(GL_STENCIL_BITS, &stencilBits);
        IRenderTarget* const target = RendererFactory::CreateRenderTargetFromDefault(64, 1);
        target->ClearColor(1.0f, 0.4f, 0.0f, 1.0f);
        target->ReadPixels(0, 0, 64, 1, {row.data(), 64, 0, 0});
        target->Release();
    });
    EXPECT_THAT(row, Each(kOrange));
    EXPECT_EQ(stencilBits, 8);
    first.reset();
    EXPECT_TRUE(MustStart());
}

// The renderer collects until it is flushed, so a frame is complete only because running empty flushes.
TEST_F(RenderThreadTest, HandsTheFrameBufferBackWhenTheQueueRunsEmpty) {
    ThreadPtr const thread = MustStart({{}, true, 16, 16});
    ASSERT_TRUE(thread);
    ITextureObject* texture = nullptr;
    IRenderTarget* offscreen = nullptr;
    thread->Call([&] {
        texture = RendererFactory::CreateTextureObject(TextureDescriptor(8, 8, 0, 2, 6, 1, false, nullptr),
                                                       nullptr, 0, {});
        offscreen = RendererFactory::CreateOffscreenRenderTarget(texture);
    });
    ASSERT_NE(offscreen, nullptr);
    auto const countSwitches = [] { return RendererFactory::GetStatistics().frameBufferSwitches; };
    std::uint64_t before = 0;
    thread->Call([&] {
        RendererFactory::Flush();
        before = countSwitches();
        offscreen->ClearColor(1, 0, 0, 1);
        EXPECT_EQ(countSwitches(), before);
    });
    // There and back.
    for (int i = 0; i < 2000 && countSwitches() < before + 2; ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    EXPECT_EQ(countSwitches(), before + 2);
    thread->Call([&] {
        offscreen->Release();
        delete texture;
    });
}

TEST(EglTest, NamesErrorsAsTheHeadersDo) {
    EXPECT_EQ(detail::NameOfEglError(EGL_SUCCESS), "EGL_SUCCESS");
    EXPECT_EQ(detail::NameOfEglError(EGL_CONTEXT_LOST), "EGL_CONTEXT_LOST");
    EXPECT_EQ(detail::NameOfEglError(0x4000), "error 0x4000");
}

TEST(EglTest, FindsWholeExtensionNamesOnly) {
    char const* const list = "EGL_EXT_device_base_long EGL_KHR_surface  EGL_KHR_last";
    EXPECT_TRUE(detail::HasEglExtension(list, "EGL_KHR_surface"));
    EXPECT_TRUE(detail::HasEglExtension(list, "EGL_KHR_last"));
    EXPECT_FALSE(detail::HasEglExtension(list, "EGL_EXT_device_base"));
    EXPECT_FALSE(detail::HasEglExtension(list, "KHR_surface"));
    EXPECT_FALSE(detail::HasEglExtension(nullptr, "EGL_KHR_last"));
}

// EGL gives everybody the same display, and does not count who initialises it.
TEST(EglTest, ADisplayThatTheHostHasInitialisedStaysOpen) {
    EGLDisplay display = EGL_NO_DISPLAY;
    auto const startAndStop = [&display] {
        ThreadPtr const thread = MustStart({});
        thread->Call([&display] { display = eglGetCurrentDisplay(); });
    };
    startAndStop();
    ASSERT_TRUE(eglInitialize(display, nullptr, nullptr));
    startAndStop();
    EXPECT_NE(eglQueryString(display, EGL_VERSION), nullptr);
    eglTerminate(display);
}

// What draws with programs, and keeps them for as long as it lives.
struct Holders {
    std::vector<RefPtr<IMKCanvas>> canvases;
    RefPtr<IMKCustomDrawable> custom;
};

std::vector<Picture> DrawScenes(IGLMsgQueue& queue, Holders& holders) {
    holders.custom = RefPtr<IMKCustomDrawable>::Adopt(new MKGaussianBlurDrawable(&queue));
    Scenes::QueueStage stage(queue);
    std::vector<Picture> pictures;
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        if (scene.needsPen) continue;
        auto const target = NewBitmap(queue, scene.width, scene.height);
        holders.canvases.push_back(NewCanvas(queue, target));
        DrawScene(scene, *holders.canvases.back(), stage);
        Picture& picture = pictures.emplace_back(scene.width, scene.height);
        target->GetBitmapData(target->GetBitmapRect(), picture.pixels.data());
    }
    return pictures;
}

TEST(Restart, EverySceneIsDrawnWhileCanvasesOfStoppedThreadsHoldTheirPrograms) {
    // Reachable for good: never released, like what an application has forgotten.
    static auto& leaked = *new std::vector<Holders>;
    LogCapture const log;
    std::vector<Picture> first;
    for (int round = 0; round <= 2; ++round) {
        std::string error;
        auto const thread = RenderThread::Start({{}, true, 1, 1}, &error);
        ASSERT_TRUE(thread) << error;
        std::vector<Picture> const pictures = DrawScenes(*thread, leaked.emplace_back());
        if (round == 0) first = pictures;
        for (std::size_t i = 0; i < pictures.size(); ++i) {
            EXPECT_GT(CompareImages(Picture(first[i].width, first[i].height), first[i]).differingPixels, 0)
                << i;
            EXPECT_EQ(CompareImages(first[i], pictures[i]).differingPixels, 0) << i << " of start " << round;
        }
    }
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR), std::vector<std::string>{});
}

} // namespace
} // namespace Moka::Testing
