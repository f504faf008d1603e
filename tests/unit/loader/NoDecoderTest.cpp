// Loads in a process that has nothing to decode the platform's foreign formats with. On its own, because a
// process does not go back to being without the native decoder.
#include "moka/base/Bitmap.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace Moka::Testing {
namespace {

TEST(NoDecoder, CpuLoadsDoWithoutItAndGpuLoadsDoNot) {
    LogCapture const log;
    TempFolder const folder;
    String const path(folder.Path("a.png"));
    ASSERT_TRUE(SaveImage(MakeGradient(5, 4), folder.Path("a.png")));

    std::unique_ptr<Bitmap> onCpu;
    int errors = 0;
    BitmapLoader::Callback cpu;
    cpu.onLoad = [&](int, String const&, Bitmap& loaded) { onCpu.reset(&loaded); }; // no queue takes it
    MKBitmapLoader::Callback gpu;
    gpu.onLoadError = [&](int, String const&) { ++errors; };
    {
        BitmapLoader cpuLoader("cpu", &cpu);
        MKBitmapLoader gpuLoader("gpu", &gpu);
        BitmapLoader::startEventLoopBySelf();
        cpuLoader.RequestLoad(1, path, nullptr);
        gpuLoader.RequestLoad(2, path, nullptr);
        BitmapLoader::WaitForAllSaveRequestsToEnd(nullptr);
        BitmapLoader::WaitUntilMsgQueueRequired();
    }
    ASSERT_TRUE(onCpu);
    EXPECT_EQ(onCpu->GetWidth(), 5);
    EXPECT_EQ(errors, 1);
    EXPECT_TRUE(log.Has("MKBitmapFactory : gDecodeFile Not loaded"));
}

} // namespace
} // namespace Moka::Testing
