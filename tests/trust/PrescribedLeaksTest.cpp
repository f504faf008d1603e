// Leaks that callers rely on and that no other test shows.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/bitmap/MKGraphicsFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/trust/Faults.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

TEST(PrescribedLeaks, AFileDecodedForNoQueueLosesItsPixels) {
    LogCapture const log;
    MKBitmapFactory_UseNativeDecoder();
    auto const file =
        std::filesystem::temp_directory_path() / ("moka_leak_" + std::to_string(getpid()) + ".mki");
    String const path(file.string());
    unsigned char pixel[4] = {};
    Bitmap picture;
    ASSERT_TRUE(picture.Construct(pixel, 1, 1, 4, Bitmap::kFormatRgba8888, false, false));
    ASSERT_TRUE(BitmapFactory::SaveBitmap(&picture, &path, 100));
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, &path, 1), nullptr);
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects + 1);
    std::filesystem::remove(file);
}

} // namespace
} // namespace Moka::Testing
