#include "moka/renderer/gles/GlProgramBuilder.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/device/GlslDeclarations.h"

#include <string>

namespace Moka::detail {
namespace {

// The placeholder program. Every vertex lies outside the clip volume, so nothing is rasterized.
constexpr char kVertexOutside[] = "#version 100\nvoid main() { gl_Position = vec4(2.0, 2.0, 2.0, 1.0); }\n";
constexpr char kFragmentNever[] = "#version 100\nvoid main() { gl_FragColor = vec4(0.0); }\n";

// Returns the driver's log without the line break that most drivers append.
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
    ShaderStage(GLenum kind, char const* source) : mName(Gl::CreateShader(kind)) {
        char const* const text = source ? source : "";
        Gl::ShaderSource(mName, 1, &text, nullptr);
        Gl::CompileShader(mName);
    }
    ~ShaderStage() { Gl::DeleteShader(mName); }
    ShaderStage(ShaderStage const&) = delete;
    ShaderStage& operator=(ShaderStage const&) = delete;

    GLuint GetName() const { return mName; }

    bool IsCompiled() const {
        GLint compiled = GL_FALSE;
        Gl::GetShaderiv(mName, GL_COMPILE_STATUS, &compiled);
        return compiled == GL_TRUE;
    }

    std::string GetLog() const {
        GLint length = 0;
        Gl::GetShaderiv(mName, GL_INFO_LOG_LENGTH, &length);
        return ReadLog(length, [this](GLsizei size, GLsizei* written, GLchar* text) {
            Gl::GetShaderInfoLog(mName, size, written, text);
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
        Gl::BindAttribLocation(program, location, attribute.name.c_str());
        location += static_cast<GLuint>(CountLocations(attribute.type));
    }
}

std::string GetProgramLog(GLuint program) {
    GLint length = 0;
    Gl::GetProgramiv(program, GL_INFO_LOG_LENGTH, &length);
    return ReadLog(length, [program](GLsizei size, GLsizei* written, GLchar* text) {
        Gl::GetProgramInfoLog(program, size, written, text);
    });
}

} // namespace

GLuint LinkGlProgram(char const* vertexSource, char const* fragmentSource, char const* attributeSource,
                     std::string* failure) {
    ShaderStage const vertex(GL_VERTEX_SHADER, vertexSource);
    ShaderStage const fragment(GL_FRAGMENT_SHADER, fragmentSource);
    for (auto const& [stage, what] : {std::pair(&vertex, "vertex"), std::pair(&fragment, "fragment")}) {
        if (stage->IsCompiled()) continue;
        *failure = std::string("the ") + what + " stage does not compile: " + stage->GetLog();
        return 0;
    }
    GLuint const program = Gl::CreateProgram();
    Gl::AttachShader(program, vertex.GetName());
    Gl::AttachShader(program, fragment.GetName());
    BindAttributes(program, attributeSource);
    Gl::LinkProgram(program);
    Gl::DetachShader(program, vertex.GetName());
    Gl::DetachShader(program, fragment.GetName());
    GLint linked = GL_FALSE;
    Gl::GetProgramiv(program, GL_LINK_STATUS, &linked);
    if (linked == GL_TRUE) return program;
    *failure = "the stages do not link: " + GetProgramLog(program);
    Gl::DeleteProgram(program);
    return 0;
}

GLuint BuildGlProgram(char const* vertexSource, char const* fragmentSource, char const* label, bool* draws) {
    std::string failure;
    GLuint const program = LinkGlProgram(vertexSource, fragmentSource, vertexSource, &failure);
    *draws = program != 0;
    if (*draws) return program;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "RendererFactory::CreateShaderProgram: %s draws nothing: %s", label, failure.c_str());
    return LinkGlProgram(kVertexOutside, kFragmentNever, kVertexOutside, &failure);
}

} // namespace Moka::detail
