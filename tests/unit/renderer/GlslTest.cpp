// The rewriting of a program's text: what it refuses, and what stays where it was.
#include "moka/renderer/gles/GlslVariant.h"

#include <gmock/gmock.h>

namespace Moka::Testing {
namespace {

using namespace detail;
using ::testing::HasSubstr;

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

// Counted from the last #line, where the driver's messages count from.
std::ptrdiff_t FindLine(std::string const& text, char const* word) {
    auto const begin = text.begin() + static_cast<std::ptrdiff_t>(text.rfind("#line 1\n") + 8);
    return std::count(begin, text.begin() + static_cast<std::ptrdiff_t>(text.find(word)), '\n');
}

// What the rewritten text draws is seen in MergedProgramsTest.
TEST(GlslVariantTest, LinesKeepTheirNumbersAndUnusedNamesGo) {
    std::string const fragment = "#line 1\n"
                                 "precision mediump float; // 1\n"
                                 "uniform /* over\n two lines */ vec4\n color,\n unused\n;\n"
                                 "uniform sampler2D texel; uniform int count; uniform bool flag;\n"
                                 "#define SEVENTH\n"
                                 "void main() {\n"
                                 "  gl_FragColor = texture2D(texel, color.xy) * float(count); }\n";
    GlslStages const sources{kVertex, fragment.substr(8)};
    ProgramLayout const layout = MakeLayout();
    std::string reason;
    std::optional<GlslStages> const made = MakeGlslVariant({sources, layout, 0, {7, 1}}, &reason);
    ASSERT_TRUE(made) << reason;
    for (char const* const word : {"texel;", "SEVENTH", "* float"})
        EXPECT_EQ(FindLine(made->fragment, word), FindLine(fragment, word)) << word;
    EXPECT_EQ(made->fragment.find("moka_unused"), std::string::npos);
}

} // namespace
} // namespace Moka::Testing
