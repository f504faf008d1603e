// UniformValue.h: writes the value of a uniform over the one that is kept. In line: each draw does it for each
// uniform, mostly with the value that is there.
#pragma once

#include "moka/base/SameBits.h"
#include "moka/renderer/device/ProgramLayout.h"

#include <cstdint>
#include <cstring>

namespace Moka::detail {

inline bool ReplaceWord(unsigned char* kept, void const* value) {
    std::uint32_t before;
    std::uint32_t now;
    std::memcpy(&before, kept, sizeof before);
    std::memcpy(&now, value, sizeof now);
    std::memcpy(kept, &now, sizeof now);
    return before != now;
}

// Whether the value was another one.
template <BindingType kType>
bool ReplaceValue(unsigned char* kept, void const* value) {
    constexpr std::size_t kBytes = GetValueSize(kType);
    if constexpr (kType == BindingTypeBool) {
        // Callers hand over a bool, of which only one byte is there to be read.
        std::int32_t const flag = *static_cast<bool const*>(value) ? 1 : 0;
        return ReplaceWord(kept, &flag);
    } else if constexpr (kBytes == sizeof(std::uint32_t)) {
        return ReplaceWord(kept, value);
    } else {
        if (HasSameBits<kBytes>(kept, value)) return false;
        std::memcpy(kept, value, kBytes);
        return true;
    }
}

} // namespace Moka::detail
