#include "moka/renderer/gles/GlProgram.h"

#include "moka/renderer/gles/GlContext.h"
#include "moka/renderer/gles/GlProgramBuilder.h"
#include "moka/renderer/gles/GlUniforms.h"

#include <utility>

namespace Moka::detail {
namespace {

class GlParameter final : public IParameterBinding {
public:
    GlParameter(std::shared_ptr<GlUniforms> uniforms, int index)
        : IParameterBinding(uniforms->GetType(index)), mUniforms(std::move(uniforms)), mIndex(index) {}

    void Set(void const* value) override { mUniforms->Set(mIndex, value); }

private:
    std::shared_ptr<GlUniforms> const mUniforms;
    int const mIndex;
};

char const* TextOf(char const* text) { return text ? text : ""; }

} // namespace

GlProgram::GlProgram(std::shared_ptr<GlContext> const& context, char const* vertexSource,
                     char const* fragmentSource, char const* name)
    : mVertexSource(TextOf(vertexSource)), mFragmentSource(TextOf(fragmentSource)), mName(TextOf(name)) {
    GlBuiltProgram const built = context ? Build(*context) : GlBuiltProgram{};
    mUniforms = std::make_shared<GlUniforms>(context, built.name, mName.c_str());
    if (built.isPlaceholder) mUniforms->SetPlaceholder();
}

GlBuiltProgram GlProgram::Build(GlContext& context) const {
    GlBuiltProgram const built =
        BuildGlProgram(context, mVertexSource.c_str(), mFragmentSource.c_str(), mName.c_str());
    if (built.name != 0) {
        ++context.statistics.programs;
        context.debug.Label(GL_PROGRAM_KHR, built.name, mName.c_str());
    }
    return built;
}

void GlProgram::MakeCurrent() {
    GlContext* const attached = GlContext::GetAttached();
    if (attached && mUniforms->HasLostContext()) MoveTo(*attached);
    mUniforms->MakeCurrent(mUniforms);
}

void GlProgram::MoveTo(GlContext& context) {
    GlOperation const operation(context);
    if (!operation) return;
    GlBuiltProgram const built = Build(context);
    if (built.name == 0) return;
    mUniforms->MoveTo(context.shared_from_this(), built.name);
    if (built.isPlaceholder) mUniforms->SetPlaceholder();
}

void GlProgram::Release() {
    mUniforms->DeleteProgram();
    delete this;
}

IParameterBinding* GlProgram::GetParameter(char const* name) {
    return new GlParameter(mUniforms, mUniforms->Find(name));
}

} // namespace Moka::detail
