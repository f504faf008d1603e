// GlslTokens.h: splits a GLSL source into tokens. The tokens joined are the source again.
// It does not run the preprocessor: a directive is one token, and both branches of an #if are returned.
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
    std::string_view text; // points into the source, which must outlive the token
};

std::vector<GlslToken> SplitGlsl(std::string_view source);

} // namespace Moka::detail
