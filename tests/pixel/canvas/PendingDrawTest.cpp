// A bitmap is read right behind the draws onto it, while the driver's threads may still be sampling its old
// texels for another one. A read-back waits for what was drawn last, and so does a copy.
#include "tests/pixel/canvas/CanvasDrawing.h"

#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"

#include <cstdlib>
#include <functional>

namespace Moka::Testing {
namespace {

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr int kRepetitions = 25;
#else
constexpr int kRepetitions = 500;
#endif
constexpr int kSide = 64;
constexpr Color kOld{255, 255, 255, 255};
constexpr Color kNew{0, 0, 255, 255};

// llvmpipe draws on the calling thread where there is one processor, and nothing is then ever pending. Read
// when the driver is loaded, which is later.
[[maybe_unused]] int const gThreads = setenv("LP_NUM_THREADS", "2", 0);

class PendingDrawTest : public CanvasDrawing {
protected:
    struct Drawn {
        RefPtr<IMKBitmap> bitmap;
        RefPtr<IMKCanvas> canvas;
    };

    Drawn Make() {
        RenderThread& queue = GetRenderThread();
        auto bitmap = NewBitmap(queue, kSide, kSide);
        return {bitmap, NewCanvas(queue, bitmap)};
    }

    static void Fill(Drawn const& drawn, Color const& color) {
        MKPaint paint;
        auto const part = [&color](std::size_t i) { return static_cast<float>(color[i]) / 255.0f; };
        paint.SetColor(part(0), part(1), part(2));
        drawn.canvas->DrawRect(0, 0, kSide, kSide, &paint);
    }

    // How often read finds anything but the new colour all over.
    int CountWrong(std::function<Picture(Drawn const&)> const& read) {
        Picture const expected = MakeChecker(kSide, kSide, 1, kNew, kNew);
        Drawn const drawn = Make();
        Drawn const other = Make();
        int wrong = 0;
        for (int i = 0; i < kRepetitions; ++i) {
            Fill(drawn, kOld);
            other.canvas->DrawBitmap(drawn.bitmap.Get(), 0, 0, nullptr);
            Fill(drawn, kNew);
            Fill(other, kOld);
            if (CompareImages(expected, read(drawn)).differingPixels > 0) ++wrong;
        }
        return wrong;
    }

    static Picture Read(IMKBitmapDataGettable& source) {
        Picture image(kSide, kSide);
        source.GetBitmapData(Rect(0, 0, kSide, kSide), image.pixels.data());
        return image;
    }
};

TEST_F(PendingDrawTest, AReadBackAndACopyWait) {
    EXPECT_EQ(CountWrong([](Drawn const& drawn) { return Read(*drawn.bitmap); }), 0) << "read back";
    auto const readClone = [](Drawn const& drawn) {
        return Read(*RefPtr<IMKSubBitmap>::Adopt(drawn.bitmap->GetTextureBitmap()->GetSubBitmap(0)->Clone()));
    };
    EXPECT_EQ(CountWrong(readClone), 0) << "the clone of a strip";
}

} // namespace
} // namespace Moka::Testing
