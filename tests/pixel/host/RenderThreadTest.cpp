#include "moka/host/RenderThread.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/ITextureObject.h"
#include "tests/support/LogCapture.h"

#include <gmock/gmock.h>

#include <array>
#include <stdexcept>
#include <thread>

namespace Moka::Testing {
namespace {

using testing::Each;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

using Pixel = std::array<unsigned char, 4>;

std::unique_ptr<RenderThread> MustStart(RenderThreadOptions const& options = {}) {
    std::string error;
    std::unique_ptr<RenderThread> thread = RenderThread::Start(options, &error);
    EXPECT_TRUE(thread) << error;
    return thread;
}

// Clears the target to opaque orange and reads one pixel of it. On the render thread.
Pixel ClearAndRead(IRenderTarget* target, int x, int y) {
    Pixel pixel{};
    if (!target) return pixel;
    target->ClearColor(1.0f, 0.4f, 0.0f, 1.0f);
    target->ReadPixels(x, y, 1, 1, {pixel.data(), 1, 0, 0});
    target->Release();
    return pixel;
}
constexpr Pixel kOrange = {255, 102, 0, 255};

TEST(RenderThreadTest, StartsStopsAndStartsAgain) {
    for (int round = 0; round < 3; ++round) {
        std::unique_ptr<RenderThread> const thread = MustStart();
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

        Pixel pixel{};
        EXPECT_TRUE(thread->Call([&pixel] {
            ITextureObject* const texture = RendererFactory::CreateTextureObject(
                TextureDescriptor(8, 8, 0, 2, 6, 1, false, 0), nullptr, 0, {});
            pixel = ClearAndRead(RendererFactory::CreateOffscreenRenderTarget(texture), 7, 7);
            delete texture;
        }));
        EXPECT_EQ(pixel, kOrange);
        thread->Stop();
        thread->Stop();
        EXPECT_FALSE(thread->Call([] {}));
        thread->WaitForTasks();
    }
}

TEST(RenderThreadTest, TurnsAwayASecondOneAndTheFirstGoesOn) {
    std::unique_ptr<RenderThread> first = MustStart({{}, false, 4, 4});
    ASSERT_TRUE(first);
    std::string error;
    EXPECT_EQ(RenderThread::Start({}, &error), nullptr);
    EXPECT_THAT(error, HasSubstr("stop it first"));

    Pixel pixel{};
    first->Call([&] { pixel = ClearAndRead(RendererFactory::CreateRenderTargetFromDefault(4, 4), 2, 2); });
    EXPECT_EQ(pixel, kOrange);
    first.reset();
    EXPECT_TRUE(MustStart());
}

TEST(RenderThreadTest, GivesADefaultFrameBufferOfTheSizeAskedFor) {
    std::unique_ptr<RenderThread> const thread = MustStart({{}, false, 64, 1});
    ASSERT_TRUE(thread);
    EXPECT_THAT(thread->GetContextInfo().path, HasSubstr("pbuffer 64 x 1"));
    std::array<Pixel, 64> row{};
    thread->Call([&] {
        IRenderTarget* const target = RendererFactory::CreateRenderTargetFromDefault(64, 1);
        target->ClearColor(1.0f, 0.4f, 0.0f, 1.0f);
        target->ReadPixels(0, 0, 64, 1, {row.data(), 64, 0, 0});
        target->Release();
    });
    EXPECT_THAT(row, Each(kOrange));
}

TEST(RenderThreadTest, RefusesASurfaceThatHasNoPixels) {
    std::string error;
    EXPECT_EQ(RenderThread::Start({{}, false, 0, 16}, &error), nullptr);
    EXPECT_THAT(error, HasSubstr("0 x 16"));
}

TEST(RenderThreadTest, LimitsLowerTheLargestTexture) {
    std::unique_ptr<RenderThread> const thread = MustStart({{256}, true, 1, 1});
    ASSERT_TRUE(thread);
    EXPECT_EQ(thread->GetContextInfo().maxTextureSize, 256);
    EXPECT_EQ(RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize(), 256);
}

TEST(RenderThreadTest, CallRunsInOrderAndReportsWhatThrows) {
    LogCapture const log;
    std::unique_ptr<RenderThread> const thread = MustStart();
    ASSERT_TRUE(thread);
    struct Counter {
        int value = 0;
        void Add() { ++value; }
    } counter;
    for (int i = 0; i < 100; ++i) WorkerTask::PostMember(thread.get(), &counter, &Counter::Add);
    int seen = 0;
    std::thread::id outer;
    std::thread::id inner;
    EXPECT_TRUE(thread->Call([&] {
        seen = counter.value;
        outer = std::this_thread::get_id();
        EXPECT_TRUE(thread->Call([&] { inner = std::this_thread::get_id(); }));
    }));
    EXPECT_EQ(seen, 100);
    EXPECT_NE(outer, std::this_thread::get_id());
    EXPECT_EQ(outer, inner);

    EXPECT_FALSE(thread->Call([] { throw std::runtime_error("spilled ink"); }));
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "spilled ink"), 1);
    EXPECT_TRUE(thread->Call([] {}));
}

// The renderer collects until it is flushed, so a frame is complete only because running empty flushes.
TEST(RenderThreadTest, HandsTheFrameBufferBackWhenTheQueueRunsEmpty) {
    std::unique_ptr<RenderThread> const thread = MustStart({{}, false, 16, 16});
    ASSERT_TRUE(thread);
    ITextureObject* texture = nullptr;
    IRenderTarget* offscreen = nullptr;
    thread->Call([&] {
        texture = RendererFactory::CreateTextureObject(TextureDescriptor(8, 8, 0, 2, 6, 1, false, 0), nullptr,
                                                       0, {});
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

} // namespace
} // namespace Moka::Testing
