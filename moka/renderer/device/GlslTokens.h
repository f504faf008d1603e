// GlslTokens.h: a GLSL text as tokens. Joined, they are the text again.
// Does not run the preprocessor: a directive is one token, and both branches of an #if are seen.
#pragma once

#include <string_view>
#include <vector>

namespace Moka::detail {

struct GlslToken {
    enum class Kind {
        Word,      // an identifier, a keyword, or the digits of a number
        Symbol,    // any other character, alone
        Blank,     // white space and comments
        Directive, // from # to the end of the line, without it
    };

    Kind kind;
    std::string_view text; // of the source, which outlives the token
};

std::vector<GlslToken> SplitGlsl(std::string_view source);

} // namespace Moka::detail
