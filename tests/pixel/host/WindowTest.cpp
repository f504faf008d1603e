// A render thread over a window of an X server: what is presented is what the server shows.
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"
#include "tests/pixel/host/XWindow.h"

#include <gtest/gtest.h>

#include <chrono>
#include <memory>
#include <thread>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 64;
constexpr int kHeight = 48;

class WindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        window = XWindow::Open(kWidth, kHeight);
        if (!window) GTEST_SKIP() << "no X server; run under xvfb-run";
        options.nativeWindow = window->GetWindow();
        options.nativeDisplay = window->GetDisplay();
    }

    // The server shows a presented image a moment later.
    bool ShowsSoon(int x, int y, unsigned long color) const {
        for (int i = 0; i < 500; ++i) {
            if (window->GetPixel(x, y) == color) return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return false;
    }

    std::unique_ptr<XWindow> window;
    RenderThreadOptions options;
};

TEST_F(WindowTest, WhatIsDrawnOnAScreenBitmapIsShownWhenPresented) {
    std::string error;
    std::unique_ptr<RenderThread> const thread = RenderThread::Start(options, &error);
    ASSERT_TRUE(thread) << error;
    if (thread->GetContextInfo().renderer.find("ANGLE") != std::string::npos) {
        GTEST_SKIP() << "the ANGLE that the tests fetch is built without a window system";
    }
    EXPECT_NE(thread->GetContextInfo().path.find("window"), std::string::npos);
    auto canvas = NewCanvas(*thread, NewScreenBitmap(*thread, kWidth, kHeight));
    canvas->ClearAll(static_cast<int>(0xFF0000FF));
    MKPaint paint;
    paint.SetColor(static_cast<int>(0xFFFF0000));
    canvas->DrawRect(0, 0, kWidth, kHeight / 2.0f, &paint);
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(ShowsSoon(5, 5, 0xFF0000)); // the upper half, not the lower one
    EXPECT_TRUE(ShowsSoon(5, kHeight - 5, 0x0000FF));

    paint.SetColor(static_cast<int>(0xFF00FF00));
    canvas->DrawRect(0, 0, kWidth, kHeight, &paint);
    thread->WaitForTasks();
    EXPECT_EQ(window->GetPixel(5, 5), 0xFF0000u); // drawn, not presented
    EXPECT_TRUE(thread->Present());
    EXPECT_TRUE(ShowsSoon(5, 5, 0x00FF00));
    canvas = {};
    thread->Stop();
    EXPECT_FALSE(thread->Present());
}

} // namespace
} // namespace Moka::Testing
