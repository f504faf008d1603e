#include "moka/renderer/gles/GlProgramBuilder.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlslDeclarations.h"

#include <string>

namespace Moka::detail {
namespace {

// Every vertex lies outside the clip volume: whatever is drawn, nothing arrives.
constexpr char kVertexOutside[] = "#version 100\nvoid main() { gl_Position = vec4(2.0, 2.0, 2.0, 1.0); }\n";
constexpr char kFragmentNever[] = "#version 100\nvoid main() { gl_FragColor = vec4(0.0); }\n";

// The driver's text without the line end that most drivers put behind it.
template <class Query>
std::string ReadLog(GLint length, Query query) {
    std::string text(static_cast<std::size_t>(length > 0 ? length : 1), '\0');
    GLsizei written = 0;
    query(static_cast<GLsizei>(text.size()), &written, text.data());
    text.resize(static_cast<std::size_t>(written));
    while (!text.empty() && (text.back() == '\n' || text.back() == '\0')) text.pop_back();
    return text;
}

class ShaderStage {
public:
    ShaderStage(GLenum kind, char const* source) : mName(glCreateShader(kind)) {
        char const* const text = source ? source : "";
        glShaderSource(mName, 1, &text, nullptr);
        glCompileShader(mName);
    }
    ~ShaderStage() { glDeleteShader(mName); }
    ShaderStage(ShaderStage const&) = delete;
    ShaderStage& operator=(ShaderStage const&) = delete;

    GLuint GetName() const { return mName; }

    bool IsCompiled() const {
        GLint compiled = GL_FALSE;
        glGetShaderiv(mName, GL_COMPILE_STATUS, &compiled);
        return compiled == GL_TRUE;
    }

    std::string GetLog() const {
        GLint length = 0;
        glGetShaderiv(mName, GL_INFO_LOG_LENGTH, &length);
        return ReadLog(length, [this](GLsizei size, GLsizei* written, GLchar* text) {
            glGetShaderInfoLog(mName, size, written, text);
        });
    }

private:
    GLuint const mName;
};

// A matrix takes a location for each of its columns: "mat4", "mat3x2".
int CountLocations(std::string const& type) {
    return type.size() > 3 && type.compare(0, 3, "mat") == 0 ? type[3] - '0' : 1;
}

void BindAttributes(GLuint program, char const* vertexSource) {
    GLuint location = 0;
    for (GlslDeclaration const& attribute : FindGlslDeclarations(vertexSource, {"attribute", "in"})) {
        glBindAttribLocation(program, location, attribute.name.c_str());
        location += static_cast<GLuint>(CountLocations(attribute.type));
    }
}

std::string GetProgramLog(GLuint program) {
    GLint length = 0;
    glGetProgramiv(program, GL_INFO_LOG_LENGTH, &length);
    return ReadLog(length, [program](GLsizei size, GLsizei* written, GLchar* text) {
        glGetProgramInfoLog(program, size, written, text);
    });
}

// 0, with failure set, when one of the three steps fails.
GLuint Link(char const* vertexSource, char const* fragmentSource, std::string* failure) {
    ShaderStage const vertex(GL_VERTEX_SHADER, vertexSource);
    ShaderStage const fragment(GL_FRAGMENT_SHADER, fragmentSource);
    for (auto const& [stage, what] : {std::pair(&vertex, "vertex"), std::pair(&fragment, "fragment")}) {
        if (stage->IsCompiled()) continue;
        *failure = std::string("the ") + what + " stage does not compile: " + stage->GetLog();
        return 0;
    }
    GLuint const program = glCreateProgram();
    glAttachShader(program, vertex.GetName());
    glAttachShader(program, fragment.GetName());
    BindAttributes(program, vertexSource);
    glLinkProgram(program);
    glDetachShader(program, vertex.GetName());
    glDetachShader(program, fragment.GetName());
    GLint linked = GL_FALSE;
    glGetProgramiv(program, GL_LINK_STATUS, &linked);
    if (linked == GL_TRUE) return program;
    *failure = "the stages do not link: " + GetProgramLog(program);
    glDeleteProgram(program);
    return 0;
}

} // namespace

GlBuiltProgram BuildGlProgram(GlContext& context, char const* vertexSource, char const* fragmentSource,
                              char const* name) {
    std::string failure;
    GlBuiltProgram program{Link(vertexSource, fragmentSource, &failure), false};
    if (program.name == 0) {
        ++context.statistics.errors;
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "RendererFactory::CreateShaderProgram: %s draws nothing: %s", name,
                            failure.c_str());
        program = {Link(kVertexOutside, kFragmentNever, &failure), true};
    }
    return program;
}

} // namespace Moka::detail
