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

} // namespace

GlProgram::GlProgram(std::shared_ptr<GlContext> const& context, char const* vertexSource,
                     char const* fragmentSource, char const* name) {
    char const* const label = name ? name : "";
    GlBuiltProgram const built =
        context ? BuildGlProgram(*context, vertexSource, fragmentSource, label) : GlBuiltProgram{};
    if (built.name != 0) {
        ++context->statistics.programs;
        context->debug.Label(GL_PROGRAM_KHR, built.name, label);
    }
    mUniforms = std::make_shared<GlUniforms>(context, built.name, label);
    if (built.isPlaceholder) mUniforms->SetPlaceholder();
}

void GlProgram::MakeCurrent() { mUniforms->MakeCurrent(mUniforms); }

void GlProgram::Release() {
    mUniforms->DeleteProgram();
    delete this;
}

IParameterBinding* GlProgram::GetParameter(char const* name) {
    return new GlParameter(mUniforms, mUniforms->Find(name));
}

} // namespace Moka::detail
