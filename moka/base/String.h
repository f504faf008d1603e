/// String: UTF-16 text, as the platform's Java side hands it over, with UTF-8 conversion both ways.
/// Default construction allocates nothing. Malformed input is kept going: a lone surrogate, and every
/// malformed UTF-8 sequence, becomes U+FFFD on conversion.
/// Thread: a value type; not synchronised.
/// Fails:  std::bad_alloc when memory is out, as the standard strings do.
#pragma once

#include "moka/base/Export.h"

#include <string>

namespace Moka {

class MOKA_API String {
public:
    String() = default;
    String(char const* utf8);        ///< null is the empty string
    String(std::string const& utf8); ///< may contain zeros
    /// length UTF-16 units of text.
    String(char16_t const* text, int length);

    int GetLength() const; ///< in UTF-16 units
    /// True without units.
    bool IsEmpty() const { return mText.empty(); }
    char16_t const* GetPointer() const { return mText.c_str(); } ///< terminated, valid until the next change
    /// Makes the string empty.
    void Clear();

    /// Puts the units from start on (at most count of them) into result, which may be this string. False, with
    /// result untouched, when start is outside 0 ... length, count is negative or result is null.
    bool SubString(int start, String* result) const;
    bool SubString(int start, int count, String* result) const;

    /// The position of the last occurrence of text, -1 when there is none. An empty text is found at the end.
    int ReverseFind(String const& text) const;

    /// 0 when equal; otherwise negative or positive by the first differing unit. Case-sensitive.
    int CompareTo(String const& other) const;

    /// Adds other at the end.
    String& Append(String const& other);

    /// The text as UTF-8.
    std::string ToUtf8() const;

    /// Names of files, which a system takes as bytes, whether they are UTF-8 or not. Each byte that is no UTF-8
    /// becomes a lone surrogate, U+DC80 to U+DCFF, and a byte again; all else as with UTF-8.
    static String FromFileName(std::string const& bytes);
    std::string ToFileName() const;

    /// Copies at most maxBytes of UTF-8 into buffer, cut at a character boundary, and terminates it: buffer
    /// needs room for maxBytes + 1. Returns the bytes copied, without the terminator; -1 and no change when
    /// buffer is null or maxBytes negative.
    int ToUtf8(char* buffer, int maxBytes) const;

    /// Compares the units.
    friend bool operator==(String const& a, String const& b) { return a.mText == b.mText; }
    friend bool operator!=(String const& a, String const& b) { return !(a == b); }

private:
    std::u16string mText;
};

} // namespace Moka
