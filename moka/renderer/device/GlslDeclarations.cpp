#include "moka/renderer/device/GlslDeclarations.h"

#include "moka/renderer/device/GlslTokens.h"

#include <algorithm>
#include <cstring>
#include <string_view>

namespace Moka::detail {
namespace {

using Tokens = std::vector<std::string_view>;

bool IsOtherQualifier(std::string_view word) {
    static constexpr std::string_view kQualifiers[] = {"layout",   "invariant", "flat",    "smooth",
                                                       "centroid", "highp",     "mediump", "lowp"};
    return std::find(std::begin(kQualifiers), std::end(kQualifiers), word) != std::end(kQualifiers);
}

// Adds the variables that one statement declares. The statement consists of qualifiers, a type, and names
// with commas and initialisers; its brackets have been removed.
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
    for (GlslToken const& found : SplitGlsl(source ? source : "")) {
        if (found.kind == GlslToken::Kind::Blank || found.kind == GlslToken::Kind::Directive) continue;
        std::string_view const token = found.text;
        if (std::strchr("({[", token.front())) {
            // The tokens before a body belong to a function or a block, not to a variable.
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
