// GlslDeclarations.h: the global variables that a GLSL text declares, found without a compiler: drivers
// report the active ones only, and in an order of their own.
// Does not run the preprocessor: both branches of an #if are seen. Interface blocks are skipped.
#pragma once

#include <string>
#include <vector>

namespace Moka::detail {

struct GlslDeclaration {
    std::string qualifier; // the storage qualifier: "attribute", "in", "uniform"
    std::string type;      // "vec4"
    std::string name;
};

// In the order of the text, those with one of these qualifiers. A null source declares nothing.
std::vector<GlslDeclaration> FindGlslDeclarations(char const* source,
                                                  std::vector<std::string> const& qualifiers);

} // namespace Moka::detail
