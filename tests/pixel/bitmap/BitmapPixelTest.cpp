// Bitmaps on a real driver: what goes up comes back, over strips, shared or not, and nothing stays behind.
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "tests/pixel/RenderThreadFixture.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/Queues.h"
#include "tests/support/TestFiles.h"

#include <cstring>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
constexpr int kMaxSide = 64;

class PixelBitmap : public RenderThreadFixture {
protected:
    PixelBitmap() : RenderThreadFixture(kMaxSide) {}

    static Picture Read(BitmapPtr const& bitmap, Rect const& r) {
        Picture image(r.GetWidth(), r.GetHeight());
        bitmap->GetBitmapData(r, image.pixels.data());
        return image;
    }
    static Picture Read(BitmapPtr const& bitmap) { return Read(bitmap, bitmap->GetBitmapRect()); }

    static void ExpectSame(Picture const& a, Picture const& b) {
        ImageDifference const difference = CompareImages(a, b);
        EXPECT_EQ(difference.differingPixels, 0) << difference;
    }
};

TEST_F(PixelBitmap, RoundTripsEveryStripCountBitForBit) {
    for (int height : {1, kMaxSide - 1, kMaxSide, kMaxSide + 1, 3 * kMaxSide, 5 * kMaxSide + 17})
        for (int width : {1, 3, kMaxSide})
            for (Picture const& image : {MakeGradient(width, height), MakeAlphaPattern(width, height)}) {
                auto const bitmap = Create(image);
                EXPECT_EQ(bitmap->GetTextureBitmap()->GetSubBitmapCount(),
                          (height + kMaxSide - 1) / kMaxSide);
                ExpectSame(Read(bitmap), image);
            }
}

TEST_F(PixelBitmap, ReadsBlocksOverStripEdgesAndPartlyOutsideAndReplacesABlockOfAWiderImage) {
    Picture const image = MakeGradient(40, 2 * kMaxSide + 20);
    auto const bitmap = Create(image);
    ExpectSame(Read(bitmap, Rect(3, kMaxSide - 5, 31, 2 * kMaxSide + 7)),
               image.Crop(3, kMaxSide - 5, 28, kMaxSide + 12));
    Rect const over(-2, 2 * kMaxSide, 44, 2 * kMaxSide + 30);
    Picture block = MakeChecker(over.GetWidth(), over.GetHeight(), 1, {9, 9, 9, 9}, {7, 7, 7, 7});
    Picture expected = block;
    bitmap->GetBitmapData(over, block.pixels.data());
    for (int y = 0; y < 20; ++y)
        for (int x = 0; x < 40; ++x) expected.SetColor(x + 2, y, image.GetColor(x, 2 * kMaxSide + y));
    ExpectSame(block, expected);

    Picture const wide = MakeAlphaPattern(30, 20);
    bitmap->GetTextureBitmap()->UpdateBitmap(Rect(5, 2, 15, 9), wide.pixels.data(), wide.GetStride());
    ExpectSame(Read(bitmap, Rect(5, 2, 15, 9)), wide.Crop(0, 0, 10, 7));
}

TEST_F(PixelBitmap, AShareSeesUpdatesWhoeverGoesFirstAndAStripsCloneDoesNot) {
    Picture const image = MakeGradient(33, kMaxSide + 3);
    Picture const other = MakeChecker(33, kMaxSide + 3, 2, {255, 0, 0, 255}, {0, 0, 255, 255});
    for (bool parentFirst : {true, false}) {
        auto parent = Create(image);
        auto clone = BitmapPtr::Adopt(parent->Clone());
        IMKSubBitmap* const strip = parent->GetTextureBitmap()->GetSubBitmap(0);
        strip->SetTag("strip");
        auto const copy = RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
        clone->GetTextureBitmap()->UpdateBitmap(other.pixels.data(), other.GetStride());
        (parentFirst ? parent : clone) = {};
        auto const fresh = Create(image); // a GL name deleted twice would now be this one's
        ExpectSame(Read(parentFirst ? clone : parent), other);
        ExpectSame(Read(fresh), image);
        Picture read(33, kMaxSide);
        copy->GetBitmapData(Rect(0, 0, 33, kMaxSide), read.pixels.data());
        ExpectSame(read, image.Crop(0, 0, 33, kMaxSide));
    }
}

TEST_F(PixelBitmap, ASavedBitmapIsLoadedWithEveryPixelAndAMissingFileSaysWhy) {
    TempFolder const folder;
    Picture const image = MakeAlphaPattern(20, 2 * kMaxSide + 1);
    std::string reason;
    ASSERT_TRUE(SaveBitmap(*Create(image), folder.Path("picture.mki"), 100, &reason)) << reason;
    ExpectSame(Read(LoadBitmap(*thread, folder.Path("picture.mki"))), image);

    EXPECT_FALSE(SaveBitmap(*Create(image), folder.Path("picture.bmp"), 100, &reason));
    EXPECT_NE(reason.find("unknown extension 'bmp'"), std::string::npos) << reason;
    EXPECT_FALSE(LoadBitmap(*thread, folder.Path("missing.png"), &reason));
    EXPECT_NE(reason.find("No such file"), std::string::npos) << reason;

    ASSERT_TRUE(thread->Call([&] {
        bool refuse = false;
        HandPumpedQueue refusing([&](int, ITask*) { return refuse; });
        {
            auto const unread = NewBitmap(refusing, 4, 4);
            refuse = true; // as a queue that was stopped does
            EXPECT_FALSE(SaveBitmap(*unread, folder.Path("picture.mki"), 100, &reason));
            EXPECT_NE(reason.find("refuses"), std::string::npos) << reason;
            refuse = false;
            IMKSubBitmap* const strip = unread->GetTextureBitmap()->GetSubBitmap(0);
            for (int read = 0; read < 2; ++read) strip->Unref(); // the references of the refused tasks
        }
        refusing.RunAll();
    }));
    ExpectSame(Read(LoadBitmap(*thread, folder.Path("picture.mki"))), image);
    log.Clear();
}

} // namespace
} // namespace Moka::Testing
