// MixedWork: one caller's random life with the library: bitmaps, canvases, screens, pens and drawables that
// come and go, are drawn, cloned, clipped and read. The same seed does the same.
// Thread: one at a time; several works may share a queue and a bitmap.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <cstdint>
#include <random>
#include <vector>

namespace Moka::Testing {

class MixedWork {
public:
    static constexpr int kSide = 6;
    static constexpr int kHeight = 2 * kSide; // two strips, where a texture has kSide rows

    // The bitmap is drawn and cloned like its own; null for none.
    MixedWork(IGLMsgQueue& queue, unsigned seed, IMKBitmap* shared)
        : mQueue(queue), mRandom(seed), mShared(RefPtr<IMKBitmap>::Share(shared)) {}

    // Some calls of the library.
    void Step();
    void DropAll();

    std::int64_t CountCalls() const { return mCalls; }

private:
    using BitmapPtr = RefPtr<IMKBitmap>;

    int Pick(int n);
    template <class List>
    auto& Any(List& list);
    template <class List>
    void DropOne(List& list);
    IMKBitmap* AnySource();
    void AddBitmap();
    void AddCanvas();
    void UseBitmap(IMKBitmap& bitmap);
    void UseScreen();
    void UsePen();
    void UseDrawables(IMKCanvas& canvas);
    void Draw(IMKCanvas& canvas);

    IGLMsgQueue& mQueue;
    std::mt19937 mRandom;
    BitmapPtr mShared;
    std::vector<BitmapPtr> mBitmaps;
    std::vector<RefPtr<IMKCanvas>> mCanvases;
    std::int64_t mCalls = 0;
};

} // namespace Moka::Testing
