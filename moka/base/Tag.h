// Tag: a label of at most 126 bytes, for logs and debuggers. The buffer would have room for one byte more.
// Compat: tag-limit
#pragma once

#include <cstddef>
#include <cstring>

namespace Moka {

class Tag {
public:
    // Null is ignored. text may be Get().
    void Set(char const* text) {
        if (text) mText[Write(text)] = '\0';
    }
    // Like Set, but writes no terminating zero: the end of an earlier, longer text stays. // Compat: tag-tail
    void Overwrite(char const* text) {
        if (text) Write(text);
    }
    char const* Get() const { return mText; }

private:
    static constexpr std::size_t kMaxLength = 126;

    std::size_t Write(char const* text) {
        std::size_t const length = strnlen(text, kMaxLength);
        std::memmove(mText, text, length);
        return length;
    }

    char mText[kMaxLength + 2] = {}; // the bytes after the limit stay zero
};

} // namespace Moka
