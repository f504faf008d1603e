// SameBits.h: compares small blocks of memory where the call of memcmp would take longer than the comparison.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <utility>

namespace Moka::detail {

inline std::uint64_t LoadWord(void const* bytes, std::size_t index) {
    std::uint64_t word;
    std::memcpy(&word, static_cast<unsigned char const*>(bytes) + index * sizeof word, sizeof word);
    return word;
}

template <std::size_t... kIndices>
bool HasSameWords(void const* a, void const* b, std::index_sequence<kIndices...>) {
    return ((LoadWord(a, kIndices) ^ LoadWord(b, kIndices)) | ...) == 0;
}

/// Whether the first kBytes, a multiple of 8, of a and b are equal bit by bit.
template <std::size_t kBytes>
bool HasSameBits(void const* a, void const* b) {
    static_assert(kBytes % sizeof(std::uint64_t) == 0);
    return HasSameWords(a, b, std::make_index_sequence<kBytes / sizeof(std::uint64_t)>());
}

} // namespace Moka::detail
