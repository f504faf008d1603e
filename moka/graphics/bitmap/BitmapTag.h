// BitmapTag: a fixed-size label. It keeps the first 126 bytes, one fewer than would fit: callers rely on
// where a long tag is cut.
#pragma once

#include <cstring>

namespace Moka::detail {

class BitmapTag {
public:
    // Null is ignored.
    void Set(char const* text) {
        if (!text) return;
        std::size_t const length = strnlen(text, kMaxLength);
        std::memmove(mText, text, length); // a tag may be set to itself
        mText[length] = '\0';
    }
    char const* Get() const { return mText; }

private:
    static constexpr std::size_t kMaxLength = 126;
    char mText[128] = {};
};

} // namespace Moka::detail
