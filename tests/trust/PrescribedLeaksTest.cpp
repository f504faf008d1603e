// Leaks that callers rely on and that no other test shows.
#include "moka/base/String.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Faults.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

TEST(PrescribedLeaks, AFileDecodedForNoQueueLosesItsPixels) {
    LogCapture const log;
    MKBitmapFactory_UseNativeDecoder();
    TempFolder const folder;
    String const path(folder.Path("a.mki"));
    ASSERT_TRUE(SaveImage(MakeGradient(1, 1), folder.Path("a.mki")));
    auto const objects = Faults::CountLive(Faults::Kind::Objects);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, &path, 1), nullptr);
    EXPECT_EQ(Faults::CountLive(Faults::Kind::Objects), objects + 1);
}

} // namespace
} // namespace Moka::Testing
