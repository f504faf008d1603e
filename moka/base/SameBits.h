// SameBits.h: compares small blocks of memory in line, because a call of memcmp takes longer than the
// comparison.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>

namespace Moka::detail {

/// 8 bytes of an object of any type, at any alignment.
struct __attribute__((packed, may_alias)) AnyWord {
    std::uint64_t bits; ///< the 8 bytes
};

/// Returns true if the words of a and b are equal. It is one expression because compilers
/// vectorise a loop to 16-byte loads. If two separate 8-byte stores wrote these bytes just before, such a load
/// stalls until both have left the store buffer (no store forwarding).
template <std::size_t... kIndices>
bool HasSameWords(AnyWord const* a, AnyWord const* b, std::index_sequence<kIndices...>) {
    return ((a[kIndices].bits ^ b[kIndices].bits) | ...) == 0;
}

/// Returns true if the first kBytes bytes of a and b are equal. kBytes is a multiple of 8.
template <std::size_t kBytes>
bool HasSameBits(void const* a, void const* b) {
    static_assert(kBytes % sizeof(std::uint64_t) == 0);
    return HasSameWords(static_cast<AnyWord const*>(a), static_cast<AnyWord const*>(b),
                        std::make_index_sequence<kBytes / sizeof(std::uint64_t)>());
}

} // namespace Moka::detail
