// RowScaler: resamples a premultiplied RGBA8 image to another size while its rows arrive, so that the image
// itself need not be held. Per axis: area averaging when it shrinks (each source pixel weighs exactly what it
// covers), bilinear between pixel centres, edges repeated, when it grows.
// Cost:  the weights are integers and the result is rounded once, to nearest: it does not depend on the order
//        of the axes, a single colour stays what it is, and no colour exceeds its alpha if none did before.
// Limits: sides up to 65,535, which keeps every sum exact.
#pragma once

#include "moka/base/NonAssignable.h"

#include <cstddef>
#include <cstdint>
#include <memory>

namespace Moka::detail {

struct PixelSize {
    int width = 0;
    int height = 0;

    friend bool operator==(PixelSize a, PixelSize b) { return a.width == b.width && a.height == b.height; }
    friend bool operator!=(PixelSize a, PixelSize b) { return !(a == b); }
};

class RowScaler : NonAssignable {
public:
    // out receives to.width * to.height pixels. It may be the memory the source rows are pushed from, first
    // to last, when neither axis grows: a finished row never reaches what is still to come.
    RowScaler(PixelSize from, PixelSize to, unsigned char* out);
    ~RowScaler();

    // False when memory ran out; nothing may be pushed then.
    bool IsReady() const;

    // The next source row, from.width pixels; exactly from.height of them.
    void Push(unsigned char const* row);

private:
    // What one target pixel takes from one axis: the source pixels first ... last, the inner ones with the
    // axis's own inner weight. A single one carries firstWeight alone.
    struct Taps {
        int first;
        int last;
        std::int32_t firstWeight;
        std::int32_t lastWeight;
    };
    static Taps AreaTaps(int from, int to, int index);
    static Taps LinearTaps(int from, int to, int index);
    static Taps TapsAt(int from, int to, int index);

    void PushShrinking();
    void PushGrowing();
    void ScaleAcross(unsigned char const* row);
    void Add(std::int32_t const* sums, std::int32_t weight);
    void Emit();

    PixelSize mFrom;
    PixelSize mTo;
    unsigned char* mOut;
    std::size_t mChannels; // of a target row
    std::unique_ptr<Taps[]> mAcross;
    std::unique_ptr<std::int32_t[]> mSums;     // the row just pushed, scaled across
    std::unique_ptr<std::int32_t[]> mPrevious; // the one before, when growing
    std::unique_ptr<double[]> mTotals;         // the target row under way; whole numbers, below 2^43
    Taps mDown{};
    int mSourceRow = 0;
    int mTargetRow = 0;
};

} // namespace Moka::detail
