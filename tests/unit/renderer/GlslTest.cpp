// The rewriting of a program's text: what it refuses, and what stays where it was.
#include "moka/renderer/gles/GlslVariant.h"

#include "moka/renderer/device/GlslDeclarations.h"
#include <gmock/gmock.h>

namespace Moka::Testing {
namespace {

using namespace detail;
using ::testing::HasSubstr;
using ::testing::Not;

constexpr char kVertex[] = "attribute vec2 corner; void main() { gl_Position = vec4(corner, 0.0, 1.0); }";
constexpr char kFragment[] = "uniform mediump vec4 color; void main() { gl_FragColor = color; }";

ProgramLayout MakeLayout() {
    ProgramLayout layout;
    layout.Add("texel", BindingTypeTextureUnit);
    layout.Add("count", BindingTypeInt);
    layout.Add("flag", BindingTypeBool);
    layout.Add("color", BindingTypeVector4);
    return layout;
}

// The reason, or nothing.
std::string FindReason(std::string const& vertex, std::string const& fragment,
                       ProgramLayout const& layout = MakeLayout()) {
    std::string reason;
    GlslStages const sources{vertex, fragment};
    bool const isMade = MakeGlslVariant({sources, layout, 0, {0, 0}}, &reason).has_value();
    EXPECT_EQ(isMade, reason.empty()) << vertex << fragment;
    return reason;
}

TEST(GlslVariantTest, TextThatIsNotUnderstoodIsRefusedWithItsReason) {
    struct {
        std::string before; // what stands before the fragment's text
        char const* reason;
    } const cases[] = {
        {"", ""},
        {"#define TWO 2.0\n#ifdef TWO\nvec2 pair;\n#endif\n/* gl_VertexID */ // uniform float x[2];\n", ""},
        {"void f(highp float color, in int main_) {}\n", ""},
        {"uniform highp float list[2];\n", "declared with ["},
        {"uniform vec4 color = vec4(1.0);\n", "declared with ="},
        {"uniform Block { vec4 a; };\n", "of type Block"},
        {"uniform vec3 tint;\n", "of type vec3"},
        {"layout(location = 1) uniform vec4 tint;\n", "qualifier"},
        {"int n = gl_VertexID;\n", "gl_VertexID"},
        {"void f() { gl_FragData[0] = vec4(0.0); }\n", "gl_FragData"},
        {"float mokaNumber;\n", "mokaNumber"},
        {"#extension GL_OES_standard_derivatives : enable\n", "extension"},
        {"#define IN uniform\n", "directive contains uniform"},
        {"#define entry main\n", "directive contains main"},
        {"#if __VERSION__ > 100\n#endif\n", "directive contains __VERSION__"},
        {"#define LONG \\\n 1.0\n", "next line"},
        {"#ifdef A\nuniform vec4 tint;\n#endif\n", "condition contains uniform"},
        {"#endif\n", "not closed"},
    };
    for (auto const& [before, reason] : cases) {
        std::string const found = FindReason(kVertex, before + kFragment);
        EXPECT_THAT(found, HasSubstr(reason)) << before;
        EXPECT_EQ(found.empty(), *reason == 0) << before << found;
    }
    EXPECT_THAT(FindReason("attribute vec2 corner;", kFragment), HasSubstr("main()"));
    EXPECT_THAT(FindReason(kVertex, "void main() {}"), HasSubstr("declaration of color"));
    EXPECT_THAT(FindReason(kVertex, kFragment, {}), HasSubstr("no uniforms"));
    // An extension of GLSL ES 3.00 goes with the text, to where it has to stand.
    std::string const modern = "#version 300 es\n#extension GL_OES_any : warn\nuniform mediump vec4 color;"
                               "out mediump vec4 c; void main() { c = color; }";
    EXPECT_EQ(FindReason("#version 300 es\nvoid main() {}", modern), "");
}

TEST(GlslVariantTest, UniformsTooLargeForABlockAreRefused) {
    for (int const count : {256, 257}) {
        ProgramLayout layout;
        std::string text;
        for (int i = 0; i < count; ++i) {
            std::string const name = "m" + std::to_string(i);
            layout.Add(name.c_str(), BindingTypeMatrix4);
            text += "uniform mat4 " + name + ";\n";
        }
        EXPECT_EQ(GetRecordsPerBlock(layout), count == 256 ? 1u : 0u);
        EXPECT_EQ(FindReason(text + kVertex, "void main() {}", layout),
                  count == 256 ? "" : "its uniforms are too large for a block");
    }
}

int CountLines(std::string_view text) { return static_cast<int>(std::count(text.begin(), text.end(), '\n')); }

// The line of the word after the last #line, counted from 1.
int FindLine(std::string const& text, char const* word) {
    std::size_t const begin = text.find("#line 1\n") + 8;
    std::size_t const at = text.find(word, begin);
    return at == std::string::npos ? 0 : 1 + CountLines(std::string_view(text).substr(begin, at - begin));
}

TEST(GlslVariantTest, LinesKeepTheirNumbersAndSamplersStay) {
    std::string const fragment = "precision mediump float; // 1\n"
                                 "uniform /* over\n two lines */ vec4\n color,\n unused\n;\n"
                                 "uniform sampler2D texel; uniform int count; uniform bool flag;\n"
                                 "#define SEVENTH\n"
                                 "void main() {\n"
                                 "  gl_FragColor = texture2D(texel, color.xy) * float(count); }\n";
    GlslStages const sources{kVertex, fragment};
    ProgramLayout const layout = MakeLayout();
    std::string reason;
    std::vector<std::int32_t> const integers{7, 1};
    // The second integer varies.
    std::optional<GlslStages> const made = MakeGlslVariant({sources, layout, 2, integers}, &reason);
    ASSERT_TRUE(made) << reason;
    EXPECT_EQ(FindLine(made->fragment, "texel;"), FindLine("#line 1\n" + fragment, "texel;"));
    EXPECT_EQ(FindLine(made->fragment, "SEVENTH"), FindLine("#line 1\n" + fragment, "SEVENTH"));
    EXPECT_EQ(FindLine(made->fragment, "* float"), FindLine("#line 1\n" + fragment, "* float"));
    EXPECT_THAT(made->fragment, HasSubstr("uniform sampler2D texel"));
    EXPECT_THAT(made->fragment, HasSubstr("texture(texel, color.xy)"));
    EXPECT_THAT(made->fragment, HasSubstr("const int count = 7;"));
    EXPECT_THAT(made->fragment, HasSubstr("flat in int moka_flag; bool flag;"));
    EXPECT_THAT(made->fragment, Not(HasSubstr("moka_unused")));
    EXPECT_THAT(made->vertex, HasSubstr("in vec2 corner;"));
}

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
