#include "moka/renderer/gles/GlFill.h"

#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlProgramBuilder.h"
#include "moka/renderer/gles/GlUniforms.h"

namespace Moka::detail {
namespace {

constexpr char kVertex[] = "#version 100\n"
                           "attribute vec2 corner;\n"
                           "void main() { gl_Position = vec4(corner, 0.0, 1.0); }\n";
constexpr char kFragment[] = "#version 100\n"
                             "precision highp float;\n"
                             "uniform vec4 color;\n"
                             "void main() { gl_FragColor = color; }\n";
constexpr GLfloat kCorners[] = {-1, -1, 1, -1, -1, 1, 1, 1};

} // namespace

void GlFill::Add(std::shared_ptr<GlContext> const& context, GlTargetUse const& target,
                 std::array<GLfloat, 4> const& color) {
    if (!mProgram) Make(context);
    if (!mProgram->CanDraw()) return;
    mProgram->Set(mColor, color.data());
    GlDrawState state;
    state.target = target;
    state.scissor = context->current.GetScissor();
    state.depthStencil = context->current.GetDepthStencil();
    state.program = mProgram;
    state.format = mFormat;
    state.primitive = PrimitiveType::TriangleStrip;
    context->list.AddDraw(state, false, kCorners, 4, 2);
    context->current.SetChanged();
}

void GlFill::Make(std::shared_ptr<GlContext> const& context) {
    char const* const name = "moka fill";
    GlBuiltProgram const built = BuildGlProgram(*context, kVertex, kFragment, name);
    mName = built.name;
    mProgram = std::make_shared<GlUniforms>(context, built.name, name);
    if (built.isPlaceholder) mProgram->SetPlaceholder();
    mColor = mProgram->Find("color");
    VertexDescriptor format;
    format.addAttribute(VertexAttributeType::Float, 2, -1, 0);
    mFormat = context->vertexFormats.Find(format);
}

void GlFill::Clear() {
    mProgram.reset();
    glDeleteProgram(mName);
    mName = 0;
}

} // namespace Moka::detail
