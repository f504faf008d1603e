// The factory: what it accepts, what it says when it does not, how it decodes.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "tests/unit/bitmap/FactoryFixture.h"

#include <string>

namespace Moka::Testing {
namespace {

// useQueue decides who owns the pixels of a region; its strips are caller-side in both cases.
TEST_F(Factory, ARegionOwnsItsPixelsOnlyWithUseQueueZero) {
    auto const create = [&](Rect const& region, void const* pixels, int useQueue) {
        return BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, region, 8, 8, pixels, useQueue));
    };
    auto const owning = create(Rect(0, 0, 8, 4), new unsigned char[8 * 8 * 4](), 0);
    EXPECT_EQ(queue.GetPendingCount(), 2) << "the upload and the deletion";
    Pixels const kept(8 * 8 * 4);
    auto const borrowing = create(Rect(0, 0, 8, 4), kept.data(), 1);
    EXPECT_EQ(queue.RunAll(), 3);
    for (Rect const& outside : {Rect(8, 0, 9, 9), Rect(0, -5, 4, 0), Rect(4, 4, 4, 4), Rect(5, 5, 2, 2)})
        EXPECT_FALSE(create(outside, nullptr, 1));
    EXPECT_TRUE(log.GetLines().empty());
}

TEST_F(Factory, AnInvalidSizeQueueOrParentIsOneErrorLine) {
    std::string const size = "CreateBitmap, bitmap is not created!, bitmap width = 7, height = -1, queue=";
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, 7, -1, nullptr, false, 1, false), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, 7, 7, nullptr, false, 0, false), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, Rect(0, 0, 1, 1), 0, 7, nullptr, 1), nullptr);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, "bitmap is not created!, bitmap width = "), 3);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR, size), 1);
    log.Clear();
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, static_cast<IMKBitmap*>(nullptr), 1), nullptr);
    auto const screen = BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&queue, 3, 4, 5, 6, 1, 1));
    screen->SetTag("screen");
    queue.RunAll();
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, screen.Get(), 1), nullptr);
    auto const lines = log.GetLines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].format, "%s, invalid parent bitmap (%p:\"%s\")");
    EXPECT_NE(lines[0].text.find(":\"---\")"), std::string::npos);
    EXPECT_NE(lines[1].text.find(":\"screen\")"), std::string::npos);
    EXPECT_EQ(CountOf(screen.Get()), 1);
}

TEST_F(Factory, WithoutAQueueWhatIsCallerSideIsNothing) {
    auto const parent = NewBitmap(4, 4);
    queue.RunAll();
    IMKBitmap* const p = parent.Get();
    using F = MKGraphicsFactory;
    EXPECT_EQ(F::CreateBitmap(nullptr, p, 1), nullptr);
    EXPECT_EQ(F::CreateScreenBitmap(nullptr, 0, 0, 1, 1, 1, 1), nullptr);
    EXPECT_EQ(F::CreateCanvas(nullptr, p, 1), nullptr);
    EXPECT_EQ(F::CreatePenCanvas(nullptr, p, 1), nullptr);
    EXPECT_EQ(CountOf(p), 1);
    OnRenderThread const here;
    auto const shared = BitmapPtr::Adopt(F::CreateBitmap(nullptr, p, 0));
    EXPECT_EQ(shared->Clone(), nullptr) << "a clone is caller-side";
    RefPtr<IMKCanvasBase>::Adopt(F::CreateCanvas(nullptr, shared.Get(), 0))->ClearAll(1, 0, 0, 1);
    EXPECT_EQ(shared->GetPixel(Point(1, 1)), 0xFF0000FFu);
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 0);
}

TEST_F(Factory, FilesOtherThanMkiNeedTheBridge) {
    String const png = Save("a.png", 5, 4);
    String const mki = Save("a.mki", 5, 4);
    String const empty;
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, &png, 1), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, &empty, 1), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateScaledCPUBitmap(nullptr, 0, 0), nullptr);
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR),
              std::vector<std::string>(3, "MKBitmapFactory : gDecodeFile Not loaded"));
    log.Clear();
    EXPECT_EQ(ReadAll(BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &mki, 1))),
              UniquePixels(5, 4));
    EXPECT_TRUE(log.GetLines().empty()) << "mki never reaches the bridge";
}

TEST_F(Factory, ARegionOfAFileIsDecodedWhateverItsExtensionAndOwnsItsPixelsUntilUploaded) {
    int const h = kMaxSide + 10;
    String const png = Save("tall.png", 6, h);
    Pixels const whole = UniquePixels(6, h);
    for (int useQueue : {0, 1}) {
        queue.RunAll();
        auto const bitmap = BitmapPtr::Adopt(
            MKGraphicsFactory::CreateBitmap(&queue, Rect(0, kMaxSide - 3, 6, h), &png, useQueue));
        EXPECT_EQ(queue.RunAll(), 3) << "two uploads and one deletion";
        Pixels rows(6 * 13 * 4);
        bitmap->GetBitmapData(Rect(0, kMaxSide - 3, 6, h), rows.data());
        EXPECT_EQ(rows, Pixels(whole.end() - 6 * 13 * 4, whole.end()));
    }
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(&queue, Rect(9, 0, 12, 3), &png, 1), nullptr);
    EXPECT_EQ(MKGraphicsFactory::CreateBitmap(nullptr, Rect(0, 0, 1, 1), &png, 1), nullptr);
}

TEST_F(Factory, ASavedBitmapIsLoadedWithEveryPixelAndWhatFailsSaysWhyAndKeepsTheFile) {
    std::string const path = folder.Path("picture.mki");
    Picture const image = MakeAlphaPattern(20, 2 * kMaxSide + 1);
    auto const bitmap = NewBitmap(image.width, image.height, image.pixels.data());
    std::string reason;
    ASSERT_TRUE(SaveBitmap(*bitmap, path, 100, &reason)) << reason;
    EXPECT_EQ(ReadAll(LoadBitmap(queue, path)), image.pixels);

    EXPECT_FALSE(SaveBitmap(*bitmap, folder.Path("picture.bmp"), 100, &reason));
    EXPECT_NE(reason.find("unknown extension 'bmp'"), std::string::npos) << reason;
    EXPECT_FALSE(LoadBitmap(queue, folder.Path("missing.png"), &reason));
    EXPECT_NE(reason.find("No such file"), std::string::npos) << reason;
    auto const unread = NewBitmap(4, 4);
    refuse = true; // as a queue that was stopped does
    EXPECT_FALSE(SaveBitmap(*unread, path, 100, &reason));
    EXPECT_NE(reason.find("refuses"), std::string::npos) << reason;
    refuse = false;
    for (int read = 0; read < 2; ++read) StripOf(unread)->Unref(); // the references of the refused tasks
    EXPECT_EQ(ReadAll(LoadBitmap(queue, path)), image.pixels);
}

} // namespace
} // namespace Moka::Testing
