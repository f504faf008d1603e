#include "moka/renderer/device/GlslDeclarations.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string_view>

namespace Moka::detail {
namespace {

using Tokens = std::vector<std::string_view>;

bool IsWordCharacter(char c) { return std::isalnum(static_cast<unsigned char>(c)) || c == '_'; }

// Words and single characters; comments and preprocessor lines are left out.
class GlslTokenizer {
public:
    explicit GlslTokenizer(std::string_view text) : mText(text) {}

    // Empty at the end.
    std::string_view Next() {
        SkipBlanks();
        std::size_t length = 0;
        while (length < mText.size() && IsWordCharacter(mText[length])) ++length;
        return Take(std::max<std::size_t>(length, 1));
    }

private:
    std::string_view Take(std::size_t length) {
        std::string_view const taken = mText.substr(0, length);
        mText.remove_prefix(taken.size());
        return taken;
    }

    bool StartsWith(std::string_view prefix) const { return mText.substr(0, prefix.size()) == prefix; }

    void SkipPast(std::string_view end) {
        std::size_t const found = mText.find(end);
        mText.remove_prefix(found == std::string_view::npos ? mText.size() : found + end.size());
    }

    void SkipBlanks() {
        while (!mText.empty()) {
            if (std::isspace(static_cast<unsigned char>(mText.front()))) {
                mText.remove_prefix(1);
            } else if (StartsWith("//") || StartsWith("#")) {
                SkipPast("\n");
            } else if (StartsWith("/*")) {
                // From behind the opening: "/*/" opens a comment and does not close it.
                mText.remove_prefix(2);
                SkipPast("*/");
            } else {
                return;
            }
        }
    }

    std::string_view mText;
};

bool IsOtherQualifier(std::string_view word) {
    static constexpr std::string_view kQualifiers[] = {"layout",   "invariant", "flat",    "smooth",
                                                       "centroid", "highp",     "mediump", "lowp"};
    return std::find(std::begin(kQualifiers), std::end(kQualifiers), word) != std::end(kQualifiers);
}

// The variables of one statement whose brackets have been left out: qualifiers, a type, names with commas and
// initialisers between them.
void AddVariables(Tokens const& statement, std::vector<std::string> const& wanted,
                  std::vector<GlslDeclaration>& declarations) {
    std::string_view qualifier;
    auto token = statement.begin();
    for (; token != statement.end(); ++token) {
        bool const isWanted = std::find(wanted.begin(), wanted.end(), *token) != wanted.end();
        if (isWanted) qualifier = *token;
        if (!isWanted && !IsOtherQualifier(*token)) break;
    }
    if (qualifier.empty() || token == statement.end()) return;
    std::string_view const type = *token++;
    bool expectsName = true;
    for (; token != statement.end(); ++token) {
        if (expectsName)
            declarations.push_back({std::string(qualifier), std::string(type), std::string(*token)});
        expectsName = *token == ",";
    }
}

} // namespace

std::vector<GlslDeclaration> FindGlslDeclarations(char const* source,
                                                  std::vector<std::string> const& qualifiers) {
    std::vector<GlslDeclaration> declarations;
    Tokens statement;
    int depth = 0;
    GlslTokenizer tokenizer(source ? source : "");
    for (std::string_view token = tokenizer.Next(); !token.empty(); token = tokenizer.Next()) {
        if (std::strchr("({[", token.front())) {
            // What stands before a body is a function or a block, no variable.
            if (token == "{" && depth == 0) statement.clear();
            ++depth;
        } else if (std::strchr(")}]", token.front())) {
            --depth;
        } else if (depth == 0 && token == ";") {
            AddVariables(statement, qualifiers, declarations);
            statement.clear();
        } else if (depth == 0) {
            statement.push_back(token);
        }
    }
    return declarations;
}

} // namespace Moka::detail
