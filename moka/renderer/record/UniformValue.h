// UniformValue.h: replaces the stored value of a uniform and reports whether it changed. The functions are in
// line because each draw calls one for each uniform, mostly with an equal value.
#pragma once

#include "moka/base/Likely.h"
#include "moka/base/SameBits.h"
#include "moka/renderer/device/ProgramLayout.h"

#include <cstdint>
#include <cstring>

namespace Moka::detail {

// Copies 4 bytes to kept. Returns true if they differed.
inline bool ReplaceWord(unsigned char* kept, void const* value) {
    std::uint32_t before;
    std::uint32_t now;
    std::memcpy(&before, kept, sizeof before);
    std::memcpy(&now, value, sizeof now);
    std::memcpy(kept, &now, sizeof now);
    return before != now;
}

// Copies value to kept. Returns true if the bytes differed.
template <BindingType kType>
bool ReplaceValue(unsigned char* kept, void const* value) {
    constexpr std::size_t kBytes = GetValueSize(kType);
    if constexpr (kType == BindingTypeBool) {
        // value points to a bool, which is 1 byte; the stored value is an integer of 4 bytes.
        std::int32_t const flag = *static_cast<bool const*>(value) ? 1 : 0;
        return ReplaceWord(kept, &flag);
    } else if constexpr (kBytes == sizeof(std::uint32_t)) {
        return ReplaceWord(kept, value);
    } else {
        if (MOKA_LIKELY(HasSameBits<kBytes>(kept, value))) return false;
        std::memcpy(kept, value, kBytes);
        return true;
    }
}

} // namespace Moka::detail
