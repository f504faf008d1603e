#include "moka/base/Log.h"

#include "moka/base/String.h"
#include "moka/base/System.h"
#include "moka/base/Utf.h"

#include <algorithm>
#include <string_view>

namespace Moka {
namespace {

// The text after a dot may be part of a sentence. Only a short plain text counts as an extension.
constexpr std::size_t kLongestExtension = 5;

bool IsPlain(char16_t unit) {
    return (unit >= u'0' && unit <= u'9') || (unit >= u'a' && unit <= u'z') || (unit >= u'A' && unit <= u'Z');
}

// Returns the position of the extension's dot, or the length of the text if there is no extension.
std::size_t FindExtension(std::u16string_view text) {
    std::size_t const slash = text.rfind(u'/');
    std::size_t const name = slash == std::u16string_view::npos ? 0 : slash + 1;
    std::size_t const dot = text.rfind(u'.');
    // A dot at the beginning of the name marks a hidden file, not an extension.
    if (dot == std::u16string_view::npos || dot <= name) return text.size();
    std::u16string_view const extension = text.substr(dot + 1);
    bool const known = !extension.empty() && extension.size() <= kLongestExtension &&
                       std::all_of(extension.begin(), extension.end(), IsPlain);
    return known ? dot : text.size();
}

} // namespace

std::string Log::ConvertSecureLog(String const& text) {
    if (System::IsBuildTypeEngMode()) return text.ToUtf8();
    std::u16string_view const units(text.GetPointer(), static_cast<std::size_t>(text.GetLength()));
    std::size_t const extension = FindExtension(units);
    std::string masked;
    for (std::size_t position = 0; position < extension;) {
        masked.push_back(detail::NextCodePoint(units, position) == U'/' ? '/' : '*');
    }
    for (char16_t const unit : units.substr(extension)) masked.push_back(static_cast<char>(unit));
    return masked;
}

} // namespace Moka
