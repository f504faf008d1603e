#include "moka/base/String.h"

#include "moka/base/Utf.h"

#include <cstring>

namespace Moka {

String::String(char const* utf8) {
    if (utf8) mText = detail::Utf16FromUtf8(utf8);
}

String::String(std::string const& utf8) : mText(detail::Utf16FromUtf8(utf8)) {}

String::String(char16_t const* text, int length) {
    if (text && length > 0) mText.assign(text, static_cast<std::size_t>(length));
}

int String::GetLength() const { return static_cast<int>(mText.size()); }

void String::Clear() { mText.clear(); }

bool String::SubString(int start, String* result) const { return SubString(start, GetLength(), result); }

bool String::SubString(int start, int count, String* result) const {
    if (!result || start < 0 || start > GetLength() || count < 0) return false;
    result->mText = mText.substr(static_cast<std::size_t>(start), static_cast<std::size_t>(count));
    return true;
}

int String::ReverseFind(String const& text) const {
    std::size_t const at = mText.rfind(text.mText);
    return at == std::u16string::npos ? -1 : static_cast<int>(at);
}

int String::CompareTo(String const& other) const { return mText.compare(other.mText); }

String& String::Append(String const& other) {
    mText.append(other.mText);
    return *this;
}

std::string String::ToUtf8() const {
    std::string utf8;
    utf8.reserve(mText.size());
    char bytes[4];
    for (std::size_t position = 0; position < mText.size();) {
        utf8.append(bytes, detail::EncodeUtf8(detail::NextCodePoint(mText, position), bytes));
    }
    return utf8;
}

String String::FromFileName(std::string const& bytes) {
    String name;
    name.mText = detail::Utf16FromFileName(bytes);
    return name;
}

std::string String::ToFileName() const {
    std::string name;
    char bytes[4];
    for (std::size_t position = 0; position < mText.size();) {
        char16_t const unit = mText[position];
        char32_t const codePoint = detail::NextCodePoint(mText, position);
        bool const isByte = unit >= 0xdc80 && unit <= 0xdcff;
        if (isByte)
            name.push_back(static_cast<char>(unit & 0xff));
        else
            name.append(bytes, detail::EncodeUtf8(codePoint, bytes));
    }
    return name;
}

int String::ToUtf8(char* buffer, int maxBytes) const {
    if (!buffer || maxBytes < 0) return -1;
    auto const room = static_cast<std::size_t>(maxBytes);
    std::size_t used = 0;
    char bytes[4];
    for (std::size_t position = 0; position < mText.size();) {
        std::size_t const length = detail::EncodeUtf8(detail::NextCodePoint(mText, position), bytes);
        if (length > room - used) break;
        std::memcpy(buffer + used, bytes, length);
        used += length;
    }
    buffer[used] = '\0';
    return static_cast<int>(used);
}

} // namespace Moka
