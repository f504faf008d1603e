// SameBits.h: compares small blocks of memory where the call of memcmp would take longer than the comparison.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>

namespace Moka::detail {

/// A word of memory that may hold anything, at any address.
struct __attribute__((packed, may_alias)) AnyWord {
    std::uint64_t bits;
};

/// One expression, not a loop: compilers would make a loop load two words at once. Those were often stored one by
/// one a moment ago, and such a load waits until they have left the processor.
template <std::size_t... kIndices>
bool HasSameWords(AnyWord const* a, AnyWord const* b, std::index_sequence<kIndices...>) {
    return ((a[kIndices].bits ^ b[kIndices].bits) | ...) == 0;
}

/// Whether the first kBytes, a multiple of 8, of a and b are equal bit by bit.
template <std::size_t kBytes>
bool HasSameBits(void const* a, void const* b) {
    static_assert(kBytes % sizeof(std::uint64_t) == 0);
    return HasSameWords(static_cast<AnyWord const*>(a), static_cast<AnyWord const*>(b),
                        std::make_index_sequence<kBytes / sizeof(std::uint64_t)>());
}

} // namespace Moka::detail
