// Render threads over windows of an X server: what is presented is what the server shows, and what goes wrong
// with a window is told and ends nothing else.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/host/RenderThread.h"
#include "tests/pixel/host/XWindow.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <gmock/gmock.h>

#include <EGL/egl.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <future>
#include <thread>

namespace {
std::atomic<int> theInterval{-1};
}

// In the place of EGL's, for the library too.
extern "C" __attribute__((visibility("default"))) EGLBoolean eglSwapInterval(EGLDisplay, EGLint interval) {
    theInterval = interval;
    return EGL_TRUE;
}

namespace Moka::Testing {
namespace {

using std::chrono::milliseconds;
using testing::ElementsAre;
using testing::HasSubstr;

constexpr int kWidth = 64;
constexpr int kHeight = 48;
constexpr unsigned long kRed = 0xFF0000;
constexpr unsigned long kGreen = 0x00FF00;
constexpr unsigned long kBlue = 0x0000FF;

int ToArgb(unsigned long color) { return static_cast<int>(0xFF000000u | static_cast<unsigned>(color)); }

// The default frame buffer of a thread, filled: a stripe of 8 pixels above, the rest below.
void Fill(RenderThread& queue, int width, int height, unsigned long above, unsigned long below) {
    auto const canvas = NewCanvas(queue, NewScreenBitmap(queue, width, height));
    canvas->ClearAll(ToArgb(below));
    MKPaint paint;
    paint.SetColor(ToArgb(above));
    canvas->DrawRect(0, 0, static_cast<float>(width), 8, &paint);
}

class WindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        if (!window.GetDisplay()) GTEST_SKIP() << "no X server; run under xvfb-run";
        options.nativeWindow = window.GetWindow();
        options.nativeDisplay = window.GetDisplay();
        options.debugContext = true;
        Start();
        if (thread && thread->GetContextInfo().renderer.find("ANGLE") != std::string::npos)
            GTEST_SKIP() << "the ANGLE that the tests fetch is built without a window system";
        ASSERT_TRUE(thread) << error;
    }

    void Start() {
        thread.reset();
        thread = RenderThread::Start(options, &error);
    }

    // The server shows a presented image a moment later.
    bool ShowsSoon(int x, int y, unsigned long color) const {
        return Soon([&] { return window.GetPixel(x, y) == color; });
    }

    // Tasks posted from now on wait until the result is set.
    std::promise<void> Hold() {
        std::promise<void> opened;
        std::promise<void> entered;
        holder = std::thread([this, gate = opened.get_future().share(), &entered] {
            thread->Call([&] {
                entered.set_value();
                gate.wait();
            });
        });
        entered.get_future().wait();
        return opened;
    }

    void TearDown() override {
        if (holder.joinable()) holder.join();
    }

    LogCapture log;
    XWindow window{kWidth, kHeight};
    RenderThreadOptions options;
    std::string error;
    std::unique_ptr<RenderThread> thread;
    std::thread holder;
};

TEST_F(WindowTest, WhatIsDrawnOnAScreenBitmapIsShownWhenPresented) {
    EXPECT_THAT(thread->GetContextInfo().path, HasSubstr("window"));
    EXPECT_EQ(theInterval, 1);
    Fill(*thread, kWidth, kHeight, kRed, kBlue);
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(ShowsSoon(5, 5, kRed));
    EXPECT_TRUE(ShowsSoon(5, kHeight - 5, kBlue));

    Fill(*thread, kWidth, kHeight, kGreen, kGreen);
    thread->WaitForTasks();
    EXPECT_EQ(window.GetPixel(5, 5), kRed); // drawn, not presented
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(ShowsSoon(5, 5, kGreen));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre());
    thread->Stop();
    EXPECT_FALSE(thread->Present());
    EXPECT_FALSE(thread->Present());
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(HasSubstr("stopped")));
}

TEST_F(WindowTest, APresentWaitsForTheOldestOnceAsManyAreOnTheirWayAsMayBe) {
    for (int const limit : {1, 2, 5}) {
        options.framesInFlight = limit;
        options.swapInterval = 0;
        Start();
        ASSERT_TRUE(thread) << error;
        EXPECT_EQ(theInterval, 0);
        std::promise<void> gate = Hold();
        Awaited<int> presented;
        std::thread presenter([&] {
            for (int i = 0; i < 20; ++i) {
                EXPECT_TRUE(thread->Present());
                ++presented;
            }
        });
        presented.AwaitAtLeast(limit);
        std::this_thread::sleep_for(milliseconds(50));
        EXPECT_EQ(presented.Get(), limit);
        gate.set_value();
        presenter.join();
        holder.join();
        EXPECT_EQ(presented.Get(), 20);
        // It would wait for itself.
        thread->Call([&] {
            for (int i = 0; i < 20; ++i) EXPECT_TRUE(thread->Present());
        });
    }
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre());
}

TEST_F(WindowTest, AWindowThatGrowsAndShrinksWhileFramesAreDrawnShowsTheNextFrameWhole) {
    struct Size {
        int width;
        int height;
    };
    std::atomic<Size> drawn{Size{kWidth, kHeight}};
    std::atomic<bool> isOver{false};
    std::thread drawer([&] {
        while (!isOver) {
            Size const size = drawn;
            Fill(*thread, size.width, size.height, size.width > kWidth ? kRed : kBlue, kGreen);
            EXPECT_TRUE(thread->Present());
        }
    });
    for (Size const size : {Size{200, 150}, Size{40, 30}, Size{300, 20}, Size{30, 200}, Size{200, 150}}) {
        window.Resize(size.width, size.height); // frames of the old size are still coming
        std::this_thread::sleep_for(milliseconds(20));
        drawn = size;
        for (int const x : {1, size.width - 2}) {
            EXPECT_TRUE(ShowsSoon(x, 1, size.width > kWidth ? kRed : kBlue)) << size.width;
            EXPECT_TRUE(ShowsSoon(x, size.height - 2, kGreen)) << size.width;
        }
    }
    isOver = true;
    drawer.join();
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre());
}

TEST_F(WindowTest, AWindowThatIsDestroyedWhileFramesWaitIsOneLineAndTheThreadGoesOn) {
    Fill(*thread, kWidth, kHeight, kRed, kRed);
    EXPECT_TRUE(thread->Present());
    std::promise<void> gate = Hold();
    Fill(*thread, kWidth, kHeight, kBlue, kBlue);
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(thread->Present());
    std::thread waiter([&] { thread->Present(); }); // refused, or posted before anybody knew
    window.Destroy();
    gate.set_value();
    waiter.join();
    thread->WaitForTasks();
    EXPECT_FALSE(thread->Present());
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre(HasSubstr("destroyed")));

    auto const bitmap = NewBitmap(*thread, 4, 4);
    NewCanvas(*thread, bitmap)->ClearAll(ToArgb(kRed));
    Fill(*thread, kWidth, kHeight, kBlue, kBlue); // into nothing
    unsigned pixels[16] = {};
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), pixels);
    EXPECT_EQ(pixels[15], 0xFF0000FFu);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, ""), 1);
}

TEST_F(WindowTest, WhatIsNotThereIsToldAndEndsNothing) {
    thread.reset();
    RenderThreadOptions missing = options;
    for (void* const display : {options.nativeDisplay, static_cast<void*>(nullptr)}) {
        missing.nativeDisplay = display;
        for (std::uintptr_t const number :
             {UINTPTR_MAX, std::uintptr_t{1} << 29, options.nativeWindow + 1000}) {
            missing.nativeWindow = number;
            EXPECT_FALSE(RenderThread::Start(missing, &error));
            EXPECT_THAT(error, HasSubstr("no window 0x"));
        }
    }
    std::string const name = std::getenv("DISPLAY");
    setenv("DISPLAY", ":7654", 1);
    EXPECT_FALSE(RenderThread::Start(missing, &error));
    EXPECT_THAT(error, HasSubstr("X server \":7654\""));
    setenv("DISPLAY", name.c_str(), 1);

    for (bool const isInterval : {false, true}) {
        RenderThreadOptions wrong = options;
        (isInterval ? wrong.swapInterval : wrong.framesInFlight) = -1;
        EXPECT_FALSE(RenderThread::Start(wrong, &error));
        EXPECT_THAT(error, HasSubstr(isInterval ? "swapInterval is -1" : "framesInFlight is -1"));
    }

    options.nativeDisplay = nullptr; // the server that DISPLAY names
    Start();
    ASSERT_TRUE(thread) << error;
    Fill(*thread, kWidth, kHeight, kGreen, kGreen);
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(ShowsSoon(5, 5, kGreen));
    EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR), ElementsAre());
}

} // namespace
} // namespace Moka::Testing
