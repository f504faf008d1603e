#include "moka/base/codec/RowScaler.h"

#include <algorithm>
#include <new>
#include <utility>

namespace Moka::detail {
namespace {

// Returns the sum of the weights of one target pixel along one axis.
std::int32_t TotalWeight(int from, int to) { return static_cast<std::int32_t>(to > from ? 2 * to : from); }

} // namespace

// In units in which a source pixel is `to` long and a target pixel `from`, all borders are integers.
RowScaler::Taps RowScaler::AreaTaps(int from, int to, int index) {
    std::int64_t const begin = std::int64_t{index} * from;
    std::int64_t const end = begin + from;
    std::int64_t const first = begin / to;
    std::int64_t const last = (end - 1) / to;
    std::int64_t const firstEnd = std::min((first + 1) * to, end);
    return {static_cast<int>(first), static_cast<int>(last), static_cast<std::int32_t>(firstEnd - begin),
            static_cast<std::int32_t>(last > first ? end - last * to : 0)};
}

// The target pixel's centre in source pixels is ((index + 1/2) * from / to - 1/2): in units of 1 / (2 * to).
RowScaler::Taps RowScaler::LinearTaps(int from, int to, int index) {
    std::int64_t const unit = 2 * std::int64_t{to};
    std::int64_t const centre = (2 * std::int64_t{index} + 1) * from - to;
    if (centre <= 0) return {0, 0, static_cast<std::int32_t>(unit), 0};
    std::int64_t const first = centre / unit;
    std::int64_t const rest = centre % unit;
    if (first >= from - 1 || rest == 0) {
        int const only = static_cast<int>(std::min<std::int64_t>(first, from - 1));
        return {only, only, static_cast<std::int32_t>(unit), 0};
    }
    return {static_cast<int>(first), static_cast<int>(first + 1), static_cast<std::int32_t>(unit - rest),
            static_cast<std::int32_t>(rest)};
}

RowScaler::Taps RowScaler::TapsAt(int from, int to, int index) {
    return to > from ? LinearTaps(from, to, index) : AreaTaps(from, to, index);
}

RowScaler::RowScaler(PixelSize from, PixelSize to, unsigned char* out)
    : mFrom(from),
      mTo(to),
      mOut(out),
      mChannels(static_cast<std::size_t>(to.width) * 4),
      mAcross(new (std::nothrow) Taps[static_cast<std::size_t>(to.width)]),
      mSums(new (std::nothrow) std::int32_t[mChannels]),
      mPrevious(to.height > from.height ? new (std::nothrow) std::int32_t[mChannels]() : nullptr),
      mTotals(new (std::nothrow) double[mChannels]()) {
    if (!IsReady()) return;
    for (int i = 0; i < to.width; ++i) mAcross[static_cast<std::size_t>(i)] = TapsAt(from.width, to.width, i);
    mDown = TapsAt(from.height, to.height, 0);
}

RowScaler::~RowScaler() = default;

bool RowScaler::IsReady() const {
    return mAcross && mSums && mTotals && (mPrevious || mTo.height <= mFrom.height);
}

void RowScaler::Push(unsigned char const* row) {
    ScaleAcross(row);
    if (mTo.height > mFrom.height) {
        PushGrowing();
    } else {
        PushShrinking();
    }
    ++mSourceRow;
}

void RowScaler::PushShrinking() {
    bool const isFirst = mSourceRow == mDown.first;
    bool const isLast = mSourceRow == mDown.last;
    auto const inner = static_cast<std::int32_t>(mTo.height);
    Add(mSums.get(), isFirst ? mDown.firstWeight : isLast ? mDown.lastWeight : inner);
    if (!isLast) return;
    Emit();
    // If the row belongs to two target rows, add its rest to the second one.
    if (mTargetRow < mTo.height && mDown.first == mSourceRow) Add(mSums.get(), mDown.firstWeight);
}

void RowScaler::PushGrowing() {
    while (mTargetRow < mTo.height && mDown.last == mSourceRow) {
        bool const isSingle = mDown.first == mDown.last;
        Add(isSingle ? mSums.get() : mPrevious.get(), mDown.firstWeight);
        if (!isSingle) Add(mSums.get(), mDown.lastWeight);
        Emit();
    }
    std::swap(mSums, mPrevious);
}

void RowScaler::ScaleAcross(unsigned char const* row) {
    auto const inner = static_cast<std::int32_t>(mTo.width);
    std::int32_t* sum = mSums.get();
    for (Taps const *taps = mAcross.get(), *end = taps + mTo.width; taps != end; ++taps, sum += 4) {
        unsigned char const* pixel = row + static_cast<std::size_t>(taps->first) * 4;
        unsigned char const* const last = row + static_cast<std::size_t>(taps->last) * 4;
        for (int c = 0; c < 4; ++c) sum[c] = pixel[c] * taps->firstWeight + last[c] * taps->lastWeight;
        std::int32_t between[4] = {};
        for (pixel += 4; pixel < last; pixel += 4) {
            for (int c = 0; c < 4; ++c) between[c] += pixel[c];
        }
        for (int c = 0; c < 4; ++c) sum[c] += between[c] * inner;
    }
}

void RowScaler::Add(std::int32_t const* sums, std::int32_t weight) {
    double* const totals = mTotals.get();
    for (std::size_t i = 0; i < mChannels; ++i) totals[i] += static_cast<double>(sums[i]) * weight;
}

// total / area rounded to nearest equals (2 * total + area) / (2 * area) rounded down. Adding half a unit
// changes no result and allows a multiplication by the reciprocal, whose error is below 2^-42, instead of a
// division: different quotients differ by at least 1 / (2 * area), which is above 2^-36.
void RowScaler::Emit() {
    double const area =
        static_cast<double>(TotalWeight(mFrom.width, mTo.width)) * TotalWeight(mFrom.height, mTo.height);
    double const reciprocal = 0.5 / area;
    double const half = area + 0.5;
    unsigned char* const row = mOut + static_cast<std::size_t>(mTargetRow) * mChannels;
    double* const totals = mTotals.get();
    for (std::size_t i = 0; i < mChannels; ++i) {
        row[i] = static_cast<unsigned char>(static_cast<std::int32_t>((2 * totals[i] + half) * reciprocal));
        totals[i] = 0;
    }
    ++mTargetRow;
    if (mTargetRow < mTo.height) mDown = TapsAt(mFrom.height, mTo.height, mTargetRow);
}

} // namespace Moka::detail
