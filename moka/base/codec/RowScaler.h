// RowScaler: scales a premultiplied RGBA8 image row by row, so that the source need not be in memory. An axis
// that shrinks uses area averaging, weighted exactly by coverage. An axis that grows is bilinear between
// pixel centres, with repeated edges.
// Exact: weights are integers, and the result is rounded once, to nearest. So it does not depend on the order
// of the
//        axes, an image of one colour keeps it, and no colour exceeds its alpha unless it did before.
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
    // out receives to.width * to.height pixels. If no axis grows, out may be the memory of the source rows: a
    // finished row never overwrites a row that was not pushed yet.
    RowScaler(PixelSize from, PixelSize to, unsigned char* out);
    ~RowScaler();

    // False if memory ran out. Push must not be called then.
    bool IsReady() const;

    // Adds the next source row of from.width pixels. Call it exactly from.height times.
    void Push(unsigned char const* row);

private:
    // The source pixels first ... last of one target pixel along one axis, and their weights. Inner pixels
    // have the inner weight of the axis. A single pixel has firstWeight.
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
    std::size_t mChannels; // the number of bytes of a target row
    std::unique_ptr<Taps[]> mAcross;
    std::unique_ptr<std::int32_t[]> mSums;     // the row just pushed, scaled across
    std::unique_ptr<std::int32_t[]> mPrevious; // the row before, for growing
    std::unique_ptr<double[]> mTotals;         // the current target row; whole numbers below 2^43
    Taps mDown{};
    int mSourceRow = 0;
    int mTargetRow = 0;
};

} // namespace Moka::detail
