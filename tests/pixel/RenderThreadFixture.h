// RenderThreadFixture: a render thread for each test, and what every test must leave behind: nothing alive on the GPU, no
// driver message of error severity, no error line that it did not expect.
#pragma once

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/NothingLeft.h"
#include "tests/support/TestImages.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace Moka::Testing {

class RenderThreadFixture : public ::testing::Test {
protected:
    explicit RenderThreadFixture(int maxTextureSize = 0, int surfaceSide = 1) {
        RenderThreadOptions options;
        options.limits.maxTextureSize = maxTextureSize;
        options.debugContext = true;
        options.surfaceWidth = options.surfaceHeight = surfaceSide;
        std::string error;
        thread = RenderThread::Start(options, &error);
        EXPECT_TRUE(thread) << error; // and what follows ends the program
    }
    // When the members of the fixtures that derive from it are gone.
    ~RenderThreadFixture() override {
        thread->WaitForTasks();
        thread->WaitForTasks(); // a canvas that goes last posts the end of its bitmap
        ExpectNothingLeft(RendererFactory::GetStatistics());
        thread.reset();
        for (std::string const& line : log.GetTexts(ANDROID_LOG_ERROR)) ADD_FAILURE() << line;
    }

    RefPtr<IMKBitmap> Create(Picture const& image) {
        auto created = NewBitmap(*thread, image.width, image.height, image.pixels.data());
        thread->WaitForTasks(); // the image may go
        return created;
    }

    LogCapture log;
    std::unique_ptr<RenderThread> thread;
};

} // namespace Moka::Testing
