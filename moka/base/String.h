/// String: UTF-16 text, as Java uses it, with conversion from and to UTF-8. Default construction allocates
/// nothing. Lone surrogates and malformed UTF-8 sequences become U+FFFD on conversion.
/// Thread: a value; not synchronised.
/// Fails:  throws std::bad_alloc if memory runs out, as standard strings do.
#pragma once

#include "moka/base/Export.h"

#include <string>

namespace Moka {

class MOKA_API String {
public:
    String() = default;
    String(char const* utf8);        ///< null is the empty string
    String(std::string const& utf8); ///< may contain zeros
    /// Copies length UTF-16 units of text.
    String(char16_t const* text, int length);

    int GetLength() const; ///< in UTF-16 units
    /// True without units.
    bool IsEmpty() const { return mText.empty(); }
    char16_t const* GetPointer() const { return mText.c_str(); } ///< terminated, valid until the next change
    /// Makes the string empty.
    void Clear();

    /// Copies the units from start on, at most count of them, to result, which may be this string. Returns
    /// false and changes nothing if start is outside 0 ... length, count is negative, or result is null.
    bool SubString(int start, String* result) const;
    bool SubString(int start, int count, String* result) const;

    /// Returns the position of the last occurrence of text, or -1. An empty text is found at the end.
    int ReverseFind(String const& text) const;

    /// Compares units, including case. Returns 0 if the texts are equal, else a negative or positive number.
    int CompareTo(String const& other) const;

    /// Appends other.
    String& Append(String const& other);

    /// The text as UTF-8.
    std::string ToUtf8() const;

    /// Convert file names, which are bytes and need not be UTF-8. Each byte that is not part of valid UTF-8
    /// becomes a lone surrogate, U+DC80 to U+DCFF, which is converted back to the same byte.
    static String FromFileName(std::string const& bytes);
    std::string ToFileName() const;

    /// Copies at most maxBytes of UTF-8 to buffer, cut at a character boundary, and a terminating zero:
    /// buffer needs maxBytes + 1 bytes. Returns the number of bytes without the zero. Returns -1 and changes
    /// nothing if buffer is null or maxBytes is negative.
    int ToUtf8(char* buffer, int maxBytes) const;

    /// Compares the units.
    friend bool operator==(String const& a, String const& b) { return a.mText == b.mText; }
    friend bool operator!=(String const& a, String const& b) { return !(a == b); }

private:
    std::u16string mText;
};

} // namespace Moka
