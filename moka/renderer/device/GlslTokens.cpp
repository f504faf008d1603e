#include "moka/renderer/device/GlslTokens.h"

#include <algorithm>
#include <cctype>

namespace Moka::detail {
namespace {

using Kind = GlslToken::Kind;

bool IsWordCharacter(char c) { return std::isalnum(static_cast<unsigned char>(c)) || c == '_'; }
bool IsSpace(char c) { return std::isspace(static_cast<unsigned char>(c)) != 0; }

bool StartsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

// Returns the number of characters up to `end`, including it if includesEnd. Without an `end`, returns the
// length of the text.
std::size_t LengthTo(std::string_view text, std::string_view end, std::size_t from, bool includesEnd) {
    std::size_t const found = text.find(end, from);
    if (found == std::string_view::npos) return text.size();
    return found + (includesEnd ? end.size() : 0);
}

template <class Belongs>
std::size_t LengthWhile(std::string_view text, Belongs const& belongs) {
    return static_cast<std::size_t>(std::find_if_not(text.begin(), text.end(), belongs) - text.begin());
}

GlslToken First(std::string_view text) {
    if (IsSpace(text.front())) return {Kind::Blank, text.substr(0, LengthWhile(text, IsSpace))};
    if (StartsWith(text, "//")) return {Kind::Blank, text.substr(0, LengthTo(text, "\n", 0, false))};
    // The search starts after the opening "/*", because "/*/" does not close a comment.
    if (StartsWith(text, "/*")) return {Kind::Blank, text.substr(0, LengthTo(text, "*/", 2, true))};
    if (text.front() == '#') return {Kind::Directive, text.substr(0, LengthTo(text, "\n", 0, false))};
    if (IsWordCharacter(text.front()))
        return {Kind::Word, text.substr(0, LengthWhile(text, IsWordCharacter))};
    return {Kind::Symbol, text.substr(0, 1)};
}

} // namespace

std::vector<GlslToken> SplitGlsl(std::string_view source) {
    std::vector<GlslToken> tokens;
    while (!source.empty()) {
        tokens.push_back(First(source));
        source.remove_prefix(tokens.back().text.size());
    }
    return tokens;
}

} // namespace Moka::detail
