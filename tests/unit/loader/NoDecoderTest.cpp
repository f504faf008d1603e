// Loads in a process that has nothing to decode the platform's foreign formats with. On its own, because a
// process does not go back to being without the native decoder.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestImages.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <memory>
#include <string>

#include <unistd.h>

namespace Moka::Testing {
namespace {

TEST(NoDecoder, CpuLoadsDoWithoutItAndGpuLoadsDoNot) {
    LogCapture const log;
    auto const file =
        std::filesystem::temp_directory_path() / ("moka_no_decoder_" + std::to_string(getpid()) + ".png");
    String const path(file.string());
    TestImage image = MakeGradient(5, 4);
    Bitmap bitmap;
    ASSERT_TRUE(bitmap.Construct(image.pixels.data(), 5, 4, 20, 1, false, false));
    ASSERT_TRUE(BitmapFactory::SaveBitmap(&bitmap, &path, 100));

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
    std::filesystem::remove(file);
}

} // namespace
} // namespace Moka::Testing
