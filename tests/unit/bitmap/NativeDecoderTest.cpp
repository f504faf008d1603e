// Decoding without Java. On its own, because a process does not go back to being without the native decoder.
#include "moka/base/Bitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "tests/support/Allocation.h"
#include "tests/unit/bitmap/FactoryFixture.h"

#include <memory>

namespace Moka::Testing {
namespace {

TEST_F(Factory, TheNativeDecoderOpensEveryFormat) {
    MKBitmapFactory_UseNativeDecoder();
    String const png = Save("b.png", 5, 4);
    String const webp = Save("b.webp", 5, 4);
    for (String const* path : {&png, &webp})
        EXPECT_EQ(ReadAll(BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, path, 1))),
                  UniquePixels(5, 4));
    auto const scaled = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &png, 3, 2, 1));
    ASSERT_TRUE(scaled);
    EXPECT_EQ(scaled->GetBitmapRect(), Rect(0, 0, 3, 2));
    auto const unscaled = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &png, 3, 0, 1));
    EXPECT_EQ(unscaled->GetBitmapRect(), Rect(0, 0, 5, 4)) << "one size alone scales nothing";
    std::unique_ptr<Bitmap> const cpu(MKGraphicsFactory::CreateScaledCPUBitmap(&png, 4, 4));
    ASSERT_TRUE(cpu);
    EXPECT_EQ(cpu->GetWidth(), 4);
    OnRenderThread const here;
    EXPECT_EQ(ReadAll(BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &png, 0))),
              UniquePixels(5, 4));
}

// One decoded copy from the file to the upload, and none after it; scaled, only the result.
TEST_F(Factory, LoadingHoldsOneDecodedCopyUntilItIsUploaded) {
    MKBitmapFactory_UseNativeDecoder();
    constexpr int kWidth = 600;
    constexpr int kHeight = 400;
    constexpr std::size_t kBytes = std::size_t{kWidth} * kHeight * 4;
    RendererTrace::SetMaxTextureSize(kWidth);
    for (char const* name : {"m.mki", "m.png", "m.webp", "m.jpg"}) {
        String const path = Save(name, kWidth, kHeight);
        std::size_t const before = ArrayMemory::GetLive();
        ArrayMemory::ResetPeak();
        auto const bitmap = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &path, 1));
        ASSERT_TRUE(bitmap) << name;
        EXPECT_LT(ArrayMemory::GetPeak() - before, kBytes + kBytes / 4) << name;
        EXPECT_EQ(ArrayMemory::GetLive() - before, kBytes) << name;
        queue.RunAll();
        EXPECT_EQ(ArrayMemory::GetLive(), before) << name;
        OnRenderThread const here; // uploaded at once, and freed
        MKGraphicsFactory::ReleaseBitmap(MKGraphicsFactory::CreateBitmap(&queue, &path, 0));
        EXPECT_EQ(ArrayMemory::GetLive(), before) << name;
        EXPECT_LT(ArrayMemory::GetPeak() - before, kBytes + kBytes / 4) << name;
        ArrayMemory::ResetPeak();
        delete MKGraphicsFactory::CreateScaledCPUBitmap(&path, kWidth / 8, kHeight / 8);
        EXPECT_LT(ArrayMemory::GetPeak() - before, kBytes / 4) << name;
    }
}

} // namespace
} // namespace Moka::Testing
