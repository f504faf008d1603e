#include "moka/base/Utf.h"

namespace Moka::detail {
namespace {

constexpr char16_t kReplacement = 0xfffd;
constexpr char32_t kMalformed = 0xffffffff;

// The length of a character and the range of its second byte, which its first byte determines. Ranges
// narrower than 0x80 ... 0xbf exclude overlong forms, surrogates and code points above U+10FFFF.
struct Lead {
    std::size_t length; // 0: no character starts with this byte
    unsigned char secondLow = 0x80;
    unsigned char secondHigh = 0xbf;
};

constexpr Lead LeadOf(unsigned char byte) {
    if (byte < 0x80) return {1};
    if (byte < 0xc2) return {0};
    if (byte < 0xe0) return {2};
    if (byte == 0xe0) return {3, 0xa0, 0xbf};
    if (byte == 0xed) return {3, 0x80, 0x9f};
    if (byte < 0xf0) return {3};
    if (byte == 0xf0) return {4, 0x90, 0xbf};
    if (byte < 0xf4) return {4};
    if (byte == 0xf4) return {4, 0x80, 0x8f};
    return {0};
}

char32_t NextCodePoint(std::string_view utf8, std::size_t& position) {
    auto const first = static_cast<unsigned char>(utf8[position++]);
    Lead lead = LeadOf(first);
    if (lead.length == 0) return kMalformed;
    if (lead.length == 1) return first;
    char32_t codePoint = first & (0x7fU >> lead.length);
    for (std::size_t i = 1; i < lead.length; ++i) {
        if (position == utf8.size()) return kMalformed;
        auto const byte = static_cast<unsigned char>(utf8[position]);
        if (byte < lead.secondLow || byte > lead.secondHigh) return kMalformed;
        lead.secondLow = 0x80;
        lead.secondHigh = 0xbf;
        codePoint = (codePoint << 6) | (byte & 0x3fU);
        ++position;
    }
    return codePoint;
}

constexpr bool IsHighSurrogate(char16_t unit) { return (unit & 0xfc00) == 0xd800; }
constexpr bool IsLowSurrogate(char16_t unit) { return (unit & 0xfc00) == 0xdc00; }

} // namespace

namespace {

// Calls handleMalformed for bytes that do not form a character.
template <class HandleMalformed>
std::u16string Convert(std::string_view utf8, HandleMalformed const& handleMalformed) {
    std::u16string text;
    text.reserve(utf8.size()); // always enough, because a byte makes at most one unit
    for (std::size_t position = 0; position < utf8.size();) {
        std::size_t const start = position;
        char32_t const codePoint = NextCodePoint(utf8, position);
        if (codePoint == kMalformed) {
            handleMalformed(text, utf8.substr(start, position - start));
        } else if (codePoint < 0x10000) {
            text.push_back(static_cast<char16_t>(codePoint));
        } else {
            text.push_back(static_cast<char16_t>(0xd7c0 + (codePoint >> 10)));
            text.push_back(static_cast<char16_t>(0xdc00 | (codePoint & 0x3ff)));
        }
    }
    return text;
}

} // namespace

std::u16string Utf16FromUtf8(std::string_view utf8) {
    return Convert(utf8, [](std::u16string& text, std::string_view) { text.push_back(kReplacement); });
}

std::u16string Utf16FromFileName(std::string_view bytes) {
    return Convert(bytes, [](std::u16string& text, std::string_view malformed) {
        for (char const byte : malformed)
            text.push_back(static_cast<char16_t>(0xdc00 | static_cast<unsigned char>(byte)));
    });
}

char32_t NextCodePoint(std::u16string_view text, std::size_t& position) {
    char16_t const unit = text[position++];
    if (IsLowSurrogate(unit)) return kReplacement;
    if (!IsHighSurrogate(unit)) return unit;
    if (position == text.size() || !IsLowSurrogate(text[position])) return kReplacement;
    return 0x10000 + ((unit & char32_t{0x3ff}) << 10) + (text[position++] & char32_t{0x3ff});
}

std::size_t EncodeUtf8(char32_t codePoint, char* bytes) {
    if (codePoint < 0x80) {
        bytes[0] = static_cast<char>(codePoint);
        return 1;
    }
    std::size_t const length = codePoint < 0x800 ? 2 : codePoint < 0x10000 ? 3 : 4;
    for (std::size_t i = length - 1; i > 0; --i) {
        bytes[i] = static_cast<char>(0x80 | (codePoint & 0x3f));
        codePoint >>= 6;
    }
    bytes[0] = static_cast<char>((0xf00U >> length) | codePoint);
    return length;
}

} // namespace Moka::detail
