// Programs and their parameters: what reaches the shader, what is not sent, and programs that are none.
#include "tests/pixel/renderer/RendererFixture.h"

#include "moka/renderer/IParameterBinding.h"

#include <gmock/gmock.h>

namespace Moka::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ParameterPtr = std::unique_ptr<IParameterBinding>;

constexpr char kVertex[] = "attribute vec2 corner; void main() { gl_Position = vec4(corner, 0.0, 1.0); }";
constexpr char kUniformColor[] =
    "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }";

ProgramPtr MakeProgram(char const* vertex, char const* fragment, char const* name = "TestProgram") {
    return ProgramPtr(RendererFactory::CreateShaderProgram(vertex, fragment, name));
}

ParameterPtr Find(ProgramPtr const& program, char const* name) {
    return ParameterPtr(program->GetParameter(name));
}

template <class T>
void Set(ParameterPtr const& parameter, T const& value) {
    parameter->Set(&value);
}

using Numbers = std::vector<float>;
void Set(ParameterPtr const& parameter, Numbers const& values) { parameter->Set(values.data()); }

// The GL name.
GLuint MakeCurrent(ProgramPtr const& program) {
    program->MakeCurrent();
    return static_cast<GLuint>(GetInteger(GL_CURRENT_PROGRAM));
}

class ProgramTest : public RendererFixture {
protected:
    ProgramTest() { mImage.target->Activate(); }

    // What the current program draws over the whole target.
    Color Draw() {
        Clear(*mImage.target, kClear);
        RendererFactory::Commit();
        GLfloat const corners[] = {-1, -1, 1, -1, -1, 1, 1, 1};
        glBindBuffer(GL_ARRAY_BUFFER, 0);
        glEnableVertexAttribArray(0);
        glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, 0, corners);
        glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
        glDisableVertexAttribArray(0);
        RendererFactory::InvalidateState();
        Picture const image = Read(*mImage.target, 2, 2);
        EXPECT_EQ(image, MakeImage(2, 2, image.GetColor(0, 0)));
        return image.GetColor(0, 0);
    }

    OffscreenImage mImage = MakeOffscreen(MakeImage(2, 2));
};

TEST_F(ProgramTest, AttributesTakeTheirLocationsInTheOrderOfTheText) {
    ProgramPtr const program =
        MakeProgram("attribute vec2 zulu; // attribute float none;\n"
                    "#define NONE attribute vec4 none;\n"
                    "/*/ attribute vec4 gone; /*/ attribute/**/mat3 matrix;\n"
                    "float f(const in float other) { vec4 attribute_ = vec4(other); return attribute_.x; }\n"
                    "attribute highp mat2 large; attribute highp float mike,alpha\n;"
                    "void main() { gl_Position = vec4(zulu + large[1], mike, f(alpha)) + matrix[2].xyzx; }",
                    "void main() { gl_FragColor = vec4(1.0); }");
    GLuint const name = MakeCurrent(program);
    EXPECT_EQ(glGetAttribLocation(name, "zulu"), 0);
    EXPECT_EQ(glGetAttribLocation(name, "matrix"), 1);
    EXPECT_EQ(glGetAttribLocation(name, "large"), 4);
    EXPECT_EQ(glGetAttribLocation(name, "mike"), 6);
    EXPECT_EQ(glGetAttribLocation(name, "alpha"), 7);
}

// What arrives is seen in the scenes, which use every type but one.
TEST_F(ProgramTest, EveryTypeIsReportedAndABoolIsOneByte) {
    ProgramPtr const program =
        MakeProgram("#version 300 es\n"
                    "in vec2 corner; uniform mat4 matrix; uniform int count; uniform vec2 pair;\n"
                    "void main() { gl_Position = matrix * vec4(corner * pair, float(count), 1); }",
                    "#version 300 es\n"
                    "precision highp float; uniform bool flag; uniform vec4 quad; uniform float number;\n"
                    "uniform sampler2D texel; out vec4 color;\n"
                    "void main() { color = (flag ? quad : quad.gbra) * number + texture(texel, quad.xy); }");
    std::pair<char const*, int> const types[] = {{"flag", 1},   {"matrix", 2}, {"pair", 3}, {"quad", 5},
                                                 {"number", 6}, {"count", 7},  {"texel", 8}};
    for (auto const& [name, type] : types) EXPECT_EQ(Find(program, name)->GetType(), type) << name;
    program->MakeCurrent();
    Set(Find(program, "matrix"), Numbers{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1});
    Set(Find(program, "pair"), Numbers{1, 1});
    Set(Find(program, "quad"), Numbers{1, 0, 0, 1});
    Set(Find(program, "number"), 1.0f);
    TexturePtr const nothing = MakeTexture(1, 1);
    nothing->Bind(0);
    struct {
        bool value;
        unsigned char strangers[3] = {0xFF, 0xFF, 0xFF}; // not the bool's
    } bools{true};
    for (Color const& color : {kRed, Color{0, 0, 255, 255}}) {
        Set(Find(program, "flag"), bools);
        EXPECT_EQ(Draw(), color);
        bools.value = false;
    }
}

TEST_F(ProgramTest, RemovedAndUnknownParametersAreHarmlessHandlesAndUnknownTypesReported) {
    ProgramPtr const program = MakeProgram(
        kVertex, "precision highp float; uniform vec4 color; uniform mat4 unused; uniform vec3 tint;"
                 "uniform vec4 list[2]; void main() { gl_FragColor = color + vec4(tint, 0.0) + list[1]; }");
    EXPECT_THAT(TakeErrors(),
                ::testing::UnorderedElementsAre(AllOf(HasSubstr("TestProgram"), HasSubstr("tint")),
                                                AllOf(HasSubstr("TestProgram"), HasSubstr("list"))));
    program->MakeCurrent();
    Set(Find(program, "color"), Numbers{0, 1, 0, 1});
    for (char const* name : {"unused", "tint", "list", "nowhere", "", "corner"}) {
        ParameterPtr const parameter = Find(program, name);
        ASSERT_TRUE(parameter) << name;
        EXPECT_EQ(parameter->GetType(), BindingTypeUnknown) << name;
        Set(parameter, Numbers(16, 1.0f));
        parameter->Set(nullptr);
    }
    EXPECT_TRUE(Find(program, nullptr));
    EXPECT_EQ(Draw(), kGreen);
}

TEST_F(ProgramTest, SourcesThatDoNotCompileOrLinkMakeAProgramThatDrawsNothing) {
    struct {
        char const* vertex;
        char const* fragment;
        char const* stage;
    } const cases[] = {
        {"attribute vec2 corner; void main() { gl_Position = misspelt; }", kUniformColor, "vertex"},
        {kVertex, "uniform vec4 color; void main() { gl_FragColor = misspelt; }", "fragment"},
        {kVertex, "precision highp float; varying vec4 misspelt; void main() { gl_FragColor = misspelt; }",
         "link"},
        {"", kUniformColor, ""},
        {nullptr, nullptr, ""},
        {"/* never closed; uniform vec4 misspelt;", "{", ""},
    };
    for (auto const& [vertex, fragment, stage] : cases) {
        std::uint64_t const errors = Count().errors;
        ProgramPtr const program = MakeProgram(vertex, fragment, "BrokenProgram");
        ASSERT_TRUE(program);
        std::vector<std::string> const lines = TakeErrors();
        ASSERT_EQ(lines.size(), 1u) << stage;
        EXPECT_THAT(lines[0], AllOf(HasSubstr("BrokenProgram"), HasSubstr(stage)));
        EXPECT_THAT(lines[0], HasSubstr(*stage ? "misspelt" : "")); // the driver's own words
        EXPECT_EQ(Count().errors, errors + 1);
        EXPECT_EQ(Count().programs, 1);
        ParameterPtr const color = Find(program, "color");
        EXPECT_EQ(color->GetType(), BindingTypeUnknown);
        program->MakeCurrent();
        Set(color, Numbers{1, 1, 1, 1});
        EXPECT_EQ(Draw(), kClear) << stage;
    }
    ForgetDriverErrors();
}

} // namespace
} // namespace Moka::Testing
