// GlslDeclarations.h: finds the global variables that a GLSL source declares, without a compiler. Drivers
// report only active variables, and not in the order of declaration.
// It does not run the preprocessor, so it finds declarations in both branches of an #if. It skips interface
// blocks.
#pragma once

#include <string>
#include <vector>

namespace Moka::detail {

struct GlslDeclaration {
    std::string qualifier; // the storage qualifier: "attribute", "in", "uniform"
    std::string type;      // "vec4"
    std::string name;
};

// Returns the declarations with one of these qualifiers, in the order of the source. A null source has none.
std::vector<GlslDeclaration> FindGlslDeclarations(char const* source,
                                                  std::vector<std::string> const& qualifiers);

} // namespace Moka::detail
