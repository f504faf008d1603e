#include "moka/renderer/device/GlslDeclarations.h"

#include <gmock/gmock.h>

namespace Moka::Testing {
namespace {

using detail::FindGlslDeclarations;
using ::testing::ElementsAre;

std::vector<std::string> Find(char const* source, std::vector<std::string> const& qualifiers) {
    std::vector<std::string> found;
    for (auto const& declaration : FindGlslDeclarations(source, qualifiers)) {
        found.push_back(declaration.qualifier + " " + declaration.type + " " + declaration.name);
    }
    return found;
}

TEST(GlslDeclarationsTest, ComeInTheOrderOfTheTextWhateverTheyAreDressedIn) {
    char const* const source = R"(#version 300 es
#define in nothing
precision highp float;
layout(location = 2, component = 1) in highp vec4 zulu;
flat in/**/int alpha,beta
    ;uniform mediump vec2 size;
in mat4x3 many[2], one; uniform sampler2D a = b(1, 2), c;
uniform Block { vec4 inside; } block;
)";
    EXPECT_THAT(Find(source, {"in", "attribute"}), ElementsAre("in vec4 zulu", "in int alpha", "in int beta",
                                                               "in mat4x3 many", "in mat4x3 one"));
    EXPECT_THAT(Find(source, {"uniform"}),
                ElementsAre("uniform vec2 size", "uniform sampler2D a", "uniform sampler2D c"));
}

TEST(GlslDeclarationsTest, WordsInCommentsBodiesAndParametersAreNoDeclarations) {
    char const* const source = R"(
// attribute vec4 commented;
/*/ uniform vec4 gone; /*/ attribute vec3 first;
float f(in vec4 parameter, const in float other) { vec4 attribute_; { int in_; } return 1.0; }
uniform float after; // uniform
attribute vec2 last; /* never closed; attribute vec2 swallowed;)";
    EXPECT_THAT(Find(source, {"in", "attribute"}),
                ElementsAre("attribute vec3 first", "attribute vec2 last"));
    EXPECT_THAT(Find(source, {"uniform"}), ElementsAre("uniform float after"));
}

} // namespace
} // namespace Moka::Testing
